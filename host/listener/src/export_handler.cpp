#include "orv/listener/export_handler.hpp"

#include <strings.h>

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/instance_reader.hpp"
#include "orv/cimxml/request_parser.hpp"
#include "orv/exporter/export_message.hpp"

namespace orv::listener {

namespace {

using cimxml::ProtocolError;

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) {
        text.remove_prefix(1);
    }
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) {
        text.remove_suffix(1);
    }
    return text;
}

bool headerIs(const http::Request& request, std::string_view name, std::string_view expected) {
    const std::string* value = request.header(name);
    if (value == nullptr) {
        return false;
    }
    const std::string_view text = trimmed(*value);
    return text.size() == expected.size() && strncasecmp(text.data(), expected.data(), text.size()) == 0;
}

http::Response failure(int status, std::string_view cimError) {
    http::Response response;
    response.status = status;
    response.headers.emplace_back("CIMError", std::string(cimError));
    return response;
}

http::Response protocolFailure(ProtocolError::Kind kind) {
    switch (kind) {
        case ProtocolError::Kind::NotWellFormed: return failure(400, "request-not-well-formed");
        case ProtocolError::Kind::NotValid: return failure(400, "request-not-valid");
        case ProtocolError::Kind::UnsupportedCimVersion: return failure(501, "unsupported-cim-version");
        case ProtocolError::Kind::UnsupportedDtdVersion: return failure(501, "unsupported-dtd-version");
        case ProtocolError::Kind::UnsupportedProtocolVersion: return failure(501, "unsupported-protocol-version");
        case ProtocolError::Kind::MultipleRequestsUnsupported: return failure(501, "multiple-requests-unsupported");
    }
    return failure(400, "request-not-valid");
}

http::Response answer(std::string body) {
    http::Response response;
    response.headers.emplace_back(std::string(exporter::kExportHeader), "MethodResponse");
    response.headers.emplace_back(std::string(exporter::kProtocolVersionHeader), "1.0");
    response.contentType = std::string(exporter::kExportContentType);
    response.body = std::move(body);
    return response;
}

}  // namespace

http::Response handleExportRequest(const http::Request& request, const IndicationSink& sink,
                                   const cimxml::XmlLimits& limits) {
    if (!headerIs(request, exporter::kExportHeader, "MethodRequest")) {
        return failure(400, "unsupported-operation");
    }
    const std::string* version = request.header(exporter::kProtocolVersionHeader);
    if (version != nullptr && trimmed(*version).substr(0, 2) != "1.") {
        return failure(501, "unsupported-protocol-version");
    }
    exporter::ExportRequest parsed;
    cimxml::InstanceModel indication;
    try {
        parsed = exporter::parseExportRequest(request.body, limits);
        indication = cimxml::readInstanceElement(*parsed.indication);
    } catch (const ProtocolError& error) {
        return protocolFailure(error.kind());
    }
    if (!headerIs(request, exporter::kExportMethodHeader, parsed.methodName)) {
        return failure(400, "header-mismatch");
    }
    if (std::optional<std::string> refused = sink(indication)) {
        return answer(exporter::buildExportResponse(parsed.messageId, static_cast<int>(cimxml::CimStatus::Failed),
                                                    *refused));
    }
    return answer(exporter::buildExportResponse(parsed.messageId));
}

}  // namespace orv::listener
