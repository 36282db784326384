// The ethtool ioctl queries the NIC records need, one function per command,
// answering the kernel's own structures (or small owned ones where the kernel's
// answer has a variable length). Every refusal throws LinuxCallError naming the command.
#pragma once

#include "ethtool_channel.hpp"
#include "ethtool_netlink_channel.hpp"
#include "link_mode_mask.hpp"

#include <cstdint>
#include <optional>
#include <linux/ethtool.h>
#include <string>
#include <utility>
#include <vector>

namespace orv::linuxhost {

enum class LinkSettingsSource { Netlink, LinkSettingsIoctl, LegacyIoctl };

struct LinkSettings {
    std::uint32_t speed = static_cast<std::uint32_t>(SPEED_UNKNOWN);  // Mb/s
    std::uint8_t duplex = DUPLEX_UNKNOWN;
    std::uint8_t port = PORT_OTHER;
    std::uint8_t phyAddress = 0;
    std::uint8_t transceiver = XCVR_INTERNAL;
    std::uint8_t autoneg = AUTONEG_DISABLE;
    LinkModeMask supported;
    LinkModeMask advertising;
    LinkModeMask partner;
    LinkSettingsSource source = LinkSettingsSource::LinkSettingsIoctl;
};

struct DriverStatistic {
    std::string name;
    std::uint64_t value = 0;
};

class EthtoolReader {
public:
    // With a netlink channel, link settings, wake-on-LAN, coalescing, pause and
    // rings are asked through ethtool netlink first; a kernel without the
    // ethtool family (ENOENT) or that does not know the message type
    // (EOPNOTSUPP, EINVAL) is asked through the ioctl instead, for that call only.
    EthtoolReader(EthtoolChannel& channel, std::string ifname, EthtoolNetlinkChannel* netlink = nullptr);

    // ETHTOOL_MSG_LINKINFO_GET and ETHTOOL_MSG_LINKMODES_GET; else
    // ETHTOOL_GLINKSETTINGS with the mask-size handshake; ETHTOOL_GSET when the
    // kernel or driver does not know that command either.
    LinkSettings linkSettings() const;
    ethtool_drvinfo driverInfo() const;
    // Nothing when the driver does not implement wake-on-LAN (EOPNOTSUPP): a
    // common answer, so it is no exception.
    std::optional<ethtool_wolinfo> wakeOnLan() const;
    ethtool_coalesce coalesce() const;
    ethtool_pauseparam pause() const;
    ethtool_ringparam rings() const;
    // Nothing when the driver does not implement it (EOPNOTSUPP).
    std::optional<std::uint32_t> messageLevel() const;
    bool linkDetected() const;
    // A legacy on/off query answered in an ethtool_value (ETHTOOL_GRXCSUM, ...).
    std::uint32_t value(std::uint32_t command, const char* name) const;
    // The burnt-in address; empty when the driver reports none.
    std::vector<std::uint8_t> permanentAddress() const;
    // Names of the device features that are on (string set ETH_SS_FEATURES with
    // the active words of ETHTOOL_GFEATURES): "rx-checksum", "tx-scatter-gather", ...
    std::vector<std::string> activeFeatures() const;
    // The driver's own counters (string set ETH_SS_STATS) with their names.
    std::vector<DriverStatistic> driverStatistics() const;

private:
    void exchange(void* buffer, std::size_t size, const char* command) const;
    template <typename Answer>
    Answer simple(std::uint32_t command, const char* name) const;
    // As simple, answering nothing when the driver does not implement the command.
    template <typename Answer>
    std::optional<Answer> simpleIfSupported(std::uint32_t command, const char* name) const;
    template <typename Answer>
    bool fromNetlink(std::uint8_t message, const char* name, bool (*parse)(const NetlinkMessage&, Answer&),
                     Answer& answer) const;
    template <typename Answer>
    Answer preferNetlink(std::uint8_t message, const char* messageName, bool (*parse)(const NetlinkMessage&, Answer&),
                         std::uint32_t command, const char* commandName) const;
    std::optional<LinkSettings> netlinkSettings() const;
    LinkSettings ioctlSettings() const;
    LinkSettings legacySettings() const;
    // Size and names of a string set (ETH_SS_STATS, ETH_SS_FEATURES).
    std::uint32_t stringSetCount(std::uint32_t set) const;
    std::vector<std::string> stringSetNames(std::uint32_t set, std::uint32_t count) const;
    std::vector<std::uint64_t> statisticValues(std::uint32_t count) const;

    EthtoolChannel& channel_;
    std::string ifname_;
    EthtoolNetlinkChannel* netlink_;
};

}  // namespace orv::linuxhost
