// One CIM-XML exchange with an in-process dispatcher over the raw C test provider,
// and the DTD check of CIM-XML documents with xmllint.
#pragma once

#include <memory>
#include <string>

#include "orv/cimhost/cim_dispatcher.hpp"
#include "orv/host/broker_core.hpp"

namespace orv::cimhost::test {

std::string sourcePath(const std::string& relative);
std::string readText(const std::string& path);

// What xmllint says of `document` checked against tests/cimhost/dtd/cim-xml.dtd;
// empty when the document is valid.
std::string dtdErrors(const std::string& document);

class Exchange {
public:
    Exchange();
    ~Exchange();
    Exchange(const Exchange&) = delete;
    Exchange& operator=(const Exchange&) = delete;

    // The answer to a request document sent by `principal`: the CIM-XML response,
    // or "HTTP <status> <CIMError>: <message>" for a request the parser refuses.
    std::string answer(const std::string& request, const std::string& principal) const;

private:
    std::unique_ptr<host::BrokerCore> core_;
    std::unique_ptr<CimDispatcher> dispatcher_;
};

}  // namespace orv::cimhost::test
