// CIM names (classes, properties, keys, entries) compare without regard to case.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace orv::host::detail {

bool equalsNoCase(std::string_view a, std::string_view b) noexcept;
// A hash that is equal for names that are equalsNoCase.
std::uint32_t hashNoCase(std::string_view name) noexcept;
std::string lowerCase(std::string_view text);

}  // namespace orv::host::detail
