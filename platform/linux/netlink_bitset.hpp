// An ethtool netlink bitset attribute read into masks. The kernel sends it in
// one of two forms: compact (ETHTOOL_A_BITSET_VALUE and _MASK as arrays of
// 32-bit words) or a bit list (ETHTOOL_A_BITSET_BITS: one nest per bit with its
// index, name and a VALUE flag). Without ETHTOOL_A_BITSET_NOMASK the bitset
// carries a mask (for link modes: supported) beside the value (advertised).
#pragma once

#include "link_mode_mask.hpp"

#include <cstdint>
#include <libmnl/libmnl.h>

namespace orv::linuxhost {

struct NetlinkBitset {
    std::uint32_t size = 0;  // bits
    bool hasMask = false;
    LinkModeMask value;
    LinkModeMask mask;
};

// Reads the bitset nest; false when it is malformed.
bool parseBitset(const nlattr* nest, NetlinkBitset& bitset);

}  // namespace orv::linuxhost
