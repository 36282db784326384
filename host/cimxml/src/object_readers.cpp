// Readers of the parameter values that name or declare schema elements (CLASS,
// QUALIFIER.DECLARATION) and of reference arrays. The host serves no operation that
// changes classes or qualifiers, but a request carrying them is still valid CIM-XML:
// it is read (and its form checked) so that the operation can be answered with a
// CIM error rather than refused as malformed.
#include "path_reader.hpp"

#include <initializer_list>
#include <string_view>

namespace orv::cimxml::detail {

namespace {

bool oneOf(std::string_view name, std::initializer_list<std::string_view> names) {
    for (std::string_view candidate : names) {
        if (name == candidate) {
            return true;
        }
    }
    return false;
}

// Throws unless every child element of `element` has one of `allowed` names.
void childrenAmong(const XmlElement& element, std::initializer_list<std::string_view> allowed) {
    for (const auto& child : element.children) {
        if (!oneOf(child->name, allowed)) {
            invalid(*child, "not allowed in " + std::string(element.name));
        }
    }
}

bool booleanAttribute(const XmlElement& element, const char* name) {
    const std::string_view* value = element.attribute(name);
    if (value == nullptr || *value == "false") {
        return false;
    }
    if (*value != "true") {
        invalid(element, std::string(name) + " must be true or false");
    }
    return true;
}

}  // namespace

ClassParam readClass(const XmlElement& element) {
    expectName(element, "CLASS");
    childrenAmong(element, {"QUALIFIER", "PROPERTY", "PROPERTY.ARRAY", "PROPERTY.REFERENCE", "METHOD"});
    ClassParam cls;
    cls.name = requireAttribute(element, "NAME");
    if (const std::string_view* superClass = element.attribute("SUPERCLASS")) {
        cls.superClass = *superClass;
    }
    return cls;
}

QualifierDeclarationParam readQualifierDeclaration(const XmlElement& element) {
    expectName(element, "QUALIFIER.DECLARATION");
    childrenAmong(element, {"SCOPE", "VALUE", "VALUE.ARRAY"});
    QualifierDeclarationParam declaration;
    declaration.name = requireAttribute(element, "NAME");
    declaration.type = requireAttribute(element, "TYPE");
    declaration.isArray = booleanAttribute(element, "ISARRAY");
    return declaration;
}

RefArrayParam readRefArray(const XmlElement& element) {
    expectName(element, "VALUE.REFARRAY");
    RefArrayParam array;
    for (const auto& item : element.children) {
        if (item->name == "VALUE.REFERENCE") {
            array.items.emplace_back(readObjectPath(*item));
        } else if (item->name == "VALUE.NULL") {
            array.items.emplace_back(std::nullopt);
        } else {
            invalid(*item, "expected VALUE.REFERENCE or VALUE.NULL");
        }
    }
    return array;
}

}  // namespace orv::cimxml::detail
