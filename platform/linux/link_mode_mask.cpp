#include "link_mode_mask.hpp"

#include <algorithm>

namespace orv::linuxhost {

bool LinkModeMask::test(unsigned bit) const
{
    std::size_t word = bit / 32;
    return word < words.size() && (words[word] >> (bit % 32)) & 1u;
}

void LinkModeMask::set(unsigned bit)
{
    std::size_t word = bit / 32;
    if (words.size() <= word) words.resize(word + 1, 0);
    words[word] |= 1u << (bit % 32);
}

bool LinkModeMask::sameBits(const LinkModeMask& other) const
{
    const std::size_t count = std::max(words.size(), other.words.size());
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint32_t mine = i < words.size() ? words[i] : 0;
        const std::uint32_t theirs = i < other.words.size() ? other.words[i] : 0;
        if (mine != theirs) return false;
    }
    return true;
}

}  // namespace orv::linuxhost
