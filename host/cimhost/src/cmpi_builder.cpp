#include "cmpi_builder.hpp"

#include "key_check.hpp"

#include <strings.h>

#include <charconv>
#include <cstdlib>
#include <limits>
#include <string>

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/cmpi_value.hpp"

namespace orv::cimhost::detail {

namespace {

using cimxml::CimError;
using cimxml::CimStatus;
using repository::CimType;

// One value converted for a CMPI call; `chars` points at the client's text of a
// string, which outlives the call.
struct Converted {
    CMPIValue value{};
    CMPIType type = CMPI_null;
    const char* chars = nullptr;

    // What the CMPI setters take: for CMPI_chars the characters themselves stand in
    // for the value, as providers pass them.
    const CMPIValue* pointer() const noexcept {
        return type == CMPI_chars ? reinterpret_cast<const CMPIValue*>(chars) : &value;
    }
};

CMPIType cmpiType(CimType type) {
    switch (type) {
        case CimType::Boolean: return CMPI_boolean;
        case CimType::String: return CMPI_string;
        case CimType::Char16: return CMPI_char16;
        case CimType::Uint8: return CMPI_uint8;
        case CimType::Sint8: return CMPI_sint8;
        case CimType::Uint16: return CMPI_uint16;
        case CimType::Sint16: return CMPI_sint16;
        case CimType::Uint32: return CMPI_uint32;
        case CimType::Sint32: return CMPI_sint32;
        case CimType::Uint64: return CMPI_uint64;
        case CimType::Sint64: return CMPI_sint64;
        case CimType::Real32: return CMPI_real32;
        case CimType::Real64: return CMPI_real64;
        case CimType::Datetime: return CMPI_dateTime;
        case CimType::Reference: return CMPI_ref;
    }
    return CMPI_string;
}

[[noreturn]] void badValue(std::string_view name, std::string_view text, std::string_view type) {
    throw CimError(CimStatus::InvalidParameter,
                   std::string(name) + ": '" + std::string(text) + "' is not a valid " + std::string(type));
}

template <typename Number>
Number parseInteger(std::string_view name, const std::string& text, std::string_view type) {
    Number number{};
    const char* first = text.data();
    if (!text.empty() && text.front() == '+') {
        ++first;
    }
    auto [end, error] = std::from_chars(first, text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size() || text.empty()) {
        badValue(name, text, type);
    }
    return number;
}

double parseReal(std::string_view name, const std::string& text, std::string_view type) {
    char* end = nullptr;
    const double number = std::strtod(text.c_str(), &end);
    if (text.empty() || end != text.c_str() + text.size()) {
        badValue(name, text, type);
    }
    return number;
}

CMPIChar16 parseChar16(std::string_view name, const std::string& text) {
    const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
    if (text.size() == 1 && bytes[0] < 0x80) {
        return bytes[0];
    }
    if (text.size() == 2 && (bytes[0] & 0xE0U) == 0xC0U) {
        return static_cast<CMPIChar16>(((bytes[0] & 0x1FU) << 6U) | (bytes[1] & 0x3FU));
    }
    if (text.size() == 3 && (bytes[0] & 0xF0U) == 0xE0U) {
        return static_cast<CMPIChar16>(((bytes[0] & 0x0FU) << 12U) | ((bytes[1] & 0x3FU) << 6U) |
                                       (bytes[2] & 0x3FU));
    }
    badValue(name, text, "char16");
}

bool parseBoolean(std::string_view name, const std::string& text) {
    if (strcasecmp(text.c_str(), "true") == 0) {
        return true;
    }
    if (strcasecmp(text.c_str(), "false") == 0) {
        return false;
    }
    badValue(name, text, "boolean");
}

template <typename Number>
Number inRange(std::string_view name, const std::string& text, std::string_view type, auto value) {
    if (value < std::numeric_limits<Number>::lowest() || value > std::numeric_limits<Number>::max()) {
        badValue(name, text, type);
    }
    return static_cast<Number>(value);
}

void convertNumber(Converted& out, std::string_view name, const std::string& text) {
    CMPIValue& v = out.value;
    const std::string_view type = cimxml::xmlTypeName(out.type);
    switch (out.type) {
        case CMPI_uint8: v.uint8 = inRange<CMPIUint8>(name, text, type, parseInteger<std::uint64_t>(name, text, type)); break;
        case CMPI_uint16: v.uint16 = inRange<CMPIUint16>(name, text, type, parseInteger<std::uint64_t>(name, text, type)); break;
        case CMPI_uint32: v.uint32 = inRange<CMPIUint32>(name, text, type, parseInteger<std::uint64_t>(name, text, type)); break;
        case CMPI_uint64: v.uint64 = parseInteger<std::uint64_t>(name, text, type); break;
        case CMPI_sint8: v.sint8 = inRange<CMPISint8>(name, text, type, parseInteger<std::int64_t>(name, text, type)); break;
        case CMPI_sint16: v.sint16 = inRange<CMPISint16>(name, text, type, parseInteger<std::int64_t>(name, text, type)); break;
        case CMPI_sint32: v.sint32 = inRange<CMPISint32>(name, text, type, parseInteger<std::int64_t>(name, text, type)); break;
        case CMPI_sint64: v.sint64 = parseInteger<std::int64_t>(name, text, type); break;
        case CMPI_real32: v.real32 = static_cast<CMPIReal32>(parseReal(name, text, type)); break;
        case CMPI_real64: v.real64 = parseReal(name, text, type); break;
        default: badValue(name, text, "number");
    }
}

// Converts text to `out.type`; strings travel as CMPI_chars pointing at `text`.
void convertText(const CMPIBroker* broker, Converted& out, std::string_view name, const std::string& text) {
    switch (out.type) {
        case CMPI_boolean: out.value.boolean = parseBoolean(name, text) ? 1 : 0; return;
        case CMPI_char16: out.value.char16 = parseChar16(name, text); return;
        case CMPI_string:
        case CMPI_chars:
            out.chars = text.c_str();
            out.type = CMPI_chars;
            return;
        case CMPI_dateTime: {
            CMPIStatus rc{CMPI_RC_OK, nullptr};
            out.value.dateTime = broker->eft->newDateTimeFromChars(broker, text.c_str(), &rc);
            if (rc.rc != CMPI_RC_OK || out.value.dateTime == nullptr) {
                badValue(name, text, "datetime");
            }
            return;
        }
        default: convertNumber(out, name, text);
    }
}

const repository::PropertyDecl* declaredProperty(const repository::ClassRepository& classes,
                                                 std::string_view nameSpace, std::string_view className,
                                                 std::string_view property) {
    const repository::ClassDecl* cls = classes.getClass(nameSpace, className);
    return cls == nullptr ? nullptr : cls->findProperty(property);
}

// The type of a key nobody declared, from how the client sent it.
CMPIType guessedKeyType(const cimxml::KeyBindingModel& key) {
    using Kind = cimxml::KeyBindingModel::Kind;
    switch (key.kind) {
        case Kind::Boolean: return CMPI_boolean;
        case Kind::Reference: return CMPI_ref;
        case Kind::Numeric:
            if (key.value.find_first_of(".eE") != std::string::npos) {
                return CMPI_real64;
            }
            return !key.value.empty() && key.value.front() == '-' ? CMPI_sint64 : CMPI_uint64;
        case Kind::String: break;
    }
    return CMPI_string;
}

CMPIType typeFromXmlName(std::string_view name) {
    for (CMPIType type : {CMPI_boolean, CMPI_char16, CMPI_real32, CMPI_real64, CMPI_uint8, CMPI_uint16,
                          CMPI_uint32, CMPI_uint64, CMPI_sint8, CMPI_sint16, CMPI_sint32, CMPI_sint64,
                          CMPI_dateTime, CMPI_string}) {
        if (cimxml::xmlTypeName(type) == name) {
            return type;
        }
    }
    return CMPI_string;
}

// `cls` is the path's class, nullptr when the repository does not know it.
void addKey(const CMPIBroker* broker, const repository::ClassRepository& classes, std::string_view nameSpace,
            CMPIObjectPath* path, const repository::ClassDecl* cls, const cimxml::KeyBindingModel& key) {
    // A bare KEYVALUE (no KEYBINDING) is the value of the class's only key.
    const repository::PropertyDecl* sole = key.name.empty() ? soleKeyOf(cls) : nullptr;
    static const std::string noName;
    const std::string& name = !key.name.empty() ? key.name : sole != nullptr ? sole->name : noName;
    const repository::PropertyDecl* declared =
        sole != nullptr ? sole : cls != nullptr ? cls->findProperty(name) : nullptr;
    Converted converted;
    converted.type = declared != nullptr ? cmpiType(declared->type.type) : guessedKeyType(key);
    if (converted.type == CMPI_ref || key.kind == cimxml::KeyBindingModel::Kind::Reference) {
        if (!key.reference) {
            badValue(name, key.value, "reference");
        }
        converted.type = CMPI_ref;
        // As sfcb does, a reference key reaches the provider without the host the
        // client named: providers that hand it back (an association's end, say)
        // return it as a local path, the form wbemcli and sfcb's clients read.
        cimxml::ObjectPathModel local = *key.reference;
        local.host.clear();
        converted.value.ref = buildObjectPath(broker, classes, nameSpace, local);
    } else {
        convertText(broker, converted, name, key.value);
    }
    path->ft->addKey(path, name.c_str(), converted.pointer(), converted.type);
}

CMPIType propertyType(const repository::PropertyDecl* declared, const cimxml::PropertyModel& property) {
    if (property.kind == cimxml::PropertyModel::Kind::Reference) {
        return CMPI_ref;
    }
    return declared != nullptr ? cmpiType(declared->type.type) : typeFromXmlName(property.type);
}

// An array of `elementType` from the client's element texts (nullopt elements stay null).
CMPIArray* buildArray(const CMPIBroker* broker, const std::string& name,
                      const std::vector<std::optional<std::string>>& items, CMPIType elementType) {
    const CMPIType arrayElementType = elementType == CMPI_string ? CMPI_chars : elementType;
    CMPIArray* array = broker->eft->newArray(broker, static_cast<CMPICount>(items.size()), arrayElementType, nullptr);
    for (std::size_t i = 0; i < items.size(); ++i) {
        if (!items[i]) {
            continue;  // elements of a new array start out null
        }
        Converted converted;
        converted.type = elementType;
        convertText(broker, converted, name, *items[i]);
        array->ft->setElementAt(array, static_cast<CMPICount>(i), converted.pointer(), converted.type);
    }
    return array;
}

CMPIType arrayType(CMPIType elementType) {
    return (elementType == CMPI_string ? CMPI_chars : elementType) | CMPI_ARRAY;
}

void setArrayProperty(const CMPIBroker* broker, CMPIInstance* instance, const cimxml::PropertyModel& property,
                      CMPIType elementType) {
    if (!property.elements) {
        instance->ft->setProperty(instance, property.name.c_str(), nullptr, elementType | CMPI_ARRAY);
        return;
    }
    CMPIValue value{};
    value.array = buildArray(broker, property.name, *property.elements, elementType);
    instance->ft->setProperty(instance, property.name.c_str(), &value, arrayType(elementType));
}

void setProperty(const CMPIBroker* broker, const repository::ClassRepository& classes, std::string_view nameSpace,
                 CMPIInstance* instance, const std::string& className, const cimxml::PropertyModel& property) {
    const repository::PropertyDecl* declared = declaredProperty(classes, nameSpace, className, property.name);
    const CMPIType type = propertyType(declared, property);
    if (property.kind == cimxml::PropertyModel::Kind::Array) {
        setArrayProperty(broker, instance, property, type);
        return;
    }
    Converted converted;
    converted.type = type;
    if (type == CMPI_ref) {
        if (!property.reference) {
            instance->ft->setProperty(instance, property.name.c_str(), nullptr, CMPI_ref);
            return;
        }
        converted.value.ref = buildObjectPath(broker, classes, nameSpace, *property.reference);
    } else if (!property.value) {
        instance->ft->setProperty(instance, property.name.c_str(), nullptr, type);
        return;
    } else {
        convertText(broker, converted, property.name, *property.value);
    }
    instance->ft->setProperty(instance, property.name.c_str(), converted.pointer(), converted.type);
}

// Where an argument is going: the builder's inputs and the parameter's declaration.
struct ArgTarget {
    const CMPIBroker* broker;
    const repository::ClassRepository& classes;
    std::string_view nameSpace;
    const repository::ParameterDecl& decl;
};

[[noreturn]] void wrongKind(const std::string& name, std::string_view expected) {
    throw CimError(CimStatus::InvalidParameter, "parameter " + name + " must be " + std::string(expected));
}

// An array of references from a VALUE.REFARRAY (VALUE.NULL elements stay null).
CMPIArray* buildRefArray(const ArgTarget& target, const cimxml::RefArrayParam& refs) {
    CMPIArray* array =
        target.broker->eft->newArray(target.broker, static_cast<CMPICount>(refs.items.size()), CMPI_ref, nullptr);
    for (std::size_t i = 0; i < refs.items.size(); ++i) {
        if (refs.items[i]) {
            CMPIValue element{};
            element.ref = buildObjectPath(target.broker, target.classes, target.nameSpace, *refs.items[i]);
            array->ft->setElementAt(array, static_cast<CMPICount>(i), &element, CMPI_ref);
        }
    }
    return array;
}

// One argument converted from its PARAMVALUE to the declared type.
void addArgument(CMPIArgs* args, const ArgTarget& target, const std::string& name, const cimxml::ParamValue& value) {
    const CMPIType type = cmpiType(target.decl.type.type);
    const char* argName = target.decl.name.c_str();
    if (std::holds_alternative<std::monostate>(value)) {
        args->ft->addArg(args, argName, nullptr, target.decl.type.isArray ? type | CMPI_ARRAY : type);
        return;
    }
    Converted converted;
    converted.type = type;
    if (target.decl.type.isArray && type == CMPI_ref) {
        const auto* refs = std::get_if<cimxml::RefArrayParam>(&value);
        if (refs == nullptr) {
            wrongKind(name, "an array of references (VALUE.REFARRAY)");
        }
        converted.value.array = buildRefArray(target, *refs);
        converted.type = CMPI_refA;
    } else if (target.decl.type.isArray) {
        const auto* items = std::get_if<std::vector<std::optional<std::string>>>(&value);
        if (items == nullptr) {
            wrongKind(name, "an array of values");
        }
        converted.value.array = buildArray(target.broker, name, *items, type);
        converted.type = arrayType(type);
    } else if (type == CMPI_ref) {
        const auto* path = std::get_if<cimxml::ObjectPathModel>(&value);
        if (path == nullptr) {
            wrongKind(name, "a reference");
        }
        converted.value.ref = buildObjectPath(target.broker, target.classes, target.nameSpace, *path);
    } else if (const auto* text = std::get_if<std::string>(&value)) {
        convertText(target.broker, converted, name, *text);
    } else {
        wrongKind(name, "a single value");
    }
    args->ft->addArg(args, argName, converted.pointer(), converted.type);
}

}  // namespace

CMPIArgs* buildArgs(const CMPIBroker* broker, const repository::ClassRepository& classes, std::string_view nameSpace,
                    const repository::MethodDecl& method,
                    const std::vector<std::pair<std::string, cimxml::ParamValue>>& params) {
    CMPIArgs* args = broker->eft->newArgs(broker, nullptr);
    if (args == nullptr) {
        throw CimError(CimStatus::Failed, "cannot create the argument list");
    }
    for (const auto& [name, value] : params) {
        const repository::ParameterDecl* decl = method.findParameter(name);
        if (decl == nullptr || !decl->isIn()) {
            throw CimError(CimStatus::InvalidParameter, "method " + method.name + " has no input parameter " + name);
        }
        addArgument(args, ArgTarget{broker, classes, nameSpace, *decl}, name, value);
    }
    return args;
}

CMPIObjectPath* buildObjectPath(const CMPIBroker* broker, const repository::ClassRepository& classes,
                                std::string_view nameSpace, const cimxml::ObjectPathModel& model) {
    const repository::ClassDecl* cls = checkInstanceName(classes, nameSpace, model);
    const std::string ns = model.nameSpace.empty() ? std::string(nameSpace) : model.nameSpace;
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    CMPIObjectPath* path = broker->eft->newObjectPath(broker, ns.c_str(), model.className.c_str(), &rc);
    if (path == nullptr || rc.rc != CMPI_RC_OK) {
        throw CimError(CimStatus::Failed, "cannot create an object path");
    }
    if (!model.host.empty()) {
        path->ft->setHostname(path, model.host.c_str());
    }
    for (const auto& key : model.keys) {
        addKey(broker, classes, ns, path, cls, key);
    }
    return path;
}

CMPIInstance* buildInstance(const CMPIBroker* broker, const repository::ClassRepository& classes,
                            std::string_view nameSpace, const cimxml::InstanceModel& model,
                            const CMPIObjectPath* path) {
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    CMPIInstance* instance = broker->eft->newInstance(broker, path, &rc);
    if (instance == nullptr || rc.rc != CMPI_RC_OK) {
        throw CimError(CimStatus::Failed, "cannot create an instance");
    }
    for (const auto& property : model.properties) {
        setProperty(broker, classes, nameSpace, instance, model.className, property);
    }
    return instance;
}

}  // namespace orv::cimhost::detail
