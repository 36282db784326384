#include "netlink_bitset.hpp"

#include "netlink_attributes.hpp"

#include <algorithm>
#include <linux/ethtool_netlink.h>

namespace orv::linuxhost {

namespace {

constexpr std::uint32_t kMaxBits = 127 * 32;  // the largest mask the ioctls can carry

LinkModeMask wordsOf(const nlattr* attribute, std::uint32_t size)
{
    LinkModeMask mask;
    const std::size_t words = std::min<std::size_t>((size + 31) / 32, mnl_attr_get_payload_len(attribute) / 4);
    const auto* payload = static_cast<const std::uint32_t*>(mnl_attr_get_payload(attribute));
    mask.words.assign(payload, payload + words);
    return mask;
}

// One ETHTOOL_A_BITSET_BITS_BIT nest: its index and whether VALUE is set.
bool parseBit(const nlattr* nest, std::uint32_t& index, bool& value)
{
    bool hasIndex = false;
    value = false;
    bool ok = forEachNested(nest, [&](const nlattr* attribute) {
        switch (mnl_attr_get_type(attribute)) {
        case ETHTOOL_A_BITSET_BIT_INDEX:
            if (mnl_attr_validate(attribute, MNL_TYPE_U32) < 0) return false;
            index = mnl_attr_get_u32(attribute);
            hasIndex = true;
            return true;
        case ETHTOOL_A_BITSET_BIT_VALUE: value = true; return true;
        default: return true;  // the name is for people
        }
    });
    return ok && hasIndex && index < kMaxBits;
}

// The bit list: with a mask every listed bit is in the mask and VALUE says
// whether it is in the value; without one every listed bit is in the value.
bool parseBitList(const nlattr* nest, NetlinkBitset& bitset)
{
    return forEachNested(nest, [&](const nlattr* bitNest) {
        if (mnl_attr_get_type(bitNest) != ETHTOOL_A_BITSET_BITS_BIT) return true;
        std::uint32_t index = 0;
        bool value = false;
        if (!parseBit(bitNest, index, value)) return false;
        if (bitset.hasMask) bitset.mask.set(index);
        if (value || !bitset.hasMask) bitset.value.set(index);
        return true;
    });
}

}  // namespace

bool parseBitset(const nlattr* nest, NetlinkBitset& bitset)
{
    bitset = NetlinkBitset{};
    bitset.hasMask = true;
    const nlattr* bits = nullptr;
    const nlattr* value = nullptr;
    const nlattr* mask = nullptr;
    bool ok = forEachNested(nest, [&](const nlattr* attribute) {
        switch (mnl_attr_get_type(attribute)) {
        case ETHTOOL_A_BITSET_NOMASK: bitset.hasMask = false; return true;
        case ETHTOOL_A_BITSET_SIZE:
            if (mnl_attr_validate(attribute, MNL_TYPE_U32) < 0) return false;
            bitset.size = mnl_attr_get_u32(attribute);
            return true;
        case ETHTOOL_A_BITSET_BITS: bits = attribute; return true;
        case ETHTOOL_A_BITSET_VALUE: value = attribute; return true;
        case ETHTOOL_A_BITSET_MASK: mask = attribute; return true;
        default: return true;
        }
    });
    if (!ok || bitset.size > kMaxBits) return false;
    if (value) {
        bitset.value = wordsOf(value, bitset.size);
        if (mask) bitset.mask = wordsOf(mask, bitset.size);
        return !bitset.hasMask || mask != nullptr;
    }
    return bits == nullptr || parseBitList(bits, bitset);
}

}  // namespace orv::linuxhost
