// INSTANCE elements: properties of every CIM type, arrays with null elements,
// references and embedded instances. Each property element is written whole, piece by
// piece, straight into the writer's buffer.
#include <strings.h>

#include <array>
#include <cstring>

#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/object_encoder.hpp"
#include "markup.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

using repository::ClassDecl;
using repository::PropertyDecl;

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

// The three property elements: the start of the start tag up to the name's value, and
// the end tag (compile-time constants: each copy is a few moves).
struct ScalarProperty {
    static constexpr std::string_view start = "<PROPERTY NAME=\"";
    static constexpr std::string_view end = "</PROPERTY>";
};
struct ArrayProperty {
    static constexpr std::string_view start = "<PROPERTY.ARRAY NAME=\"";
    static constexpr std::string_view end = "</PROPERTY.ARRAY>";
};
struct ReferenceProperty {
    static constexpr std::string_view start = "<PROPERTY.REFERENCE NAME=\"";
    static constexpr std::string_view end = "</PROPERTY.REFERENCE>";
};

constexpr std::string_view kReferenceClass = "\" REFERENCECLASS=\"";
constexpr std::string_view kClassOrigin = "\" CLASSORIGIN=\"";
constexpr std::string_view kEmbeddedObject = "\" EmbeddedObject=\"instance";

// `" TYPE="name` for each type, in a fixed-size buffer so that it is copied in one move
// of kTypeAttributeRoom bytes; `size` 0 for the types CIM-XML cannot carry.
constexpr std::size_t kTypeAttributeRoom = 32;
struct TypeAttribute {
    char text[kTypeAttributeRoom] = {};
    std::size_t size = 0;
};

// The simple types are below 256, the encoded ones multiples of 256 from CMPI_instance
// (16 << 8) on; any other value has the index of CMPI_null, which has no form.
constexpr std::size_t kTypeIndexes = 256 + 16;
std::size_t typeIndex(CMPIType type) noexcept {
    if (type < 256) {
        return type;
    }
    const unsigned encoded = type >> 8U;
    return (type & 0xFFU) == 0 && encoded >= 16 && encoded < 32 ? 256 + (encoded - 16) : CMPI_null;
}

std::array<TypeAttribute, kTypeIndexes> typeAttributeTable() {
    std::array<TypeAttribute, kTypeIndexes> attributes{};
    const auto fill = [&attributes](unsigned value) {
        const auto type = static_cast<CMPIType>(value);
        const std::string_view name = xmlTypeName(type);
        if (name.empty()) {
            return;
        }
        TypeAttribute& attribute = attributes[typeIndex(type)];
        const std::string text = "\" TYPE=\"" + std::string(name);
        std::memcpy(attribute.text, text.data(), text.size());
        attribute.size = text.size();
    };
    for (unsigned simple = 0; simple < 256; ++simple) {
        fill(simple);
    }
    for (unsigned encoded = 16; encoded < 32; ++encoded) {
        fill(encoded << 8);
    }
    return attributes;
}

const std::array<TypeAttribute, kTypeIndexes> kTypeAttributes = typeAttributeTable();

const TypeAttribute& typeAttribute(CMPIType type) noexcept {
    return kTypeAttributes[typeIndex(type)];
}

// The start tag: NAME, then REFERENCECLASS (references) or TYPE, CLASSORIGIN when asked
// for, and the mark of embedded instances; in one claim of room. `type` is that of one
// element.
template <typename Element>
void writeStartTag(XmlWriter& out, std::string_view name, CMPIType type, const PropertyDecl* declaration,
                   bool includeClassOrigin) {
    std::string_view referenceClass;
    std::string_view classOrigin;
    if (declaration != nullptr) {
        if (type == CMPI_ref) {
            referenceClass = declaration->type.referenceClass;
        }
        if (includeClassOrigin) {
            classOrigin = declaration->classOrigin;
        }
    }
    char* at = out.claim(Element::start.size() + escapedRoom(name) + kReferenceClass.size() +
                         escapedRoom(referenceClass) + kTypeAttributeRoom + kClassOrigin.size() +
                         escapedRoom(classOrigin) + kEmbeddedObject.size() + 2);
    at = putEscaped(put(at, Element::start), name);
    if (!referenceClass.empty()) {
        at = putEscaped(put(at, kReferenceClass), referenceClass);
    } else if (type != CMPI_ref) {
        const TypeAttribute& attribute = typeAttribute(type);
        std::memcpy(at, attribute.text, kTypeAttributeRoom);
        at += attribute.size;
    }
    if (!classOrigin.empty()) {
        at = putEscaped(put(at, kClassOrigin), classOrigin);
    }
    if (type == CMPI_instance) {
        at = put(at, kEmbeddedObject);
    }
    out.commit(put(at, "\">"));
}

