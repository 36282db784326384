#include "control_pictures.hpp"

namespace orv::cimxml {

namespace {

// U+2400 + c in UTF-8 is E2 90 (80 + c) for c below 0x40.
constexpr unsigned char kLead = 0xE2;
constexpr unsigned char kSecond = 0x90;
constexpr unsigned char kBase = 0x80;

}  // namespace

bool needsControlPicture(unsigned char c) noexcept {
    return c != 0 && c < 0x20 && c != '\t' && c != '\n' && c != '\r';
}

char* writeControlPicture(char* out, unsigned char c) noexcept {
    out[0] = static_cast<char>(kLead);
    out[1] = static_cast<char>(kSecond);
    out[2] = static_cast<char>(kBase + c);
    return out + 3;
}

std::string fromControlPictures(std::string_view text) {
    std::string out;
    std::size_t done = 0;
    for (std::size_t at = text.find(static_cast<char>(kLead)); at != std::string_view::npos && at + 2 < text.size();
         at = text.find(static_cast<char>(kLead), at + 1)) {
        const auto second = static_cast<unsigned char>(text[at + 1]);
        const auto third = static_cast<unsigned char>(text[at + 2]);
        if (second != kSecond || third < kBase || !needsControlPicture(static_cast<unsigned char>(third - kBase))) {
            continue;
        }
        out.append(text.substr(done, at - done));
        out += static_cast<char>(third - kBase);
        done = at + 3;
        at += 2;
    }
    if (done == 0) {
        return std::string(text);
    }
    out.append(text.substr(done));
    return out;
}

}  // namespace orv::cimxml
