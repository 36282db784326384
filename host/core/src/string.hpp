// CMPIString: hdl is the NUL-terminated character buffer, as providers built
// with the 2.0 CMGetCharPtr macro read it directly.
#pragma once

#include <string_view>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIStringFT kStringFT;

CMPIString* newString(std::string_view text, Owner owner);
// The text of one of our strings, or nullptr for anything else.
const char* stringText(const CMPIString* string) noexcept;

}  // namespace orv::host::detail
