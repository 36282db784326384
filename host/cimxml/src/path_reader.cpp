#include "path_reader.hpp"

#include "orv/cimxml/request_parser.hpp"

namespace orv::cimxml::detail {

void invalid(const XmlElement& at, const std::string& why) {
    throw ProtocolError(ProtocolError::Kind::NotValid,
                        "line " + std::to_string(at.line) + ": <" + std::string(at.name) + ">: " + why);
}

std::string_view requireAttribute(const XmlElement& element, const char* name) {
    const std::string_view* value = element.attribute(name);
    if (value == nullptr) {
        invalid(element, std::string("missing attribute ") + name);
    }
    return *value;
}

void expectName(const XmlElement& element, const char* name) {
    if (element.name != name) {
        invalid(element, std::string("expected ") + name);
    }
}

const XmlElement& onlyChild(const XmlElement& element) {
    if (element.children.size() != 1) {
        invalid(element, "expected exactly one child element");
    }
    return *element.children.front();
}

std::string readLocalNamespacePath(const XmlElement& element) {
    expectName(element, "LOCALNAMESPACEPATH");
    std::string joined;
    for (const auto& part : element.children) {
        if (part->name != "NAMESPACE") {
            invalid(*part, "expected NAMESPACE");
        }
        if (!joined.empty()) {
            joined += '/';
        }
        joined += requireAttribute(*part, "NAME");
    }
    if (joined.empty()) {
        invalid(element, "no NAMESPACE");
    }
    return joined;
}

namespace {

KeyBindingModel::Kind keyKind(const XmlElement& keyValue) {
    const std::string_view* valueType = keyValue.attribute("VALUETYPE");
    if (valueType == nullptr || *valueType == "string") {
        return KeyBindingModel::Kind::String;
    }
    if (*valueType == "boolean") {
        return KeyBindingModel::Kind::Boolean;
    }
    if (*valueType == "numeric") {
        return KeyBindingModel::Kind::Numeric;
    }
    invalid(keyValue, "VALUETYPE must be string, boolean or numeric");
}

KeyBindingModel readKeyValue(const XmlElement& keyValue, std::string_view name) {
    KeyBindingModel key;
    key.name = name;
    key.kind = keyKind(keyValue);
    key.value = keyValue.text;
    if (const std::string_view* type = keyValue.attribute("TYPE")) {
        key.type = *type;
    }
    return key;
}

KeyBindingModel readKeyBinding(const XmlElement& binding) {
    const std::string_view name = requireAttribute(binding, "NAME");
    const XmlElement& content = onlyChild(binding);
    if (content.name == "KEYVALUE") {
        return readKeyValue(content, name);
    }
    if (content.name == "VALUE.REFERENCE") {
        KeyBindingModel key;
        key.name = name;
        key.kind = KeyBindingModel::Kind::Reference;
        key.reference = std::make_shared<ObjectPathModel>(readObjectPath(content));
        return key;
    }
    invalid(content, "expected KEYVALUE or VALUE.REFERENCE");
}

// HOST and LOCALNAMESPACEPATH of a NAMESPACEPATH.
void readNamespacePath(const XmlElement& element, ObjectPathModel& path) {
    if (element.name != "NAMESPACEPATH" || element.children.size() != 2 ||
        element.children[0]->name != "HOST") {
        invalid(element, "expected NAMESPACEPATH with HOST and LOCALNAMESPACEPATH");
    }
    path.host = element.children[0]->text;
    path.nameSpace = readLocalNamespacePath(*element.children[1]);
}

const XmlElement& secondOfTwo(const XmlElement& element) {
    if (element.children.size() != 2) {
        invalid(element, "expected two child elements");
    }
    return *element.children[1];
}

ObjectPathModel readClassName(const XmlElement& element) {
    expectName(element, "CLASSNAME");
    ObjectPathModel path;
    path.className = requireAttribute(element, "NAME");
    return path;
}

}  // namespace

ObjectPathModel readInstanceName(const XmlElement& element) {
    expectName(element, "INSTANCENAME");
    ObjectPathModel path;
    path.className = requireAttribute(element, "CLASSNAME");
    path.instance = true;
    path.keys.reserve(element.children.size());
    for (const auto& child : element.children) {
        if (child->name == "KEYBINDING") {
            path.keys.push_back(readKeyBinding(*child));
        } else if (child->name == "KEYVALUE" && element.children.size() == 1) {
            path.keys.push_back(readKeyValue(*child, ""));
        } else {
            invalid(*child, "expected KEYBINDING");
        }
    }
    return path;
}

ObjectPathModel readObjectPath(const XmlElement& element) {
    ObjectPathModel path;
    if (element.name == "VALUE.REFERENCE" || element.name == "OBJECTPATH") {
        return readObjectPath(onlyChild(element));
    }
    if (element.name == "INSTANCENAME") {
        return readInstanceName(element);
    }
    if (element.name == "CLASSNAME") {
        return readClassName(element);
    }
    if (element.name == "INSTANCEPATH" || element.name == "CLASSPATH") {
        const XmlElement& name = secondOfTwo(element);
        path = element.name == "INSTANCEPATH" ? readInstanceName(name) : readClassName(name);
        readNamespacePath(*element.children[0], path);
        return path;
    }
    if (element.name == "LOCALINSTANCEPATH" || element.name == "LOCALCLASSPATH") {
        const XmlElement& name = secondOfTwo(element);
        path = element.name == "LOCALINSTANCEPATH" ? readInstanceName(name) : readClassName(name);
        path.nameSpace = readLocalNamespacePath(*element.children[0]);
        return path;
    }
    invalid(element, "expected an object path");
}

std::vector<std::optional<std::string>> readValueArray(const XmlElement& element) {
    expectName(element, "VALUE.ARRAY");
    std::vector<std::optional<std::string>> values;
    for (const auto& item : element.children) {
        if (item->name == "VALUE") {
            values.emplace_back(item->text);
        } else if (item->name == "VALUE.NULL") {
            values.emplace_back(std::nullopt);
        } else {
            invalid(*item, "expected VALUE or VALUE.NULL");
        }
    }
    return values;
}

namespace {

std::string embeddedObjectAttribute(const XmlElement& element) {
    if (const std::string_view* value = element.attribute("EmbeddedObject")) {
        return std::string(*value);
    }
    if (const std::string_view* value = element.attribute("EMBEDDEDOBJECT")) {
        return std::string(*value);
    }
    return {};
}

// The property's value element, skipping its qualifiers; nullptr when it has none.
const XmlElement* propertyValue(const XmlElement& property) {
    const XmlElement* found = nullptr;
    for (const auto& child : property.children) {
        if (child->name == "QUALIFIER") {
            continue;
        }
        if (found != nullptr) {
            invalid(*child, "more than one value");
        }
        found = child;
    }
    return found;
}

PropertyModel readProperty(const XmlElement& element) {
    PropertyModel property;
    property.name = requireAttribute(element, "NAME");
    property.embeddedObject = embeddedObjectAttribute(element);
    const XmlElement* value = propertyValue(element);
    if (element.name == "PROPERTY.REFERENCE") {
        property.kind = PropertyModel::Kind::Reference;
        if (value != nullptr) {
            property.reference = std::make_shared<ObjectPathModel>(readObjectPath(*value));
        }
        return property;
    }
    property.type = requireAttribute(element, "TYPE");
    if (element.name == "PROPERTY.ARRAY") {
        property.kind = PropertyModel::Kind::Array;
        if (value != nullptr) {
            property.elements = readValueArray(*value);
        }
        return property;
    }
    if (element.name != "PROPERTY") {
        invalid(element, "expected PROPERTY, PROPERTY.ARRAY or PROPERTY.REFERENCE");
    }
    if (value != nullptr) {
        if (value->name != "VALUE") {
            invalid(*value, "expected VALUE");
        }
        property.value = value->text;
    }
    return property;
}

}  // namespace

InstanceModel readInstance(const XmlElement& element) {
    expectName(element, "INSTANCE");
    InstanceModel instance;
    instance.className = requireAttribute(element, "CLASSNAME");
    for (const auto& child : element.children) {
        if (child->name != "QUALIFIER") {
            instance.properties.push_back(readProperty(*child));
        }
    }
    return instance;
}

}  // namespace orv::cimxml::detail
