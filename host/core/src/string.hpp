// CMPIString: hdl is the NUL-terminated character buffer, as providers built
// with the 2.0 CMGetCharPtr macro read it directly.
#pragma once

#include <string_view>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIStringFT kStringFT;

CMPIString* newString(std::string_view text, Owner owner);
// The string a value of the current member home (memberHome()) holds for
// `string`: the same object when it is a parent's string of that pool (such
// strings are shared), else a Parent-owned copy. nullptr when not ours.
CMPIString* memberString(const CMPIString* string);
// Whether `object` is a string carved from a pool (never destroyed one by one:
// it may be shared).
inline bool isPoolString(const void* object) noexcept {
    const auto* base = static_cast<const ObjectBase*>(object);
    return base->ft == &kStringFT && base->home != nullptr;
}
// The text of one of our strings, or nullptr for anything else.
const char* stringText(const CMPIString* string) noexcept;

}  // namespace orv::host::detail
