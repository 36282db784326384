#include "orv/cimxml/request_parser.hpp"

namespace orv::cimxml {

HttpFailure httpFailure(ProtocolError::Kind kind) noexcept {
    switch (kind) {
        case ProtocolError::Kind::NotWellFormed: return {400, "request-not-well-formed"};
        case ProtocolError::Kind::NotValid: return {400, "request-not-valid"};
        case ProtocolError::Kind::UnsupportedCimVersion: return {501, "unsupported-cim-version"};
        case ProtocolError::Kind::UnsupportedDtdVersion: return {501, "unsupported-dtd-version"};
        case ProtocolError::Kind::UnsupportedProtocolVersion: return {501, "unsupported-protocol-version"};
        case ProtocolError::Kind::MultipleRequestsUnsupported: return {501, "multiple-requests-unsupported"};
    }
    return {400, "request-not-valid"};
}

}  // namespace orv::cimxml
