#include "orv/cimxml/class_encoder.hpp"

#include <strings.h>

namespace orv::cimxml {

using repository::ClassDecl;
using repository::DataType;
using repository::MethodDecl;
using repository::ParameterDecl;
using repository::PropertyDecl;
using repository::QualifierList;
using repository::Value;

std::string repositoryScalarText(const repository::Scalar& value) {
    if (const bool* flag = std::get_if<bool>(&value)) {
        return *flag ? "TRUE" : "FALSE";
    }
    return repository::scalarToText(value);
}

namespace {

std::string typeName(const DataType& type) {
    return std::string(repository::cimTypeName(type.type));
}

void writeValue(XmlWriter& out, const Value& value) {
    if (value.isNull()) {
        return;
    }
    if (!value.isArray()) {
        out.leaf("VALUE", repositoryScalarText(value.get()));
        return;
    }
    out.open("VALUE.ARRAY");
    for (const auto& item : value.elements()) {
        out.leaf("VALUE", repositoryScalarText(item));
    }
    out.close();
}

void writeQualifiers(XmlWriter& out, const QualifierList& qualifiers, const ClassEncoding& encoding) {
    if (!encoding.includeQualifiers) {
        return;
    }
    for (const auto& qualifier : qualifiers.items()) {
        out.open("QUALIFIER").attr("NAME", qualifier.name).attr("TYPE", typeName(qualifier.type));
        if (qualifier.propagated) {
            out.attr("PROPAGATED", "true");
        }
        if (!qualifier.flavors.enableOverride) {
            out.attr("OVERRIDABLE", "false");
        }
        if (!qualifier.flavors.toSubclass) {
            out.attr("TOSUBCLASS", "false");
        }
        if (qualifier.flavors.translatable) {
            out.attr("TRANSLATABLE", "true");
        }
        writeValue(out, qualifier.value);
        out.close();
    }
}

void writeOrigin(XmlWriter& out, const std::string& classOrigin, bool propagated,
                 const ClassEncoding& encoding) {
    if (encoding.includeClassOrigin && !classOrigin.empty()) {
        out.attr("CLASSORIGIN", classOrigin);
    }
    if (propagated) {
        out.attr("PROPAGATED", "true");
    }
}

void writeArraySize(XmlWriter& out, const DataType& type) {
    if (type.arraySize) {
        out.attr("ARRAYSIZE", std::to_string(*type.arraySize));
    }
}

void writeProperty(XmlWriter& out, const PropertyDecl& property, const ClassEncoding& encoding) {
    if (property.isReference()) {
        out.open("PROPERTY.REFERENCE").attr("NAME", property.name);
        if (!property.type.referenceClass.empty()) {
            out.attr("REFERENCECLASS", property.type.referenceClass);
        }
        writeOrigin(out, property.classOrigin, property.propagated, encoding);
        writeQualifiers(out, property.qualifiers, encoding);
        out.close();
        return;
    }
    out.open(property.type.isArray ? "PROPERTY.ARRAY" : "PROPERTY")
        .attr("NAME", property.name)
        .attr("TYPE", typeName(property.type));
    writeArraySize(out, property.type);
    writeOrigin(out, property.classOrigin, property.propagated, encoding);
    writeQualifiers(out, property.qualifiers, encoding);
    writeValue(out, property.defaultValue);
    out.close();
}

const char* parameterElement(const DataType& type) {
    const bool reference = type.type == repository::CimType::Reference;
    if (reference) {
        return type.isArray ? "PARAMETER.REFARRAY" : "PARAMETER.REFERENCE";
    }
    return type.isArray ? "PARAMETER.ARRAY" : "PARAMETER";
}

void writeParameter(XmlWriter& out, const ParameterDecl& parameter, const ClassEncoding& encoding) {
    out.open(parameterElement(parameter.type)).attr("NAME", parameter.name);
    if (parameter.type.type == repository::CimType::Reference) {
        if (!parameter.type.referenceClass.empty()) {
            out.attr("REFERENCECLASS", parameter.type.referenceClass);
        }
    } else {
        out.attr("TYPE", typeName(parameter.type));
    }
    if (parameter.type.isArray) {
        writeArraySize(out, parameter.type);
    }
    writeQualifiers(out, parameter.qualifiers, encoding);
    out.close();
}

void writeMethod(XmlWriter& out, const MethodDecl& method, const ClassEncoding& encoding) {
    out.open("METHOD").attr("NAME", method.name).attr("TYPE", typeName(method.returnType));
    writeOrigin(out, method.classOrigin, method.propagated, encoding);
    writeQualifiers(out, method.qualifiers, encoding);
    for (const auto& parameter : method.parameters) {
        writeParameter(out, parameter, encoding);
    }
    out.close();
}

bool listed(const std::optional<std::vector<std::string>>& list, const std::string& name) {
    if (!list) {
        return true;
    }
    for (const auto& wanted : *list) {
        if (strcasecmp(wanted.c_str(), name.c_str()) == 0) {
            return true;
        }
    }
    return false;
}

}  // namespace

void writeClass(XmlWriter& out, const ClassDecl& cls, const ClassEncoding& encoding) {
    out.open("CLASS").attr("NAME", cls.name);
    if (!cls.superClass.empty()) {
        out.attr("SUPERCLASS", cls.superClass);
    }
    writeQualifiers(out, cls.qualifiers, encoding);
    for (const auto& property : cls.properties) {
        if ((!encoding.localOnly || !property.propagated) && listed(encoding.propertyList, property.name)) {
            writeProperty(out, property, encoding);
        }
    }
    for (const auto& method : cls.methods) {
        if (!encoding.localOnly || !method.propagated) {
            writeMethod(out, method, encoding);
        }
    }
    out.close();
}

}  // namespace orv::cimxml
