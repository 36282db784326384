#include "orv/listener/indication_format.hpp"

#include <charconv>
#include <cmath>
#include <strings.h>
#include <cstdio>
#include <memory>
#include <optional>

#include "orv/cimxml/instance_reader.hpp"
#include "orv/cimxml/request_parser.hpp"
#include "orv/cimxml/xml_tree.hpp"

namespace orv::listener {

namespace {

using cimxml::InstanceModel;
using cimxml::PropertyModel;

std::string quoted(std::string_view text) {
    std::string out = "\"";
    for (const char c : text) {
        switch (c) {
            case '"': out += "\\\""; break;
            case '\\': out += "\\\\"; break;
            case '\n': out += "\\n"; break;
            case '\r': out += "\\r"; break;
            case '\t': out += "\\t"; break;
            default:
                if (static_cast<unsigned char>(c) < 0x20) {
                    char buffer[8];
                    std::snprintf(buffer, sizeof buffer, "\\u%04x", static_cast<unsigned>(c));
                    out += buffer;
                } else {
                    out += c;
                }
        }
    }
    out += '"';
    return out;
}

bool isQuotedType(std::string_view type) {
    return type == "string" || type == "char16" || type == "datetime";
}

bool isIntegerType(std::string_view type) {
    return type.size() > 4 && (type.substr(0, 4) == "uint" || type.substr(0, 4) == "sint");
}

bool isIntegerText(std::string_view text) {
    long long signedValue = 0;
    unsigned long long unsignedValue = 0;
    const char* end = text.data() + text.size();
    return !text.empty() && (std::from_chars(text.data(), end, signedValue).ptr == end ||
                             std::from_chars(text.data(), end, unsignedValue).ptr == end);
}

bool isRealText(std::string_view text) {
    double value = 0;
    const char* end = text.data() + text.size();
    auto [ptr, error] = std::from_chars(text.data(), end, value);
    return !text.empty() && error == std::errc() && ptr == end && std::isfinite(value);
}

// "true" / "false" in any case, the way CIM-XML spells booleans.
std::optional<bool> booleanValue(std::string_view text) {
    auto sameAs = [text](std::string_view word) {
        return text.size() == word.size() && strncasecmp(text.data(), word.data(), word.size()) == 0;
    };
    if (sameAs("true")) {
        return true;
    }
    if (sameAs("false")) {
        return false;
    }
    return std::nullopt;
}

// The embedded instance a string value holds, when the property says it holds one and
// the text really is an INSTANCE element.
std::optional<InstanceModel> embeddedInstance(const PropertyModel& property, const std::string& text) {
    if (property.embeddedObject.empty()) {
        return std::nullopt;
    }
    try {
        std::unique_ptr<cimxml::XmlElement> element = cimxml::parseXmlDocument(text);
        if (element->name == "INSTANCE") {
            return cimxml::readInstanceElement(*element);
        }
    } catch (const std::exception&) {
        // printed as the string it is
    }
    return std::nullopt;
}

// Writes one instance in either output form; the forms differ only in punctuation
// and in how a scalar is spelled.
class Formatter {
public:
    explicit Formatter(bool json) : json_(json) {}

    std::string instance(const InstanceModel& model) const {
        std::string out = json_ ? "{\"class\":" + quoted(model.className) + ",\"properties\":{" : model.className;
        out += json_ ? "" : "{";
        bool first = true;
        for (const PropertyModel& property : model.properties) {
            if (!first) {
                out += json_ ? "," : " ";
            }
            first = false;
            out += json_ ? quoted(property.name) + ":" : property.name + "=";
            out += value(property);
        }
        out += json_ ? "}}" : "}";
        return out;
    }

private:
    std::string value(const PropertyModel& property) const {
        switch (property.kind) {
            case PropertyModel::Kind::Reference:
                return property.reference ? quoted(objectPathText(*property.reference)) : null();
            case PropertyModel::Kind::Array: {
                if (!property.elements) {
                    return null();
                }
                std::string out = "[";
                for (const auto& element : *property.elements) {
                    out += out.size() > 1 ? "," : "";
                    out += element ? scalar(property, *element) : null();
                }
                return out + "]";
            }
            case PropertyModel::Kind::Scalar: break;
        }
        return property.value ? scalar(property, *property.value) : null();
    }

    std::string scalar(const PropertyModel& property, const std::string& text) const {
        if (std::optional<InstanceModel> embedded = embeddedInstance(property, text)) {
            return instance(*embedded);
        }
        const std::string& type = property.type;
        if (isQuotedType(type) || !property.embeddedObject.empty()) {
            return quoted(text);
        }
        if (type == "boolean") {
            if (std::optional<bool> flag = booleanValue(text)) {
                return *flag ? "true" : "false";
            }
            return json_ ? quoted(text) : text;
        }
        if (!json_) {
            return text;
        }
        const bool number = isIntegerType(type) ? isIntegerText(text) : isRealText(text);
        return number ? text : quoted(text);
    }

    std::string null() const { return json_ ? "null" : "NULL"; }

    bool json_;
};

std::string keyValueText(const cimxml::KeyBindingModel& key) {
    switch (key.kind) {
        case cimxml::KeyBindingModel::Kind::Reference:
            return key.reference ? quoted(objectPathText(*key.reference)) : "NULL";
        case cimxml::KeyBindingModel::Kind::String: return quoted(key.value);
        default: return key.value;
    }
}

}  // namespace

std::string objectPathText(const cimxml::ObjectPathModel& path) {
    std::string out;
    if (!path.host.empty()) {
        out += "//" + path.host + "/";
    }
    if (!path.nameSpace.empty()) {
        out += path.nameSpace + ":";
    }
    out += path.className;
    for (std::size_t i = 0; i < path.keys.size(); ++i) {
        out += i == 0 ? "." : ",";
        out += path.keys[i].name + "=" + keyValueText(path.keys[i]);
    }
    return out;
}

std::string formatText(const InstanceModel& instance) {
    // The top level reads "CLASS NAME=VALUE ...": the braces only mark embedded instances.
    std::string nested = Formatter(false).instance(instance);
    std::string out = instance.className;
    const std::string body = nested.substr(instance.className.size() + 1, nested.size() - instance.className.size() - 2);
    if (!body.empty()) {
        out += " " + body;
    }
    return out;
}

std::string formatJson(const InstanceModel& instance) {
    return Formatter(true).instance(instance);
}

}  // namespace orv::listener
