#include "orv/cimxml/request_parser.hpp"

#include "path_reader.hpp"

namespace orv::cimxml {

namespace {

using detail::invalid;
using detail::onlyChild;
using detail::requireAttribute;

bool hasMajorVersion(std::string_view version, std::string_view major) {
    return version.rfind(major, 0) == 0;
}

void checkVersions(const XmlElement& cim, const XmlElement& message) {
    if (!hasMajorVersion(requireAttribute(cim, "CIMVERSION"), "2.")) {
        throw ProtocolError(ProtocolError::Kind::UnsupportedCimVersion,
                            "CIMVERSION " + std::string(*cim.attribute("CIMVERSION")) + " is not supported");
    }
    if (!hasMajorVersion(requireAttribute(cim, "DTDVERSION"), "2.")) {
        throw ProtocolError(ProtocolError::Kind::UnsupportedDtdVersion,
                            "DTDVERSION " + std::string(*cim.attribute("DTDVERSION")) + " is not supported");
    }
    if (!hasMajorVersion(requireAttribute(message, "PROTOCOLVERSION"), "1.")) {
        throw ProtocolError(ProtocolError::Kind::UnsupportedProtocolVersion,
                            "PROTOCOLVERSION " + std::string(*message.attribute("PROTOCOLVERSION")) +
                                " is not supported");
    }
}

ParamValue readParamValue(const XmlElement& holder) {
    if (holder.children.empty()) {
        return std::monostate{};
    }
    const XmlElement& value = onlyChild(holder);
    if (value.name == "VALUE") {
        return std::string(value.text);
    }
    if (value.name == "VALUE.ARRAY") {
        return detail::readValueArray(value);
    }
    if (value.name == "CLASSNAME") {
        return ClassNameParam{std::string(requireAttribute(value, "NAME"))};
    }
    if (value.name == "INSTANCENAME" || value.name == "VALUE.REFERENCE") {
        return detail::readObjectPath(value);
    }
    if (value.name == "INSTANCE") {
        return detail::readInstance(value);
    }
    if (value.name == "VALUE.NAMEDINSTANCE") {
        if (value.children.size() != 2) {
            invalid(value, "expected INSTANCENAME and INSTANCE");
        }
        return NamedInstanceModel{detail::readInstanceName(*value.children[0]),
                                  detail::readInstance(*value.children[1])};
    }
    if (value.name == "CLASS") {
        return detail::readClass(value);
    }
    if (value.name == "QUALIFIER.DECLARATION") {
        return detail::readQualifierDeclaration(value);
    }
    if (value.name == "VALUE.REFARRAY") {
        return detail::readRefArray(value);
    }
    invalid(value, "unexpected parameter value");
}

void readParams(const XmlElement& call, const char* paramElement, CimRequest& request) {
    for (const auto& child : call.children) {
        if (child->name == paramElement) {
            request.params.emplace_back(requireAttribute(*child, "NAME"), readParamValue(*child));
        } else if (child->name != "LOCALNAMESPACEPATH" && child->name != "LOCALCLASSPATH" &&
                   child->name != "LOCALINSTANCEPATH" && child->name != "RESPONSEDESTINATION") {
            invalid(*child, std::string("expected ") + paramElement);
        }
    }
}

void readIntrinsicCall(const XmlElement& call, CimRequest& request) {
    request.intrinsic = true;
    request.methodName = requireAttribute(call, "NAME");
    const XmlElement* path = call.child("LOCALNAMESPACEPATH");
    if (path == nullptr) {
        invalid(call, "missing LOCALNAMESPACEPATH");
    }
    request.nameSpace = detail::readLocalNamespacePath(*path);
    readParams(call, "IPARAMVALUE", request);
}

void readExtrinsicCall(const XmlElement& call, CimRequest& request) {
    request.intrinsic = false;
    request.methodName = requireAttribute(call, "NAME");
    const XmlElement* path = call.child("LOCALINSTANCEPATH");
    if (path == nullptr) {
        path = call.child("LOCALCLASSPATH");
    }
    if (path == nullptr) {
        invalid(call, "missing LOCALINSTANCEPATH or LOCALCLASSPATH");
    }
    request.target = detail::readObjectPath(*path);
    request.nameSpace = request.target.nameSpace;
    readParams(call, "PARAMVALUE", request);
}

void readSimpleRequest(const XmlElement& simple, CimRequest& request) {
    const XmlElement* call = nullptr;
    for (const auto& child : simple.children) {
        if (child->name == "CORRELATOR") {
            continue;
        }
        if (call != nullptr) {
            invalid(*child, "more than one method call");
        }
        call = child;
    }
    if (call == nullptr) {
        invalid(simple, "no method call");
    }
    if (call->name == "IMETHODCALL") {
        readIntrinsicCall(*call, request);
    } else if (call->name == "METHODCALL") {
        readExtrinsicCall(*call, request);
    } else {
        invalid(*call, "expected IMETHODCALL or METHODCALL");
    }
}

}  // namespace

CimRequest parseRequest(std::string_view body, const XmlLimits& limits) {
    std::unique_ptr<XmlElement> root;
    try {
        root = parseXmlDocument(body, limits);
    } catch (const XmlSyntaxError& error) {
        throw ProtocolError(ProtocolError::Kind::NotWellFormed, error.what());
    }
    if (root->name != "CIM") {
        invalid(*root, "expected CIM");
    }
    const XmlElement& message = onlyChild(*root);
    if (message.name != "MESSAGE") {
        invalid(message, "expected MESSAGE");
    }
    checkVersions(*root, message);
    CimRequest request;
    request.messageId = requireAttribute(message, "ID");
    request.protocolVersion = *message.attribute("PROTOCOLVERSION");
    const XmlElement& simple = onlyChild(message);
    if (simple.name == "MULTIREQ") {
        throw ProtocolError(ProtocolError::Kind::MultipleRequestsUnsupported,
                            "multiple requests in one message are not supported");
    }
    if (simple.name != "SIMPLEREQ") {
        invalid(simple, "expected SIMPLEREQ");
    }
    readSimpleRequest(simple, request);
    return request;
}

}  // namespace orv::cimxml