void writeProperty(XmlWriter& out, std::string_view name, const CMPIData& data, const PropertyDecl* declaration,
                   const InstanceEncoding& encoding) {
    const CMPIType element = data.type & ~CMPI_ARRAY;
    if (typeAttribute(element).size == 0) {
        return;  // pointers, arguments and the like have no CIM-XML form
    }
    if ((data.type & CMPI_ARRAY) != 0) {
        if (element == CMPI_ref) {
            return;  // properties cannot hold arrays of references
        }
        writeStartTag<ArrayProperty>(out, name, element, declaration, encoding.includeClassOrigin);
        if (!isNullData(data) && data.value.array != nullptr) {
            writeValueArray(out, data.value.array, encoding.arrayNullElements);
        }
        out.raw(ArrayProperty::end);
    } else if (data.type == CMPI_ref) {
        writeStartTag<ReferenceProperty>(out, name, data.type, declaration, encoding.includeClassOrigin);
        if (!isNullData(data) && data.value.ref != nullptr) {
            writeValueReference(out, data.value.ref);
        }
        out.raw(ReferenceProperty::end);
    } else {
        writeStartTag<ScalarProperty>(out, name, data.type, declaration, encoding.includeClassOrigin);
        writeValue(out, data);
        out.raw(ScalarProperty::end);
    }
}

// The declaration is needed only for what it adds to the property's start tag: the
// reference class of a reference, the class origin when asked for.
bool needsDeclaration(const InstanceEncoding& encoding, CMPIType type) {
    return encoding.declarations && (encoding.includeClassOrigin || type == CMPI_ref);
}

// The class of the instance, looked up the first time a property needs it.
class LazyClass {
public:
    LazyClass(const ClassDeclarations& declarations, std::string_view className)
        : declarations_(declarations), className_(className) {}

    const PropertyDecl* property(std::string_view name) {
        if (!resolved_) {
            class_ = declarations_.find(className_);
            resolved_ = true;
        }
        return class_ == nullptr ? nullptr : class_->findProperty(name);
    }

private:
    const ClassDeclarations& declarations_;
    std::string_view className_;
    const ClassDecl* class_ = nullptr;
    bool resolved_ = false;
};

}  // namespace

ClassDeclarations::ClassDeclarations(const repository::ClassRepository& classes, std::string nameSpace,
                                     std::string_view expectedClass)
    : classes_(&classes), nameSpace_(std::move(nameSpace)) {
    if (!expectedClass.empty()) {
        expected_ = classes.getClass(nameSpace_, expectedClass);
    }
}

const ClassDecl* ClassDeclarations::find(std::string_view className) const noexcept {
    if (expected_ != nullptr && expected_->name == className) {
        return expected_;
    }
    return classes_ == nullptr ? nullptr : classes_->getClass(nameSpace_, className);
}

void writeInstance(XmlWriter& out, const CMPIInstance* instance, std::string_view className,
                   const InstanceEncoding& encoding) {
    out.raw("<INSTANCE CLASSNAME=\"").text(className).raw("\">");
    LazyClass cls(encoding.declarations, className);
    const CMPICount count = instance->ft->getPropertyCount(instance, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* nameString = nullptr;
        const CMPIData data = instance->ft->getPropertyAt(instance, i, &nameString, nullptr);
        const std::string_view name = cmpiChars(nameString);
        if (!selected(encoding.propertyList, name)) {
            continue;
        }
        const PropertyDecl* declaration = needsDeclaration(encoding, data.type) ? cls.property(name) : nullptr;
        writeProperty(out, name, data, declaration, encoding);
    }
    out.raw("</INSTANCE>");
}

void writeInstance(XmlWriter& out, const CMPIInstance* instance, const InstanceEncoding& encoding) {
    writeInstance(out, instance, instanceClassName(instance), encoding);
}

void writeNamedInstance(XmlWriter& out, const CMPIInstance* instance, const InstanceEncoding& encoding) {
    const CMPIObjectPath* path = instance->ft->getObjectPath(instance, nullptr);
    out.raw("<VALUE.NAMEDINSTANCE>");
    writeInstanceName(out, path);
    writeInstance(out, instance, pathClassChars(path), encoding);
    out.raw("</VALUE.NAMEDINSTANCE>");
}

void writeInstanceWithPath(XmlWriter& out, std::string_view element, const CMPIInstance* instance,
                           const PathDefaults& defaults, const InstanceEncoding& encoding) {
    const CMPIObjectPath* path = instance->ft->getObjectPath(instance, nullptr);
    out.open(element);
    writeInstancePath(out, path, defaults);
    writeInstance(out, instance, pathClassChars(path), encoding);
    out.close();
}

std::string instanceText(const CMPIInstance* instance) {
    XmlWriter inner;
    writeInstance(inner, instance, InstanceEncoding{});
    return inner.take();
}

}  // namespace orv::cimxml
