#include "orv/providertest/ReturnedValues.h"

#include <cmpift.h>

#include <stdexcept>

namespace orv::providertest {
namespace {

void check(const CMPIStatus& status, const char* what) {
    if (status.rc != CMPI_RC_OK) {
        throw std::runtime_error(std::string(what) + " failed with rc " + std::to_string(status.rc));
    }
}

std::string stringText(const CMPIString* s) {
    if (s == nullptr) {
        return "<null>";
    }
    const char* chars = s->ft->getCharPtr(s, nullptr);
    return chars == nullptr ? "<null>" : chars;
}

std::string pathText(const CMPIObjectPath* path) {
    std::string text = nameSpaceOf(path) + ":" + classNameOf(path);
    const char* separator = ".";
    for (const NamedValue& key : keysOf(path)) {
        text += separator + key.name + "=" + key.text;
        separator = ",";
    }
    return text;
}

std::string arrayText(const CMPIArray* array) {
    if (array == nullptr) {
        return "<null>";
    }
    std::string text = "[";
    const CMPICount size = array->ft->getSize(array, nullptr);
    for (CMPICount i = 0; i < size; ++i) {
        text += (i == 0 ? "" : ", ") + valueText(array->ft->getElementAt(array, i, nullptr));
    }
    return text + "]";
}

std::string scalarText(const CMPIData& data) {
    const CMPIValue& v = data.value;
    switch (data.type) {
    case CMPI_boolean: return v.boolean != 0 ? "true" : "false";
    case CMPI_char16: return std::to_string(v.char16);
    case CMPI_uint8: return std::to_string(v.uint8);
    case CMPI_uint16: return std::to_string(v.uint16);
    case CMPI_uint32: return std::to_string(v.uint32);
    case CMPI_uint64: return std::to_string(v.uint64);
    case CMPI_sint8: return std::to_string(v.sint8);
    case CMPI_sint16: return std::to_string(v.sint16);
    case CMPI_sint32: return std::to_string(v.sint32);
    case CMPI_sint64: return std::to_string(v.sint64);
    case CMPI_real32: return std::to_string(v.real32);
    case CMPI_real64: return std::to_string(v.real64);
    case CMPI_string: return stringText(v.string);
    case CMPI_chars: return v.chars == nullptr ? "<null>" : v.chars;
    case CMPI_ref: return pathText(v.ref);
    case CMPI_dateTime: return v.dateTime == nullptr ? "<null>" : stringText(v.dateTime->ft->getStringFormat(v.dateTime, nullptr));
    default: return "<value of type " + std::to_string(data.type) + ">";
    }
}

// Every (name, value) of an object that counts them and hands them out by index.
template <typename Count, typename At>
std::vector<NamedValue> namedValues(Count count, At at) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    const CMPICount total = count(&st);
    check(st, "counting values");
    std::vector<NamedValue> values;
    for (CMPICount i = 0; i < total; ++i) {
        CMPIString* name = nullptr;
        const CMPIData data = at(i, &name, &st);
        check(st, "reading a value by index");
        values.push_back(NamedValue{stringText(name), data.type, valueText(data)});
    }
    return values;
}

}  // namespace

std::ostream& operator<<(std::ostream& os, const NamedValue& value) {
    return os << value.name << ": " << typeName(value.type) << " = \"" << value.text << "\"";
}

std::string typeName(CMPIType type) {
    if ((type & CMPI_ARRAY) != 0) {
        return typeName(static_cast<CMPIType>(type & ~CMPI_ARRAY)) + "[]";
    }
    switch (type) {
    case CMPI_null: return "null";
    case CMPI_boolean: return "boolean";
    case CMPI_char16: return "char16";
    case CMPI_uint8: return "uint8";
    case CMPI_uint16: return "uint16";
    case CMPI_uint32: return "uint32";
    case CMPI_uint64: return "uint64";
    case CMPI_sint8: return "sint8";
    case CMPI_sint16: return "sint16";
    case CMPI_sint32: return "sint32";
    case CMPI_sint64: return "sint64";
    case CMPI_real32: return "real32";
    case CMPI_real64: return "real64";
    case CMPI_string: return "string";
    case CMPI_chars: return "chars";
    case CMPI_ref: return "ref";
    case CMPI_instance: return "instance";
    case CMPI_dateTime: return "datetime";
    default: return "type " + std::to_string(type);
    }
}

std::string valueText(const CMPIData& data) {
    if ((data.state & CMPI_nullValue) != 0) {
        return "<null>";
    }
    if ((data.type & CMPI_ARRAY) != 0) {
        return arrayText(data.value.array);
    }
    return scalarText(data);
}

std::vector<NamedValue> propertiesOf(const CMPIInstance* instance) {
    return namedValues(
        [instance](CMPIStatus* st) { return instance->ft->getPropertyCount(instance, st); },
        [instance](CMPICount i, CMPIString** name, CMPIStatus* st) {
            return instance->ft->getPropertyAt(instance, i, name, st);
        });
}

std::vector<std::string> propertyNamesOf(const CMPIInstance* instance) {
    std::vector<std::string> names;
    for (NamedValue& value : propertiesOf(instance)) {
        names.push_back(std::move(value.name));
    }
    return names;
}

std::optional<NamedValue> propertyOf(const CMPIInstance* instance, std::string_view name) {
    for (NamedValue& value : propertiesOf(instance)) {
        if (value.name == name) {
            return std::move(value);
        }
    }
    return std::nullopt;
}

std::vector<NamedValue> keysOf(const CMPIObjectPath* path) {
    return namedValues([path](CMPIStatus* st) { return path->ft->getKeyCount(path, st); },
                       [path](CMPICount i, CMPIString** name, CMPIStatus* st) {
                           return path->ft->getKeyAt(path, i, name, st);
                       });
}

std::string classNameOf(const CMPIObjectPath* path) {
    return stringText(path->ft->getClassName(path, nullptr));
}

std::string nameSpaceOf(const CMPIObjectPath* path) {
    return stringText(path->ft->getNameSpace(path, nullptr));
}

std::string classNameOf(const CMPIInstance* instance) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    const CMPIObjectPath* path = instance->ft->getObjectPath(instance, &st);
    check(st, "getObjectPath");
    return classNameOf(path);
}

std::vector<std::string> classNamesOf(const orv::host::Reply& reply) {
    std::vector<std::string> names;
    for (const CMPIInstance* instance : reply.instances()) {
        names.push_back(classNameOf(instance));
    }
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        names.push_back(classNameOf(path));
    }
    return names;
}

}  // namespace orv::providertest
