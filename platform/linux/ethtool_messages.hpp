// Ethtool netlink reply messages read into the structures the ioctls answer,
// so that both paths feed the same mappings. Each returns false when the
// message is not a well-formed reply of its kind (too short, wrong reply
// command, an attribute of the wrong size, a malformed bitset).
#pragma once

#include "ethtool_reader.hpp"
#include "netlink_socket.hpp"

#include <linux/ethtool.h>

namespace orv::linuxhost {

// ETHTOOL_MSG_LINKINFO_GET_REPLY: port, PHY address, transceiver.
bool parseLinkInfo(const NetlinkMessage& message, LinkSettings& settings);
// ETHTOOL_MSG_LINKMODES_GET_REPLY: auto-negotiation, speed, duplex; our
// bitset's mask is the supported modes and its value the advertised ones, the
// peer's bitset the partner's modes.
bool parseLinkModes(const NetlinkMessage& message, LinkSettings& settings);
// ETHTOOL_MSG_WOL_GET_REPLY: the modes bitset's mask is `supported`, its value `wolopts`.
bool parseWakeOnLan(const NetlinkMessage& message, ethtool_wolinfo& wol);
bool parseRings(const NetlinkMessage& message, ethtool_ringparam& rings);
bool parsePause(const NetlinkMessage& message, ethtool_pauseparam& pause);
bool parseCoalesce(const NetlinkMessage& message, ethtool_coalesce& coalesce);

}  // namespace orv::linuxhost
