// Text into a fixed-size character field of a kernel or library record.
#pragma once

#include <algorithm>
#include <cstring>
#include <string>

namespace orv::linuxhost {

// NUL-padded and always terminated: at most N - 1 characters are kept.
template <std::size_t N>
void putFixedText(char (&field)[N], const std::string& text)
{
    std::memset(field, 0, N);
    std::memcpy(field, text.data(), std::min(text.size(), N - 1));
}

}  // namespace orv::linuxhost
