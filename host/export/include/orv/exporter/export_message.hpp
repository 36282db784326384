// CIM-XML export messages: the ExportIndication request an exporter posts to a listener,
// and the response a listener gives back.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "orv/cimxml/xml_tree.hpp"

namespace orv::exporter {

// The HTTP headers of an export request and of its response.
inline constexpr std::string_view kExportHeader = "CIMExport";
inline constexpr std::string_view kExportMethodHeader = "CIMExportMethod";
inline constexpr std::string_view kProtocolVersionHeader = "CIMProtocolVersion";
inline constexpr std::string_view kExportMethod = "ExportIndication";
inline constexpr std::string_view kExportContentType = "application/xml; charset=\"utf-8\"";

// <CIM><MESSAGE ID=messageId><SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportIndication">
// <EXPPARAMVALUE NAME="NewIndication"> instanceXml ...
std::string buildExportRequest(std::uint64_t messageId, std::string_view instanceXml);

// The SIMPLEEXPRSP answering a request: an empty EXPMETHODRESPONSE on success, one
// holding <ERROR CODE=...> when errorCode is set.
std::string buildExportResponse(std::string_view messageId, std::optional<int> errorCode = std::nullopt,
                                std::string_view description = {});

// A parsed ExportIndication request.
struct ExportRequest {
    std::string messageId;
    std::string methodName;
    std::unique_ptr<cimxml::XmlElement> document;
    const cimxml::XmlElement* indication = nullptr;  // the INSTANCE of NewIndication
};

// Parses an export request body; throws cimxml::ProtocolError for documents that are
// not well formed, not valid export requests, or of unsupported versions.
ExportRequest parseExportRequest(std::string_view body, const cimxml::XmlLimits& limits = {});

// What a listener answered: nullopt when it accepted the indication, otherwise why not.
std::optional<std::string> exportResponseError(std::string_view body);

}  // namespace orv::exporter
