#include "orv/exporter/export_message.hpp"

#include "orv/cimxml/request_parser.hpp"
#include "orv/cimxml/xml_writer.hpp"

namespace orv::exporter {

namespace {

using cimxml::ProtocolError;
using cimxml::XmlElement;

cimxml::XmlWriter& openMessage(cimxml::XmlWriter& xml, std::string_view messageId) {
    return xml.raw("<?xml version=\"1.0\" encoding=\"utf-8\"?>\n")
        .open("CIM").attr("CIMVERSION", "2.0").attr("DTDVERSION", "2.0")
        .open("MESSAGE").attr("ID", messageId).attr("PROTOCOLVERSION", "1.0");
}

const XmlElement& requireChild(const XmlElement& parent, std::string_view name) {
    const XmlElement* child = parent.child(name);
    if (child == nullptr) {
        throw ProtocolError(ProtocolError::Kind::NotValid,
                            std::string(parent.name) + " has no " + std::string(name) + " element");
    }
    return *child;
}

std::string_view requireAttribute(const XmlElement& element, std::string_view name) {
    const std::string_view* value = element.attribute(name);
    if (value == nullptr) {
        throw ProtocolError(ProtocolError::Kind::NotValid,
                            std::string(element.name) + " has no " + std::string(name) + " attribute");
    }
    return *value;
}

void requireMajor(const XmlElement& element, std::string_view attribute, std::string_view major,
                  ProtocolError::Kind kind) {
    const std::string version(requireAttribute(element, attribute));
    if (version.rfind(major, 0) != 0) {
        throw ProtocolError(kind, std::string(attribute) + " " + version + " is not supported");
    }
}

const XmlElement& newIndicationParameter(const XmlElement& call) {
    const XmlElement* found = nullptr;
    for (const auto& child : call.children) {
        if (child->name != "EXPPARAMVALUE") {
            throw ProtocolError(ProtocolError::Kind::NotValid, "unexpected " + std::string(child->name) + " in EXPMETHODCALL");
        }
        if (requireAttribute(*child, "NAME") == "NewIndication") {
            found = child;
        }
    }
    if (found == nullptr) {
        throw ProtocolError(ProtocolError::Kind::NotValid, "ExportIndication has no NewIndication parameter");
    }
    return requireChild(*found, "INSTANCE");
}

}  // namespace

std::string buildExportRequest(std::uint64_t messageId, std::string_view instanceXml) {
    cimxml::XmlWriter xml;
    openMessage(xml, std::to_string(messageId))
        .open("SIMPLEEXPREQ")
        .open("EXPMETHODCALL").attr("NAME", kExportMethod)
        .open("EXPPARAMVALUE").attr("NAME", "NewIndication")
        .raw(instanceXml);
    while (xml.depth() > 0) {
        xml.close();
    }
    return xml.take();
}

std::string buildExportResponse(std::string_view messageId, std::optional<int> errorCode,
                                std::string_view description) {
    cimxml::XmlWriter xml;
    openMessage(xml, messageId).open("SIMPLEEXPRSP").open("EXPMETHODRESPONSE").attr("NAME", kExportMethod);
    if (errorCode) {
        xml.open("ERROR").attr("CODE", std::to_string(*errorCode));
        if (!description.empty()) {
            xml.attr("DESCRIPTION", description);
        }
    }
    while (xml.depth() > 0) {
        xml.close();
    }
    return xml.take();
}

ExportRequest parseExportRequest(std::string_view body, const cimxml::XmlLimits& limits) {
    ExportRequest request;
    try {
        request.document = cimxml::parseXmlDocument(body, limits);
    } catch (const cimxml::XmlSyntaxError& error) {
        throw ProtocolError(ProtocolError::Kind::NotWellFormed, error.what());
    }
    const XmlElement& cim = *request.document;
    if (cim.name != "CIM") {
        throw ProtocolError(ProtocolError::Kind::NotValid, "the document element is " + std::string(cim.name) + ", not CIM");
    }
    requireMajor(cim, "CIMVERSION", "2.", ProtocolError::Kind::UnsupportedCimVersion);
    requireMajor(cim, "DTDVERSION", "2.", ProtocolError::Kind::UnsupportedDtdVersion);
    const XmlElement& message = requireChild(cim, "MESSAGE");
    requireMajor(message, "PROTOCOLVERSION", "1.", ProtocolError::Kind::UnsupportedProtocolVersion);
    request.messageId = requireAttribute(message, "ID");
    if (message.child("MULTIEXPREQ") != nullptr) {
        throw ProtocolError(ProtocolError::Kind::MultipleRequestsUnsupported, "MULTIEXPREQ is not supported");
    }
    const XmlElement& call = requireChild(requireChild(message, "SIMPLEEXPREQ"), "EXPMETHODCALL");
    request.methodName = requireAttribute(call, "NAME");
    if (request.methodName != kExportMethod) {
        throw ProtocolError(ProtocolError::Kind::NotValid, "export method " + request.methodName + " is not supported");
    }
    request.indication = &newIndicationParameter(call);
    requireAttribute(*request.indication, "CLASSNAME");
    return request;
}

std::optional<std::string> exportResponseError(std::string_view body) {
    std::unique_ptr<XmlElement> document;
    try {
        document = cimxml::parseXmlDocument(body);
    } catch (const cimxml::XmlSyntaxError& error) {
        return std::string("response is not well formed: ") + error.what();
    }
    const XmlElement* message = document->name == "CIM" ? document->child("MESSAGE") : nullptr;
    const XmlElement* simple = message == nullptr ? nullptr : message->child("SIMPLEEXPRSP");
    const XmlElement* response = simple == nullptr ? nullptr : simple->child("EXPMETHODRESPONSE");
    if (response == nullptr) {
        return std::string("response has no EXPMETHODRESPONSE");
    }
    if (const XmlElement* error = response->child("ERROR")) {
        const std::string_view* code = error->attribute("CODE");
        const std::string_view* description = error->attribute("DESCRIPTION");
        return "listener answered error " + std::string(code != nullptr ? *code : "?") +
               (description != nullptr ? ": " + std::string(*description) : std::string());
    }
    return std::nullopt;
}

}  // namespace orv::exporter
