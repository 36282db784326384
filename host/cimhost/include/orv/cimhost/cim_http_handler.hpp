// The CIM operation layer of HTTP: checks the CIMOperation, CIMMethod, CIMObject and
// CIMProtocolVersion headers, reads the body and answers with a CIM-XML response or
// with an HTTP error carrying a CIMError header.
#pragma once

#include "orv/cimhost/cim_dispatcher.hpp"
#include "orv/cimxml/xml_tree.hpp"
#include "orv/http/http_server.hpp"

namespace orv::cimhost {

http::Response handleCimRequest(const http::Request& request, const CimDispatcher& dispatcher,
                                const cimxml::XmlLimits& limits = {});

// "%2F" and the like decoded; malformed escapes are kept as they are.
std::string percentDecode(std::string_view text);

}  // namespace orv::cimhost
