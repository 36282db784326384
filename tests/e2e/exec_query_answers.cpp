#include "exec_query_answers.hpp"

#include <algorithm>
#include <chrono>
#include <map>
#include <optional>
#include <vector>

#include "orv/cimxml/xml_tree.hpp"
#include "orv/cimxml/xml_writer.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {

namespace {

using cimxml::XmlElement;

// The value text of a PROPERTY, PROPERTY.ARRAY or KEYVALUE; "NULL" without one.
std::string valueText(const XmlElement& element) {
    if (element.name == "KEYVALUE") {
        return std::string(element.text);
    }
    if (const XmlElement* value = element.child("VALUE")) {
        return std::string(value->text);
    }
    if (const XmlElement* array = element.child("VALUE.ARRAY")) {
        std::string joined;
        for (const auto& item : array->children) {
            joined += (joined.empty() ? "" : ",") + std::string(item->text);
        }
        return joined;
    }
    return element.child("VALUE.REFERENCE") != nullptr ? "REF" : "NULL";
}

std::string joined(const std::map<std::string, std::string>& values) {
    std::string out;
    for (const auto& [name, value] : values) {
        out += (out.empty() ? "" : ";") + name + "=" + value;
    }
    return out;
}

std::optional<std::string> instanceLine(const XmlElement& withPath) {
    const XmlElement* path = withPath.child("INSTANCEPATH");
    const XmlElement* instance = withPath.child("INSTANCE");
    const XmlElement* name = path != nullptr ? path->child("INSTANCENAME") : nullptr;
    if (name == nullptr || instance == nullptr || name->attribute("CLASSNAME") == nullptr) {
        return std::nullopt;
    }
    std::map<std::string, std::string> keys;
    for (const auto& binding : name->children) {
        if (binding->name == "KEYBINDING" && !binding->children.empty()) {
            keys[std::string(*binding->attribute("NAME"))] = valueText(*binding->children.front());
        }
    }
    std::map<std::string, std::string> properties;
    for (const auto& property : instance->children) {
        const std::string value = valueText(*property);
        if (property->attribute("NAME") != nullptr && value != "NULL") {
            properties[std::string(*property->attribute("NAME"))] = value;
        }
    }
    return std::string(*name->attribute("CLASSNAME")) + " " + joined(keys) + " | " + joined(properties);
}

// The IMETHODRESPONSE of a CIM-XML answer, or nullptr.
const XmlElement* methodResponse(const XmlElement& root) {
    const XmlElement* message = root.child("MESSAGE");
    const XmlElement* simple = message != nullptr ? message->child("SIMPLERSP") : nullptr;
    return simple != nullptr ? simple->child("IMETHODRESPONSE") : nullptr;
}

}  // namespace

std::string execQueryBody(const std::string& language, const std::string& query) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
           "<MESSAGE ID=\"7\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"ExecQuery\">"
           "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
           "<IPARAMVALUE NAME=\"QueryLanguage\"><VALUE>" + cimxml::escapeXml(language) + "</VALUE></IPARAMVALUE>"
           "<IPARAMVALUE NAME=\"Query\"><VALUE>" + cimxml::escapeXml(query) + "</VALUE></IPARAMVALUE>"
           "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

std::string execQueryAnswer(int port, const std::string& language, const std::string& query) {
    RawConnection connection(port);
    if (!connection.connected() || !connection.send(cimPost(execQueryBody(language, query), "ExecQuery"))) {
        return "BAD: no connection";
    }
    const std::optional<RawResponse> response = connection.readResponse(std::chrono::seconds(30));
    if (!response) {
        return "BAD: no response";
    }
    std::unique_ptr<XmlElement> root;
    try {
        root = cimxml::parseXmlDocument(response->body);
    } catch (const cimxml::XmlSyntaxError& error) {
        return "BAD: " + std::string(error.what()) + ": " + response->body;
    }
    const XmlElement* answer = methodResponse(*root);
    if (answer == nullptr) {
        return "BAD: " + response->body;
    }
    if (const XmlElement* error = answer->child("ERROR")) {
        return "ERROR " + std::string(*error->attribute("CODE"));
    }
    std::vector<std::string> lines;
    if (const XmlElement* values = answer->child("IRETURNVALUE")) {
        for (const auto& item : values->children) {
            std::optional<std::string> line = instanceLine(*item);
            lines.push_back(line ? *line : "BAD: " + std::string(item->name));
        }
    }
    std::sort(lines.begin(), lines.end());
    std::string out;
    for (const std::string& line : lines) {
        out += line + "\n";
    }
    return out;
}

}  // namespace orv::e2e
