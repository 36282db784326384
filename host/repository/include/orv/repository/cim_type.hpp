// CIM data types as declared in MOF and carried in CIM-XML.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace orv::repository {

enum class CimType : std::uint8_t {
    Boolean,
    String,
    Char16,
    Uint8,
    Sint8,
    Uint16,
    Sint16,
    Uint32,
    Sint32,
    Uint64,
    Sint64,
    Real32,
    Real64,
    Datetime,
    Reference,
};

// The MOF / CIM-XML spelling in lower case: "boolean", "uint8", "datetime", "reference", ...
std::string_view cimTypeName(CimType type) noexcept;

// The type for a MOF type keyword (case-insensitive); "ref" is not a keyword here,
// references are declared as "ClassName REF name". Empty for unknown words.
std::optional<CimType> cimTypeFromName(std::string_view name) noexcept;

bool isUnsignedInteger(CimType type) noexcept;  // uint8..uint64
bool isSignedInteger(CimType type) noexcept;    // sint8..sint64
bool isReal(CimType type) noexcept;             // real32, real64

// The full type of a property, parameter, method result or qualifier.
struct DataType {
    CimType type = CimType::String;
    bool isArray = false;
    // Fixed array size from "name[5]"; empty for "name[]" and for scalars.
    std::optional<std::uint32_t> arraySize;
    // For references: the referenced class as spelled in the declaration.
    std::string referenceClass;

    bool operator==(const DataType&) const = default;
};

}  // namespace orv::repository
