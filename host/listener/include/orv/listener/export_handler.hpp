// The HTTP side of a CIM-XML listener: checks an export request, reads the indication
// it carries and answers as a listener must.
#pragma once

#include <functional>
#include <optional>
#include <string>

#include "orv/cimxml/request.hpp"
#include "orv/cimxml/xml_tree.hpp"
#include "orv/http/http_server.hpp"

namespace orv::listener {

// Takes one received indication; returns nullopt when it accepted it, or the reason it
// did not (answered as CIM_ERR_FAILED). Called concurrently from the server's threads.
using IndicationSink = std::function<std::optional<std::string>(const cimxml::InstanceModel&)>;

// Requests that are not export requests answer an HTTP error with a CIMError header
// (400 unsupported-operation, header-mismatch, request-not-well-formed,
// request-not-valid; 501 for unsupported versions and MULTIEXPREQ); export requests
// answer 200 with a SIMPLEEXPRSP.
http::Response handleExportRequest(const http::Request& request, const IndicationSink& sink,
                                   const cimxml::XmlLimits& limits = {});

}  // namespace orv::listener
