#include "orv/repository/cim_type.hpp"

#include <array>
#include <utility>

#include "text.hpp"

namespace orv::repository {
namespace {

constexpr std::array<std::pair<CimType, std::string_view>, 15> kNames{{
    {CimType::Boolean, "boolean"},
    {CimType::String, "string"},
    {CimType::Char16, "char16"},
    {CimType::Uint8, "uint8"},
    {CimType::Sint8, "sint8"},
    {CimType::Uint16, "uint16"},
    {CimType::Sint16, "sint16"},
    {CimType::Uint32, "uint32"},
    {CimType::Sint32, "sint32"},
    {CimType::Uint64, "uint64"},
    {CimType::Sint64, "sint64"},
    {CimType::Real32, "real32"},
    {CimType::Real64, "real64"},
    {CimType::Datetime, "datetime"},
    {CimType::Reference, "reference"},
}};

}  // namespace

std::string_view cimTypeName(CimType type) noexcept {
    return kNames[static_cast<std::size_t>(type)].second;
}

std::optional<CimType> cimTypeFromName(std::string_view name) noexcept {
    for (const auto& [type, spelled] : kNames) {
        if (type != CimType::Reference && text::iequals(name, spelled)) {
            return type;
        }
    }
    return std::nullopt;
}

bool isUnsignedInteger(CimType type) noexcept {
    return type == CimType::Uint8 || type == CimType::Uint16 || type == CimType::Uint32 ||
           type == CimType::Uint64;
}

bool isSignedInteger(CimType type) noexcept {
    return type == CimType::Sint8 || type == CimType::Sint16 || type == CimType::Sint32 ||
           type == CimType::Sint64;
}

bool isReal(CimType type) noexcept {
    return type == CimType::Real32 || type == CimType::Real64;
}

}  // namespace orv::repository
