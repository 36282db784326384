#include "names.hpp"

namespace orv::host::detail {

namespace {

constexpr char fold(char c) noexcept { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c + 32) : c; }

}  // namespace

bool equalsNoCase(std::string_view a, std::string_view b) noexcept {
    if (a.size() != b.size()) {
        return false;
    }
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (fold(a[i]) != fold(b[i])) {
            return false;
        }
    }
    return true;
}

std::uint32_t hashNoCase(std::string_view name) noexcept {
    std::uint32_t hash = 2166136261U;  // FNV-1a
    for (char c : name) {
        hash = (hash ^ static_cast<unsigned char>(fold(c))) * 16777619U;
    }
    return hash;
}

std::string lowerCase(std::string_view text) {
    std::string out(text);
    for (char& c : out) {
        c = fold(c);
    }
    return out;
}

}  // namespace orv::host::detail
