#include "orv/listener/export_handler.hpp"

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/instance_reader.hpp"
#include "orv/cimxml/request_parser.hpp"
#include "orv/exporter/export_message.hpp"

namespace orv::listener {

namespace {

using cimxml::ProtocolError;

http::Response failure(int status, std::string_view cimError) {
    http::Response response;
    response.status = status;
    response.headers.emplace_back("CIMError", std::string(cimError));
    return response;
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
    if (!request.headerIs(exporter::kExportHeader, "MethodRequest")) {
        return failure(400, "unsupported-operation");
    }
    const std::string* version = request.header(exporter::kProtocolVersionHeader);
    if (version != nullptr && http::trimBlanks(*version).substr(0, 2) != "1.") {
        return failure(501, "unsupported-protocol-version");
    }
    exporter::ExportRequest parsed;
    cimxml::InstanceModel indication;
    try {
        parsed = exporter::parseExportRequest(request.body, limits);
        indication = cimxml::readInstanceElement(*parsed.indication);
    } catch (const ProtocolError& error) {
        const cimxml::HttpFailure protocolFailure = cimxml::httpFailure(error.kind());
        return failure(protocolFailure.status, protocolFailure.cimError);
    }
    if (!request.headerIs(exporter::kExportMethodHeader, parsed.methodName)) {
        return failure(400, "header-mismatch");
    }
    if (std::optional<std::string> refused = sink(indication)) {
        return answer(exporter::buildExportResponse(parsed.messageId, static_cast<int>(cimxml::CimStatus::Failed),
                                                    *refused));
    }
    return answer(exporter::buildExportResponse(parsed.messageId));
}

}  // namespace orv::listener
