#include "ethtool_reader.hpp"

#include "ethtool_messages.hpp"
#include "linux_call_error.hpp"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <linux/ethtool_netlink.h>
#include <memory>

namespace orv::linuxhost {

namespace {

// The kernel answers a link-mode mask size in a signed byte.
constexpr int kMaxMaskWords = 127;

LinkModeMask maskFromWords(const std::uint32_t* words, std::size_t count)
{
    LinkModeMask mask;
    mask.words.assign(words, words + count);
    return mask;
}

// The refusals that send a query back to the ioctl: no ethtool family in the
// kernel, or a message type it does not know.
bool netlinkUnavailable(int error)
{
    return error == ENOENT || error == EOPNOTSUPP || error == EINVAL;
}

// A buffer for commands that end in a variable array, zeroed, 8-byte aligned.
struct CommandBuffer {
    explicit CommandBuffer(std::size_t length) : bytes((length + 7) / 8, 0), size(length) {}
    template <typename T>
    T* as() { return reinterpret_cast<T*>(bytes.data()); }
    std::vector<std::uint64_t> bytes;
    std::size_t size;
};

}  // namespace

EthtoolReader::EthtoolReader(EthtoolChannel& channel, std::string ifname, EthtoolNetlinkChannel* netlink)
    : channel_(channel), ifname_(std::move(ifname)), netlink_(netlink)
{
}

template <typename Answer>
bool EthtoolReader::fromNetlink(std::uint8_t message, const char* name,
                                bool (*parse)(const NetlinkMessage&, Answer&), Answer& answer) const
{
    if (!netlink_) return false;
    NetlinkMessage reply;
    const int error = netlink_->query(message, ifname_, reply);
    if (netlinkUnavailable(error)) return false;
    if (error) throw LinuxCallError(name, ifname_, error);
    if (!parse(reply, answer)) throw LinuxCallError(name, ifname_, EPROTO);
    return true;
}

template <typename Answer>
Answer EthtoolReader::preferNetlink(std::uint8_t message, const char* messageName,
                                   bool (*parse)(const NetlinkMessage&, Answer&), std::uint32_t command,
                                   const char* commandName) const
{
    Answer answer{};
    if (fromNetlink(message, messageName, parse, answer)) return answer;
    return simple<Answer>(command, commandName);
}

void EthtoolReader::exchange(void* buffer, std::size_t size, const char* command) const
{
    if (int error = channel_.exchange(ifname_, buffer, size)) throw LinuxCallError(command, ifname_, error);
}

template <typename Answer>
Answer EthtoolReader::simple(std::uint32_t command, const char* name) const
{
    Answer answer{};
    answer.cmd = command;
    exchange(&answer, sizeof answer, name);
    return answer;
}

template <typename Answer>
std::optional<Answer> EthtoolReader::simpleIfSupported(std::uint32_t command, const char* name) const
{
    Answer answer{};
    answer.cmd = command;
    const int error = channel_.exchange(ifname_, &answer, sizeof answer);
    if (error == EOPNOTSUPP) return std::nullopt;
    if (error) throw LinuxCallError(name, ifname_, error);
    return answer;
}

LinkSettings EthtoolReader::linkSettings() const
{
    if (auto settings = netlinkSettings()) return *settings;
    return ioctlSettings();
}

std::optional<LinkSettings> EthtoolReader::netlinkSettings() const
{
    LinkSettings settings;
    if (!fromNetlink(ETHTOOL_MSG_LINKINFO_GET, "ETHTOOL_MSG_LINKINFO_GET", parseLinkInfo, settings)) return std::nullopt;
    if (!fromNetlink(ETHTOOL_MSG_LINKMODES_GET, "ETHTOOL_MSG_LINKMODES_GET", parseLinkModes, settings)) {
        return std::nullopt;
    }
    settings.source = LinkSettingsSource::Netlink;
    return settings;
}

LinkSettings EthtoolReader::ioctlSettings() const
{
    const std::size_t headerSize = sizeof(ethtool_link_settings);
    CommandBuffer buffer(headerSize + 3 * kMaxMaskWords * sizeof(std::uint32_t));
    auto* request = buffer.as<ethtool_link_settings>();
    request->cmd = ETHTOOL_GLINKSETTINGS;
    int error = channel_.exchange(ifname_, request, buffer.size);
    if (error == EOPNOTSUPP) return legacySettings();
    if (error) throw LinuxCallError("ETHTOOL_GLINKSETTINGS", ifname_, error);
    // The kernel answers a negative word count: the size it wants to be asked with.
    const int words = -request->link_mode_masks_nwords;
    if (request->cmd != ETHTOOL_GLINKSETTINGS || words <= 0) {
        throw LinuxCallError("ETHTOOL_GLINKSETTINGS", ifname_, EPROTO);
    }
    std::memset(buffer.bytes.data(), 0, buffer.bytes.size() * sizeof(std::uint64_t));
    request->cmd = ETHTOOL_GLINKSETTINGS;
    request->link_mode_masks_nwords = static_cast<std::int8_t>(words);
    exchange(request, buffer.size, "ETHTOOL_GLINKSETTINGS");
    if (request->link_mode_masks_nwords != words) throw LinuxCallError("ETHTOOL_GLINKSETTINGS", ifname_, EPROTO);

    LinkSettings settings;
    settings.speed = request->speed;
    settings.duplex = request->duplex;
    settings.port = request->port;
    settings.phyAddress = request->phy_address;
    settings.transceiver = request->transceiver;
    settings.autoneg = request->autoneg;
    const std::uint32_t* masks = request->link_mode_masks;
    settings.supported = maskFromWords(masks, words);
    settings.advertising = maskFromWords(masks + words, words);
    settings.partner = maskFromWords(masks + 2 * words, words);
    settings.source = LinkSettingsSource::LinkSettingsIoctl;
    return settings;
}

LinkSettings EthtoolReader::legacySettings() const
{
    // The 32 legacy mask bits are the first 32 link-mode bits.
    auto answer = simple<ethtool_cmd>(ETHTOOL_GSET, "ETHTOOL_GSET");
    LinkSettings settings;
    settings.speed = ethtool_cmd_speed(&answer);
    settings.duplex = answer.duplex;
    settings.port = answer.port;
    settings.phyAddress = answer.phy_address;
    settings.transceiver = answer.transceiver;
    settings.autoneg = answer.autoneg;
    settings.supported = maskFromWords(&answer.supported, 1);
    settings.advertising = maskFromWords(&answer.advertising, 1);
    settings.partner = maskFromWords(&answer.lp_advertising, 1);
    settings.source = LinkSettingsSource::LegacyIoctl;
    return settings;
}

ethtool_drvinfo EthtoolReader::driverInfo() const
{
    return simple<ethtool_drvinfo>(ETHTOOL_GDRVINFO, "ETHTOOL_GDRVINFO");
}

std::optional<ethtool_wolinfo> EthtoolReader::wakeOnLan() const
{
    ethtool_wolinfo answer{};
    if (fromNetlink(ETHTOOL_MSG_WOL_GET, "ETHTOOL_MSG_WOL_GET", parseWakeOnLan, answer)) return answer;
    return simpleIfSupported<ethtool_wolinfo>(ETHTOOL_GWOL, "ETHTOOL_GWOL");
}

ethtool_coalesce EthtoolReader::coalesce() const
{
    return preferNetlink<ethtool_coalesce>(ETHTOOL_MSG_COALESCE_GET, "ETHTOOL_MSG_COALESCE_GET", parseCoalesce, ETHTOOL_GCOALESCE,
                              "ETHTOOL_GCOALESCE");
}

ethtool_pauseparam EthtoolReader::pause() const
{
    return preferNetlink<ethtool_pauseparam>(ETHTOOL_MSG_PAUSE_GET, "ETHTOOL_MSG_PAUSE_GET", parsePause, ETHTOOL_GPAUSEPARAM,
                              "ETHTOOL_GPAUSEPARAM");
}

ethtool_ringparam EthtoolReader::rings() const
{
    return preferNetlink<ethtool_ringparam>(ETHTOOL_MSG_RINGS_GET, "ETHTOOL_MSG_RINGS_GET", parseRings, ETHTOOL_GRINGPARAM,
                              "ETHTOOL_GRINGPARAM");
}

std::optional<std::uint32_t> EthtoolReader::messageLevel() const
{
    auto answer = simpleIfSupported<ethtool_value>(ETHTOOL_GMSGLVL, "ETHTOOL_GMSGLVL");
    if (!answer) return std::nullopt;
    return answer->data;
}

bool EthtoolReader::linkDetected() const
{
    return value(ETHTOOL_GLINK, "ETHTOOL_GLINK") != 0;
}

std::uint32_t EthtoolReader::value(std::uint32_t command, const char* name) const
{
    return simple<ethtool_value>(command, name).data;
}

std::vector<std::uint8_t> EthtoolReader::permanentAddress() const
{
    constexpr std::uint32_t kMaxAddress = 32;
    CommandBuffer buffer(sizeof(ethtool_perm_addr) + kMaxAddress);
    auto* request = buffer.as<ethtool_perm_addr>();
    request->cmd = ETHTOOL_GPERMADDR;
    request->size = kMaxAddress;
    exchange(request, buffer.size, "ETHTOOL_GPERMADDR");
    std::vector<std::uint8_t> address(request->data, request->data + std::min(request->size, kMaxAddress));
    bool allZero = std::all_of(address.begin(), address.end(), [](std::uint8_t b) { return b == 0; });
    if (allZero) address.clear();
    return address;
}

std::uint32_t EthtoolReader::stringSetCount(std::uint32_t set) const
{
    CommandBuffer buffer(sizeof(ethtool_sset_info) + sizeof(std::uint32_t));
    auto* request = buffer.as<ethtool_sset_info>();
    request->cmd = ETHTOOL_GSSET_INFO;
    request->sset_mask = 1ull << set;
    int error = channel_.exchange(ifname_, request, buffer.size);
    if (error == EOPNOTSUPP && set == ETH_SS_STATS) return driverInfo().n_stats;  // kernels before string-set queries
    if (error) throw LinuxCallError("ETHTOOL_GSSET_INFO", ifname_, error);
    return (request->sset_mask & (1ull << set)) ? request->data[0] : 0;
}

std::vector<std::string> EthtoolReader::stringSetNames(std::uint32_t set, std::uint32_t count) const
{
    CommandBuffer buffer(sizeof(ethtool_gstrings) + std::size_t{count} * ETH_GSTRING_LEN);
    auto* request = buffer.as<ethtool_gstrings>();
    request->cmd = ETHTOOL_GSTRINGS;
    request->string_set = set;
    request->len = count;
    exchange(request, buffer.size, "ETHTOOL_GSTRINGS");
    std::vector<std::string> names;
    for (std::uint32_t i = 0; i < std::min(request->len, count); ++i) {
        const char* text = reinterpret_cast<const char*>(request->data) + std::size_t{i} * ETH_GSTRING_LEN;
        names.emplace_back(text, strnlen(text, ETH_GSTRING_LEN));
    }
    return names;
}

std::vector<std::string> EthtoolReader::activeFeatures() const
{
    const std::uint32_t count = stringSetCount(ETH_SS_FEATURES);
    if (count == 0) return {};
    auto names = stringSetNames(ETH_SS_FEATURES, count);
    const std::uint32_t blocks = (count + 31) / 32;
    CommandBuffer buffer(sizeof(ethtool_gfeatures) + std::size_t{blocks} * sizeof(ethtool_get_features_block));
    auto* request = buffer.as<ethtool_gfeatures>();
    request->cmd = ETHTOOL_GFEATURES;
    request->size = blocks;
    exchange(request, buffer.size, "ETHTOOL_GFEATURES");
    std::vector<std::string> active;
    for (std::uint32_t bit = 0; bit < std::min<std::size_t>(names.size(), std::size_t{request->size} * 32); ++bit) {
        if (request->features[bit / 32].active & (1u << (bit % 32))) active.push_back(names[bit]);
    }
    return active;
}

std::vector<std::uint64_t> EthtoolReader::statisticValues(std::uint32_t count) const
{
    CommandBuffer buffer(sizeof(ethtool_stats) + std::size_t{count} * sizeof(std::uint64_t));
    auto* request = buffer.as<ethtool_stats>();
    request->cmd = ETHTOOL_GSTATS;
    request->n_stats = count;
    exchange(request, buffer.size, "ETHTOOL_GSTATS");
    return std::vector<std::uint64_t>(request->data, request->data + std::min(request->n_stats, count));
}

std::vector<DriverStatistic> EthtoolReader::driverStatistics() const
{
    const std::uint32_t count = stringSetCount(ETH_SS_STATS);
    if (count == 0) return {};
    auto names = stringSetNames(ETH_SS_STATS, count);
    auto values = statisticValues(count);
    std::vector<DriverStatistic> statistics;
    for (std::size_t i = 0; i < std::min(names.size(), values.size()); ++i) {
        statistics.push_back({names[i], values[i]});
    }
    return statistics;
}

}  // namespace orv::linuxhost
