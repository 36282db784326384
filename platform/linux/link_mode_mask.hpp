// A bit mask in the kernel's word layout (link modes, wake-on modes): bit n is
// bit n%32 of word n/32. The ioctls answer it as words; ethtool netlink as a bitset.
#pragma once

#include <cstdint>
#include <vector>

namespace orv::linuxhost {

struct LinkModeMask {
    std::vector<std::uint32_t> words;
    bool test(unsigned bit) const;
    void set(unsigned bit);
    // Same bits set, whatever the word counts (missing words read as zero).
    bool sameBits(const LinkModeMask& other) const;
};

}  // namespace orv::linuxhost
