// INSTANCE elements: properties of every CIM type, arrays with null elements,
// references and embedded instances. Each property element is written whole, piece by
// piece, straight into the writer's buffer.
#include <strings.h>

#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/object_encoder.hpp"
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
// the end tag.
struct PropertyElement {
    std::string_view start;
    std::string_view end;
};
constexpr PropertyElement kScalar{"<PROPERTY NAME=\"", "</PROPERTY>"};
constexpr PropertyElement kArray{"<PROPERTY.ARRAY NAME=\"", "</PROPERTY.ARRAY>"};
constexpr PropertyElement kReference{"<PROPERTY.REFERENCE NAME=\"", "</PROPERTY.REFERENCE>"};

// ` NAME="value"` for an attribute after the first.
void writeAttribute(XmlWriter& out, std::string_view nameWithQuote, std::string_view value) {
    out.raw(nameWithQuote).text(value).raw("\"");
}

// The start tag: NAME, then REFERENCECLASS (references) or TYPE, CLASSORIGIN when asked
// for, and the mark of embedded instances. `type` is that of one element.
void writeStartTag(XmlWriter& out, const PropertyElement& element, std::string_view name, CMPIType type,
                   const PropertyDecl* declaration, bool includeClassOrigin) {
    out.raw(element.start).text(name).raw("\"");
    if (type == CMPI_ref) {
        if (declaration != nullptr && !declaration->type.referenceClass.empty()) {
            writeAttribute(out, " REFERENCECLASS=\"", declaration->type.referenceClass);
        }
    } else {
        out.raw(" TYPE=\"").raw(xmlTypeName(type)).raw("\"");
    }
    if (includeClassOrigin && declaration != nullptr && !declaration->classOrigin.empty()) {
        writeAttribute(out, " CLASSORIGIN=\"", declaration->classOrigin);
    }
    if (type == CMPI_instance) {
        out.raw(" EmbeddedObject=\"instance\"");
    }
    out.raw(">");
}

void writeProperty(XmlWriter& out, std::string_view name, const CMPIData& data, const PropertyDecl* declaration,
                   const InstanceEncoding& encoding) {
    const CMPIType element = data.type & ~CMPI_ARRAY;
    if (xmlTypeName(element).empty()) {
        return;  // pointers, arguments and the like have no CIM-XML form
    }
    if ((data.type & CMPI_ARRAY) != 0) {
        if (element == CMPI_ref) {
            return;  // properties cannot hold arrays of references
        }
        writeStartTag(out, kArray, name, element, declaration, encoding.includeClassOrigin);
        if (!isNullData(data) && data.value.array != nullptr) {
            writeValueArray(out, data.value.array, encoding.arrayNullElements);
        }
        out.raw(kArray.end);
    } else if (data.type == CMPI_ref) {
        writeStartTag(out, kReference, name, data.type, declaration, encoding.includeClassOrigin);
        if (!isNullData(data) && data.value.ref != nullptr) {
            writeValueReference(out, data.value.ref);
        }
        out.raw(kReference.end);
    } else {
        writeStartTag(out, kScalar, name, data.type, declaration, encoding.includeClassOrigin);
        writeValue(out, data);
        out.raw(kScalar.end);
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
    writeAttribute(out, "<INSTANCE CLASSNAME=\"", className);
    out.raw(">");
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
