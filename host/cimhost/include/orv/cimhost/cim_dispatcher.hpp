// Answers parsed CIM-XML requests: class operations from the class repository,
// instance and association operations through the broker core.
#pragma once

#include <string>

#include "orv/cimxml/request.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost {

class CimDispatcher {
public:
    // `hostName` is the HOST of instance paths whose provider left it out.
    CimDispatcher(host::BrokerCore& core, const repository::ClassRepository& classes, std::string hostName);

    // The whole CIM-XML response document. Failures of the operation become an ERROR
    // element: CIM_ERR_NOT_SUPPORTED for unknown methods, CIM_ERR_INVALID_NAMESPACE,
    // CIM_ERR_INVALID_PARAMETER for wrong parameters, the provider's code and message.
    std::string respond(const cimxml::CimRequest& request, const std::string& principal) const;

private:
    host::BrokerCore& core_;
    const repository::ClassRepository& classes_;
    std::string hostName_;
};

}  // namespace orv::cimhost
