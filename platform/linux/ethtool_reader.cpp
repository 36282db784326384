#include "ethtool_reader.hpp"

#include "linux_call_error.hpp"

#include <algorithm>
#include <cerrno>
#include <cstring>
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

// A buffer for commands that end in a variable array, zeroed, 8-byte aligned.
struct CommandBuffer {
    explicit CommandBuffer(std::size_t length) : bytes((length + 7) / 8, 0), size(length) {}
    template <typename T>
    T* as() { return reinterpret_cast<T*>(bytes.data()); }
    std::vector<std::uint64_t> bytes;
    std::size_t size;
};

}  // namespace

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

EthtoolReader::EthtoolReader(EthtoolChannel& channel, std::string ifname)
    : channel_(channel), ifname_(std::move(ifname))
{
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

LinkSettings EthtoolReader::linkSettings() const
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

ethtool_wolinfo EthtoolReader::wakeOnLan() const
{
    return simple<ethtool_wolinfo>(ETHTOOL_GWOL, "ETHTOOL_GWOL");
}

ethtool_coalesce EthtoolReader::coalesce() const
{
    return simple<ethtool_coalesce>(ETHTOOL_GCOALESCE, "ETHTOOL_GCOALESCE");
}

ethtool_pauseparam EthtoolReader::pause() const
{
    return simple<ethtool_pauseparam>(ETHTOOL_GPAUSEPARAM, "ETHTOOL_GPAUSEPARAM");
}

ethtool_ringparam EthtoolReader::rings() const
{
    return simple<ethtool_ringparam>(ETHTOOL_GRINGPARAM, "ETHTOOL_GRINGPARAM");
}

std::uint32_t EthtoolReader::messageLevel() const
{
    return value(ETHTOOL_GMSGLVL, "ETHTOOL_GMSGLVL");
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

std::uint32_t EthtoolReader::statisticsCount() const
{
    CommandBuffer buffer(sizeof(ethtool_sset_info) + sizeof(std::uint32_t));
    auto* request = buffer.as<ethtool_sset_info>();
    request->cmd = ETHTOOL_GSSET_INFO;
    request->sset_mask = 1ull << ETH_SS_STATS;
    int error = channel_.exchange(ifname_, request, buffer.size);
    if (error == EOPNOTSUPP) return driverInfo().n_stats;  // kernels before string-set queries
    if (error) throw LinuxCallError("ETHTOOL_GSSET_INFO", ifname_, error);
    return (request->sset_mask & (1ull << ETH_SS_STATS)) ? request->data[0] : 0;
}

std::vector<std::string> EthtoolReader::statisticNames(std::uint32_t count) const
{
    CommandBuffer buffer(sizeof(ethtool_gstrings) + std::size_t{count} * ETH_GSTRING_LEN);
    auto* request = buffer.as<ethtool_gstrings>();
    request->cmd = ETHTOOL_GSTRINGS;
    request->string_set = ETH_SS_STATS;
    request->len = count;
    exchange(request, buffer.size, "ETHTOOL_GSTRINGS");
    std::vector<std::string> names;
    for (std::uint32_t i = 0; i < std::min(request->len, count); ++i) {
        const char* text = reinterpret_cast<const char*>(request->data) + std::size_t{i} * ETH_GSTRING_LEN;
        names.emplace_back(text, strnlen(text, ETH_GSTRING_LEN));
    }
    return names;
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
    const std::uint32_t count = statisticsCount();
    if (count == 0) return {};
    auto names = statisticNames(count);
    auto values = statisticValues(count);
    std::vector<DriverStatistic> statistics;
    for (std::size_t i = 0; i < std::min(names.size(), values.size()); ++i) {
        statistics.push_back({names[i], values[i]});
    }
    return statistics;
}

}  // namespace orv::linuxhost
