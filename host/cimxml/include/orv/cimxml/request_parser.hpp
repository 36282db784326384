// Reads a CIM-XML request document (a SIMPLEREQ with one IMETHODCALL or METHODCALL)
// into a CimRequest.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

#include "orv/cimxml/request.hpp"
#include "orv/cimxml/xml_tree.hpp"

namespace orv::cimxml {

// A request that cannot be processed as a CIM operation at all. The HTTP layer answers
// these with an HTTP status and a CIMError header instead of a CIM-XML response.
class ProtocolError : public std::runtime_error {
public:
    enum class Kind {
        NotWellFormed,              // 400, request-not-well-formed
        NotValid,                   // 400, request-not-valid
        UnsupportedCimVersion,      // 501, unsupported-cim-version
        UnsupportedDtdVersion,      // 501, unsupported-dtd-version
        UnsupportedProtocolVersion, // 501, unsupported-protocol-version
        MultipleRequestsUnsupported // 501, multiple-requests-unsupported
    };
    ProtocolError(Kind kind, const std::string& message) : std::runtime_error(message), kind_(kind) {}
    Kind kind() const noexcept { return kind_; }

private:
    Kind kind_;
};

// The HTTP status and CIMError header value that answer a ProtocolError.
struct HttpFailure {
    int status;
    std::string_view cimError;
};
HttpFailure httpFailure(ProtocolError::Kind kind) noexcept;

// Parses the body; throws ProtocolError.
CimRequest parseRequest(std::string_view body, const XmlLimits& limits = {});

}  // namespace orv::cimxml
