#include "ethtool_messages.hpp"

#include "netlink_attributes.hpp"
#include "netlink_bitset.hpp"

#include <cstddef>
#include <cstring>
#include <functional>
#include <linux/ethtool_netlink.h>
#include <linux/genetlink.h>

namespace orv::linuxhost {

namespace {

// The rings, pause and coalescing replies carry their fields as attributes
// 2..N in the order of the ioctl structure's words after `cmd`: attribute n is
// word n-1. The checks keep that correspondence honest.
static_assert(offsetof(ethtool_ringparam, tx_pending) == 4 * (ETHTOOL_A_RINGS_TX - 1));
static_assert(offsetof(ethtool_ringparam, rx_max_pending) == 4 * (ETHTOOL_A_RINGS_RX_MAX - 1));
static_assert(offsetof(ethtool_pauseparam, autoneg) == 4 * (ETHTOOL_A_PAUSE_AUTONEG - 1));
static_assert(offsetof(ethtool_pauseparam, tx_pause) == 4 * (ETHTOOL_A_PAUSE_TX - 1));
static_assert(offsetof(ethtool_coalesce, rx_coalesce_usecs) == 4 * (ETHTOOL_A_COALESCE_RX_USECS - 1));
static_assert(offsetof(ethtool_coalesce, use_adaptive_rx_coalesce) == 4 * (ETHTOOL_A_COALESCE_USE_ADAPTIVE_RX - 1));
static_assert(offsetof(ethtool_coalesce, rate_sample_interval) ==
              4 * (ETHTOOL_A_COALESCE_RATE_SAMPLE_INTERVAL - 1));

// Calls `visit` for every top-level attribute of a reply of kind `reply`;
// false when the message is not such a reply or `visit` refuses an attribute.
bool forEachAttribute(const NetlinkMessage& message, std::uint8_t reply,
                      const std::function<bool(const nlattr*)>& visit)
{
    if (message.size() < MNL_NLMSG_HDRLEN + sizeof(genlmsghdr)) return false;
    const auto* header = reinterpret_cast<const nlmsghdr*>(message.data());
    if (!mnl_nlmsg_ok(header, static_cast<int>(message.size())) ||
        header->nlmsg_len < MNL_NLMSG_HDRLEN + sizeof(genlmsghdr)) {
        return false;
    }
    const auto* genl = static_cast<const genlmsghdr*>(mnl_nlmsg_get_payload(header));
    if (genl->cmd != reply) return false;
    const std::size_t offset = MNL_NLMSG_HDRLEN + MNL_ALIGN(sizeof(genlmsghdr));
    return forEachAttributeIn(message.data() + offset, header->nlmsg_len - offset, visit);
}

// A u8 or u32 attribute, by its payload length.
bool readNumber(const nlattr* attribute, std::uint32_t& value)
{
    switch (mnl_attr_get_payload_len(attribute)) {
    case 1: value = mnl_attr_get_u8(attribute); return true;
    case 4: value = mnl_attr_get_u32(attribute); return true;
    default: return false;
    }
}

bool readU8(const nlattr* attribute, std::uint8_t& value)
{
    if (mnl_attr_validate(attribute, MNL_TYPE_U8) < 0) return false;
    value = mnl_attr_get_u8(attribute);
    return true;
}

template <typename Structure>
bool readWords(const NetlinkMessage& message, std::uint8_t reply, std::uint16_t last, Structure& answer)
{
    static_assert(sizeof(Structure) % 4 == 0);
    answer = Structure{};
    std::uint32_t words[sizeof(Structure) / 4] = {};
    bool ok = forEachAttribute(message, reply, [&](const nlattr* attribute) {
        const std::uint16_t type = mnl_attr_get_type(attribute);
        if (type < 2 || type > last) return true;  // the header, and fields the ioctl has no word for
        return readNumber(attribute, words[type - 1]);
    });
    if (!ok) return false;
    std::memcpy(&answer, words, sizeof words);
    return true;
}

}  // namespace

bool parseLinkInfo(const NetlinkMessage& message, LinkSettings& settings)
{
    return forEachAttribute(message, ETHTOOL_MSG_LINKINFO_GET_REPLY, [&](const nlattr* attribute) {
        switch (mnl_attr_get_type(attribute)) {
        case ETHTOOL_A_LINKINFO_PORT: return readU8(attribute, settings.port);
        case ETHTOOL_A_LINKINFO_PHYADDR: return readU8(attribute, settings.phyAddress);
        case ETHTOOL_A_LINKINFO_TRANSCEIVER: return readU8(attribute, settings.transceiver);
        default: return true;
        }
    });
}

bool parseLinkModes(const NetlinkMessage& message, LinkSettings& settings)
{
    return forEachAttribute(message, ETHTOOL_MSG_LINKMODES_GET_REPLY, [&](const nlattr* attribute) {
        NetlinkBitset bitset;
        switch (mnl_attr_get_type(attribute)) {
        case ETHTOOL_A_LINKMODES_AUTONEG: return readU8(attribute, settings.autoneg);
        case ETHTOOL_A_LINKMODES_DUPLEX: return readU8(attribute, settings.duplex);
        case ETHTOOL_A_LINKMODES_SPEED:
            if (mnl_attr_validate(attribute, MNL_TYPE_U32) < 0) return false;
            settings.speed = mnl_attr_get_u32(attribute);
            return true;
        case ETHTOOL_A_LINKMODES_OURS:
            if (!parseBitset(attribute, bitset)) return false;
            settings.supported = bitset.mask;
            settings.advertising = bitset.value;
            return true;
        case ETHTOOL_A_LINKMODES_PEER:
            if (!parseBitset(attribute, bitset)) return false;
            settings.partner = bitset.value;
            return true;
        default: return true;
        }
    });
}

bool parseWakeOnLan(const NetlinkMessage& message, ethtool_wolinfo& wol)
{
    wol = ethtool_wolinfo{};
    wol.cmd = ETHTOOL_GWOL;
    return forEachAttribute(message, ETHTOOL_MSG_WOL_GET_REPLY, [&](const nlattr* attribute) {
        NetlinkBitset bitset;
        switch (mnl_attr_get_type(attribute)) {
        case ETHTOOL_A_WOL_MODES:
            if (!parseBitset(attribute, bitset)) return false;
            wol.supported = bitset.mask.words.empty() ? 0 : bitset.mask.words[0];
            wol.wolopts = bitset.value.words.empty() ? 0 : bitset.value.words[0];
            return true;
        case ETHTOOL_A_WOL_SOPASS:
            if (mnl_attr_get_payload_len(attribute) != sizeof wol.sopass) return false;
            std::memcpy(wol.sopass, mnl_attr_get_payload(attribute), sizeof wol.sopass);
            return true;
        default: return true;
        }
    });
}

bool parseRings(const NetlinkMessage& message, ethtool_ringparam& rings)
{
    bool ok = readWords(message, ETHTOOL_MSG_RINGS_GET_REPLY, ETHTOOL_A_RINGS_TX, rings);
    rings.cmd = ETHTOOL_GRINGPARAM;
    return ok;
}

bool parsePause(const NetlinkMessage& message, ethtool_pauseparam& pause)
{
    bool ok = readWords(message, ETHTOOL_MSG_PAUSE_GET_REPLY, ETHTOOL_A_PAUSE_TX, pause);
    pause.cmd = ETHTOOL_GPAUSEPARAM;
    return ok;
}

bool parseCoalesce(const NetlinkMessage& message, ethtool_coalesce& coalesce)
{
    bool ok = readWords(message, ETHTOOL_MSG_COALESCE_GET_REPLY, ETHTOOL_A_COALESCE_RATE_SAMPLE_INTERVAL, coalesce);
    coalesce.cmd = ETHTOOL_GCOALESCE;
    return ok;
}

}  // namespace orv::linuxhost
