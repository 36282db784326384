#include "text.hpp"

namespace orv::repository::text {

bool iequals(std::string_view a, std::string_view b) noexcept {
    if (a.size() != b.size()) {
        return false;
    }
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (lower(a[i]) != lower(b[i])) {
            return false;
        }
    }
    return true;
}

std::string toLower(std::string_view s) {
    std::string out(s);
    for (char& c : out) {
        c = lower(c);
    }
    return out;
}

std::string_view trim(std::string_view s) noexcept {
    constexpr std::string_view blanks = " \t\r\n";
    const auto first = s.find_first_not_of(blanks);
    if (first == std::string_view::npos) {
        return {};
    }
    const auto last = s.find_last_not_of(blanks);
    return s.substr(first, last - first + 1);
}

void appendUtf8(std::string& out, char32_t cp) {
    const auto byte = [&out](char32_t v) { out.push_back(static_cast<char>(v)); };
    if (cp < 0x80) {
        byte(cp);
    } else if (cp < 0x800) {
        byte(0xC0 | (cp >> 6U));
        byte(0x80 | (cp & 0x3FU));
    } else if (cp < 0x10000) {
        byte(0xE0 | (cp >> 12U));
        byte(0x80 | ((cp >> 6U) & 0x3FU));
        byte(0x80 | (cp & 0x3FU));
    } else {
        byte(0xF0 | (cp >> 18U));
        byte(0x80 | ((cp >> 12U) & 0x3FU));
        byte(0x80 | ((cp >> 6U) & 0x3FU));
        byte(0x80 | (cp & 0x3FU));
    }
}

std::size_t CaseInsensitiveHash::operator()(std::string_view s) const noexcept {
    // FNV-1a over the lower-cased bytes.
    std::size_t h = 14695981039346656037ULL;
    for (char c : s) {
        h ^= static_cast<unsigned char>(lower(c));
        h *= 1099511628211ULL;
    }
    return h;
}

}  // namespace orv::repository::text
