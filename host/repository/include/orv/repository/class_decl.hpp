// Declarations of CIM classes, their properties, methods and parameters.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "orv/repository/cim_type.hpp"
#include "orv/repository/qualifier.hpp"
#include "orv/repository/value.hpp"

namespace orv::repository {

struct PropertyDecl {
    std::string name;  // as declared
    DataType type;     // type.type == CimType::Reference for "CIM_X REF Name"
    Value defaultValue;
    QualifierList qualifiers;
    bool key = false;  // carries Key(true)
    // The class that declared (or last overrode) this property, spelled as declared.
    std::string classOrigin;
    // True when inherited unchanged from the superclass (not declared again here).
    bool propagated = false;

    bool isReference() const noexcept { return type.type == CimType::Reference; }
};

struct ParameterDecl {
    std::string name;
    DataType type;
    QualifierList qualifiers;

    // In defaults to true when the parameter has neither qualifier.
    bool isIn() const noexcept;
    bool isOut() const noexcept;
};

struct MethodDecl {
    std::string name;
    DataType returnType;  // scalar; methods do not return arrays in MOF
    QualifierList qualifiers;
    std::vector<ParameterDecl> parameters;
    std::string classOrigin;
    bool propagated = false;

    const ParameterDecl* findParameter(std::string_view name) const noexcept;
};

struct ClassDecl {
    std::string name;        // as declared
    std::string superClass;  // as declared in the class (empty for a root class)
    QualifierList qualifiers;  // own qualifiers plus those inherited with ToSubclass

    // Only what this class's declaration lists, in declaration order.
    std::vector<PropertyDecl> ownProperties;
    std::vector<MethodDecl> ownMethods;
    // Everything an instance of the class has, in schema order: the superclass's
    // effective properties first (in its order; an overridden one keeps its place
    // and takes the new declaration), then this class's new ones.
    std::vector<PropertyDecl> properties;
    std::vector<MethodDecl> methods;  // same rule as properties

    bool isAssociation = false;  // Association qualifier, inherited
    bool isIndication = false;   // Indication qualifier, inherited
    bool isAbstract = false;     // Abstract qualifier, never inherited

    // Where the class was declared.
    std::string file;
    int line = 0;

    // Effective property / method named so (any case), or nullptr. A property spelled as
    // declared is found through propertySlots; another spelling by a scan.
    const PropertyDecl* findProperty(std::string_view name) const noexcept;
    const MethodDecl* findMethod(std::string_view name) const noexcept;
    // Names of the key properties, inherited ones included, in schema order.
    std::vector<std::string> keyNames() const;
    // The reference properties (for an association, its ends), in schema order.
    std::vector<const PropertyDecl*> referenceProperties() const;

    // Hashes the names of `properties` into propertySlots; called once the list is final.
    void indexProperties();
    // An open-addressed table over the exact property names: each slot holds a position in
    // `properties` plus one, 0 when empty. Empty until indexProperties().
    std::vector<std::uint32_t> propertySlots;
};

}  // namespace orv::repository
