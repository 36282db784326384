// What the MOF parser reads, before types are applied and inheritance resolved.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "orv/repository/cim_type.hpp"
#include "orv/repository/qualifier.hpp"

namespace orv::repository::mof {

// One literal, still untyped: the declared type decides how it is stored.
struct Literal {
    enum class Kind : std::uint8_t { Null, Boolean, Integer, Real, String, Char16 };
    Kind kind = Kind::Null;
    bool boolean = false;
    std::uint64_t magnitude = 0;
    bool negative = false;
    double real = 0.0;
    std::string text;
    char16_t ch = 0;
};

// An initializer: absent, one literal, or an array "{...}".
struct ValueSyntax {
    bool present = false;
    bool isArray = false;
    std::vector<Literal> items;
    int line = 0;
};

struct QualifierSyntax {
    std::string name;
    ValueSyntax value;
    std::optional<Flavors> flavors;
    int line = 0;
};

using QualifierSyntaxList = std::vector<QualifierSyntax>;

// A property or a reference ("CIM_X REF Name").
struct PropertySyntax {
    QualifierSyntaxList qualifiers;
    DataType type;
    std::string name;
    ValueSyntax defaultValue;
    int line = 0;
};

struct ParameterSyntax {
    QualifierSyntaxList qualifiers;
    DataType type;
    std::string name;
    int line = 0;
};

struct MethodSyntax {
    QualifierSyntaxList qualifiers;
    DataType returnType;
    std::string name;
    std::vector<ParameterSyntax> parameters;
    int line = 0;
};

struct ClassSyntax {
    QualifierSyntaxList qualifiers;
    std::string name;
    std::string superClass;
    std::vector<PropertySyntax> properties;
    std::vector<MethodSyntax> methods;
    int line = 0;
};

struct QualifierDeclSyntax {
    std::string name;
    DataType type;
    ValueSyntax defaultValue;
    std::uint16_t scopes = 0;
    std::optional<Flavors> flavors;
    int line = 0;
};

struct PragmaSyntax {
    std::string name;
    std::string argument;
    int line = 0;
};

using Production = std::variant<PragmaSyntax, ClassSyntax, QualifierDeclSyntax>;

}  // namespace orv::repository::mof
