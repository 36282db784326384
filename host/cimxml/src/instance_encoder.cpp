// INSTANCE elements: properties of every CIM type, arrays with null elements,
// references and embedded instances.
#include <strings.h>

#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/object_encoder.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

bool selected(const std::optional<std::vector<std::string>>& propertyList, std::string_view name) {
    if (!propertyList) {
        return true;
    }
    for (const auto& wanted : *propertyList) {
        if (wanted.size() == name.size() && strncasecmp(wanted.data(), name.data(), name.size()) == 0) {
            return true;
        }
    }
    return false;
}

struct PropertyHeader {
    const char* element;
    std::string_view name;
    const std::optional<PropertyInfo>& info;
    bool includeClassOrigin;
};

// The declaration is needed only for what it adds to the property's start tag: the
// reference class of a reference, the class origin when asked for.
bool needsDeclaration(const InstanceEncoding& encoding, CMPIType type) {
    return encoding.lookup && (encoding.includeClassOrigin || type == CMPI_ref);
}

std::string_view charsOf(const CMPIString* text) {
    if (text == nullptr || text->ft == nullptr) {
        return {};
    }
    const char* chars = text->ft->getCharPtr(text, nullptr);
    return chars == nullptr ? std::string_view() : std::string_view(chars);
}

// A VALUE element for one item; false when the item has no text (NULL).
bool writeItem(XmlWriter& out, const CMPIData& item) {
    if (item.type == CMPI_string && !isNullData(item) && item.value.string != nullptr) {
        out.leaf("VALUE", charsOf(item.value.string));  // the common case, without a copy
        return true;
    }
    std::optional<std::string> text = itemText(item);
    if (text) {
        out.leaf("VALUE", *text);
    }
    return text.has_value();
}

void openProperty(XmlWriter& out, const PropertyHeader& header, CMPIType type) {
    out.open(header.element).attr("NAME", header.name);
    if (type == CMPI_ref) {
        if (header.info && !header.info->referenceClass.empty()) {
            out.attr("REFERENCECLASS", header.info->referenceClass);
        }
    } else {
        out.attr("TYPE", xmlTypeName(type));
    }
    if (header.includeClassOrigin && header.info && !header.info->classOrigin.empty()) {
        out.attr("CLASSORIGIN", header.info->classOrigin);
    }
    if (header.info && header.info->propagated) {
        out.attr("PROPAGATED", "true");
    }
    if ((type & ~CMPI_ARRAY) == CMPI_instance) {
        out.attr("EmbeddedObject", "instance");
    }
}

void writeProperty(XmlWriter& out, const PropertyHeader& header, const CMPIData& data, ArrayNullElements nulls) {
    const bool isArray = (data.type & CMPI_ARRAY) != 0;
    if (xmlTypeName(data.type).empty()) {
        return;  // pointers, arguments and the like have no CIM-XML form
    }
    if (isArray) {
        if ((data.type & ~CMPI_ARRAY) == CMPI_ref) {
            return;  // properties cannot hold arrays of references
        }
        PropertyHeader arrayHeader{"PROPERTY.ARRAY", header.name, header.info, header.includeClassOrigin};
        openProperty(out, arrayHeader, data.type & ~CMPI_ARRAY);
        if (!isNullData(data) && data.value.array != nullptr) {
            writeValueArray(out, data.value.array, nulls);
        }
        out.close();
        return;
    }
    if (data.type == CMPI_ref) {
        PropertyHeader refHeader{"PROPERTY.REFERENCE", header.name, header.info, header.includeClassOrigin};
        openProperty(out, refHeader, data.type);
        if (!isNullData(data) && data.value.ref != nullptr) {
            writeValueReference(out, data.value.ref);
        }
        out.close();
        return;
    }
    openProperty(out, header, data.type);
    writeItem(out, data);
    out.close();
}

}  // namespace

// The text a VALUE carries for one item: scalars, or the markup of an embedded instance.
std::optional<std::string> itemText(const CMPIData& item) {
    if (item.type == CMPI_instance) {
        if (isNullData(item) || item.value.inst == nullptr) {
            return std::nullopt;
        }
        return instanceText(item.value.inst);
    }
    return scalarText(item);
}

void writeValueArray(XmlWriter& out, const CMPIArray* array, ArrayNullElements nulls) {
    out.open("VALUE.ARRAY");
    const CMPICount size = array->ft->getSize(array, nullptr);
    for (CMPICount i = 0; i < size; ++i) {
        const CMPIData item = array->ft->getElementAt(array, i, nullptr);
        if (!writeItem(out, item) && nulls == ArrayNullElements::ValueNull) {
            out.open("VALUE.NULL").close();
        }
    }
    out.close();
}

void writeInstance(XmlWriter& out, const CMPIInstance* instance, const InstanceEncoding& encoding) {
    const std::string className = instanceClassName(instance);
    out.open("INSTANCE").attr("CLASSNAME", className);
    const CMPICount count = instance->ft->getPropertyCount(instance, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* nameString = nullptr;
        const CMPIData data = instance->ft->getPropertyAt(instance, i, &nameString, nullptr);
        const std::string_view name = charsOf(nameString);
        if (!selected(encoding.propertyList, name)) {
            continue;
        }
        std::optional<PropertyInfo> info;
        if (needsDeclaration(encoding, data.type)) {
            info = encoding.lookup(className, name);
        }
        writeProperty(out, PropertyHeader{"PROPERTY", name, info, encoding.includeClassOrigin}, data,
                      encoding.arrayNullElements);
    }
    out.close();
}

std::string instanceText(const CMPIInstance* instance) {
    XmlWriter inner;
    writeInstance(inner, instance, InstanceEncoding{});
    return inner.take();
}

}  // namespace orv::cimxml
