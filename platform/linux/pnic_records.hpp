// The NIC library's records filled from what the Linux readers answered.
// Pure functions: every kernel structure in, one record out.
#pragma once

#include "ethtool_reader.hpp"

#include "nodemgr/network/MacAddress.h"
#include "nodemgr/network/PnicRecords.h"

#include <array>
#include <linux/if_link.h>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost {

std::vector<NodeMgr::Network::LinkMode> toLinkModes(const LinkModeMask& mask);
NodeMgr::Network::LinkSpeed toLinkSpeed(std::uint32_t kernelSpeed);
NodeMgr::Network::Duplex toDuplex(std::uint8_t kernelDuplex);

// Link part of PnicInfo from the link settings; wake-on part from GWOL when the
// driver answers it (nothing: not supported); message level when it answers.
void fillLinkPart(NodeMgr::Network::PnicInfo& info, const LinkSettings& settings, bool linkUp);
void fillWakeOnPart(NodeMgr::Network::PnicInfo& info, const std::optional<ethtool_wolinfo>& wol);
void fillMessageLevel(NodeMgr::Network::PnicInfo& info, const std::optional<std::uint32_t>& level);

NodeMgr::Network::PnicDriverInfo toDriverInfo(const ethtool_drvinfo& info);
// The offload record from the names of the features that are on.
NodeMgr::Network::PnicOffloadInfo toOffloadInfo(const std::vector<std::string>& activeFeatures);
NodeMgr::Network::PnicCoalesceInfo toCoalesceInfo(const ethtool_coalesce& coalesce);
NodeMgr::Network::PnicPauseInfo toPauseInfo(const ethtool_pauseparam& pause, const LinkSettings* settings);
// preset from the maxima, current from the sizes in use.
void toRingInfo(const ethtool_ringparam& rings, NodeMgr::Network::PnicRingInfo& preset,
                NodeMgr::Network::PnicRingInfo& current);
// Interface counters first; counters rtnetlink does not keep come from the
// driver's statistics by name (see README).
NodeMgr::Network::PnicStats toStats(const rtnl_link_stats64& link, const std::vector<DriverStatistic>& driver);
// Six address bytes as a MAC address; an empty address for any other length.
NodeMgr::Network::MacAddress toMacAddress(const std::vector<std::uint8_t>& bytes);

}  // namespace orv::linuxhost
