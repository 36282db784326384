// Case-insensitive comparison and hashing of ASCII names (CIM names compare
// without regard to case), plus small string helpers shared by the readers.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace orv::repository::text {

constexpr char lower(char c) noexcept {
    return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c;
}

bool iequals(std::string_view a, std::string_view b) noexcept;
std::string toLower(std::string_view s);
std::string_view trim(std::string_view s) noexcept;
// Appends the UTF-8 encoding of a code point below 0x110000.
void appendUtf8(std::string& out, char32_t codePoint);

// Hash and equality for unordered containers keyed by names in any case; both
// are transparent so lookups take a string_view without building a string.
struct CaseInsensitiveHash {
    using is_transparent = void;
    std::size_t operator()(std::string_view s) const noexcept;
};

struct CaseInsensitiveEqual {
    using is_transparent = void;
    bool operator()(std::string_view a, std::string_view b) const noexcept { return iequals(a, b); }
};

}  // namespace orv::repository::text
