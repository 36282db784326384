// Ethtool netlink: reply parsers on this machine's captured answers and on
// hand-built ones (bit-list and compact bitsets), and the fall back to the
// ioctls per call when the kernel has no ethtool family or message type.
#include "ethtool_messages.hpp"
#include "ethtool_reader.hpp"
#include "linux_call_error.hpp"
#include "netlink_bitset.hpp"
#include "pnic_records.hpp"
#include "support/ethtool_replay.hpp"
#include "support/genl_reply.hpp"
#include "support/netlink_replay.hpp"
#include "support/test_data.hpp"

#include <cerrno>
#include <cstring>
#include <functional>
#include <gtest/gtest.h>
#include <linux/ethtool_netlink.h>

using namespace orv::linuxhost;
using orv::linuxtest::GenlReply;
using orv::linuxtest::NetlinkReplayChannel;
using orv::linuxtest::RefusingNetlinkChannel;
using orv::linuxtest::ReplayChannel;
using orv::linuxtest::errorOf;
namespace NN = NodeMgr::Network;

namespace {

std::string data(const std::string& name)
{
    return orv::linuxtest::testData(name);
}

void expectSameSettings(const LinkSettings& a, const LinkSettings& b)
{
    EXPECT_EQ(a.speed, b.speed);
    EXPECT_EQ(a.duplex, b.duplex);
    EXPECT_EQ(a.port, b.port);
    EXPECT_EQ(a.phyAddress, b.phyAddress);
    EXPECT_EQ(a.transceiver, b.transceiver);
    EXPECT_EQ(a.autoneg, b.autoneg);
    EXPECT_TRUE(a.supported.sameBits(b.supported));
    EXPECT_TRUE(a.advertising.sameBits(b.advertising));
    EXPECT_TRUE(a.partner.sameBits(b.partner));
}

// A 1 Gb/s copper link: 10/100/1000 full supported, 1000 full advertised, the
// partner advertising 100 and 1000 full.
constexpr unsigned kBit100Full = ETHTOOL_LINK_MODE_100baseT_Full_BIT;
constexpr unsigned kBit1000Full = ETHTOOL_LINK_MODE_1000baseT_Full_BIT;
constexpr unsigned kBit10Full = ETHTOOL_LINK_MODE_10baseT_Full_BIT;
constexpr unsigned kBitAutoneg = ETHTOOL_LINK_MODE_Autoneg_BIT;
constexpr unsigned kBitTP = ETHTOOL_LINK_MODE_TP_BIT;

GenlReply copperLinkModes()
{
    GenlReply reply(ETHTOOL_MSG_LINKMODES_GET_REPLY);
    reply.u8(ETHTOOL_A_LINKMODES_AUTONEG, AUTONEG_ENABLE)
        .u32(ETHTOOL_A_LINKMODES_SPEED, SPEED_1000)
        .u8(ETHTOOL_A_LINKMODES_DUPLEX, DUPLEX_FULL);
    return reply;
}

NetlinkMessage copperLinkModesAsBitList()
{
    return copperLinkModes()
        .bitList(ETHTOOL_A_LINKMODES_OURS, 121,
                 {{kBit10Full, "10baseT/Full", false},
                  {kBit100Full, "100baseT/Full", false},
                  {kBit1000Full, "1000baseT/Full", true},
                  {kBitAutoneg, "Autoneg", true},
                  {kBitTP, "TP", true}},
                 true)
        .bitList(ETHTOOL_A_LINKMODES_PEER, 121,
                 {{kBit100Full, "100baseT/Full", true}, {kBit1000Full, "1000baseT/Full", true}}, false)
        .message();
}

NetlinkMessage copperLinkModesCompact()
{
    const std::uint32_t supported = 1u << kBit10Full | 1u << kBit100Full | 1u << kBit1000Full | 1u << kBitAutoneg |
                                    1u << kBitTP;
    const std::uint32_t advertised = 1u << kBit1000Full | 1u << kBitAutoneg | 1u << kBitTP;
    const std::uint32_t partner = 1u << kBit100Full | 1u << kBit1000Full;
    return copperLinkModes()
        .compact(ETHTOOL_A_LINKMODES_OURS, 121, {advertised, 0, 0, 0}, {supported, 0, 0, 0}, true)
        .compact(ETHTOOL_A_LINKMODES_PEER, 121, {partner, 0, 0, 0}, {}, false)
        .message();
}

}  // namespace

TEST(VirtioNetlinkCapture, LinkSettingsFromLinkInfoAndLinkModesAgreeWithTheIoctlCapture)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    NetlinkReplayChannel netlink(data("ethtool_netlink/virtio_net"));
    auto settings = EthtoolReader(ioctl, "eth0", &netlink).linkSettings();
    EXPECT_EQ(settings.source, LinkSettingsSource::Netlink);
    EXPECT_EQ(netlink.queries(ETHTOOL_MSG_LINKINFO_GET), 1u);
    EXPECT_EQ(netlink.queries(ETHTOOL_MSG_LINKMODES_GET), 1u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GLINKSETTINGS), 0u);
    EXPECT_EQ(settings.supported.words.size(), 4u);  // 121 link-mode bits
    EXPECT_EQ(settings.speed, static_cast<std::uint32_t>(SPEED_UNKNOWN));
    EXPECT_EQ(settings.port, PORT_OTHER);
    ReplayChannel ioctlOnly(data("ethtool/virtio_net"));
    expectSameSettings(settings, EthtoolReader(ioctlOnly, "eth0").linkSettings());
}

TEST(VirtioNetlinkCapture, RingsAndCoalescingAgreeWithTheIoctlCapture)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    NetlinkReplayChannel netlink(data("ethtool_netlink/virtio_net"));
    EthtoolReader reader(ioctl, "eth0", &netlink);
    auto rings = reader.rings();
    auto coalesce = reader.coalesce();
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GRINGPARAM), 0u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GCOALESCE), 0u);
    EXPECT_EQ(rings.rx_max_pending, 256u);
    EXPECT_EQ(rings.tx_pending, 256u);
    EXPECT_EQ(coalesce.rx_max_coalesced_frames, 1u);
    ReplayChannel ioctlOnly(data("ethtool/virtio_net"));
    EthtoolReader plain(ioctlOnly, "eth0");
    auto ioctlRings = plain.rings();
    auto ioctlCoalesce = plain.coalesce();
    EXPECT_EQ(std::memcmp(&rings, &ioctlRings, sizeof rings), 0);
    EXPECT_EQ(std::memcmp(&coalesce, &ioctlCoalesce, sizeof coalesce), 0);
}

TEST(VirtioNetlinkCapture, MessageTheDriverRefusesFallsBackToTheIoctlForThatCallOnly)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    NetlinkReplayChannel netlink(data("ethtool_netlink/virtio_net"));
    EthtoolReader reader(ioctl, "eth0", &netlink);
    // virtio answers pause and wake-on-LAN with EOPNOTSUPP on both paths.
    EXPECT_EQ(errorOf([&] { reader.pause(); }), EOPNOTSUPP);
    EXPECT_FALSE(reader.wakeOnLan());
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GPAUSEPARAM), 1u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GWOL), 1u);
    EXPECT_EQ(reader.linkSettings().source, LinkSettingsSource::Netlink);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GLINKSETTINGS), 0u);
}

TEST(EthtoolNetlinkFallback, FamilyMissingSendsEveryQueryToTheIoctls)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    RefusingNetlinkChannel netlink(ENOENT);
    EthtoolReader reader(ioctl, "eth0", &netlink);
    auto settings = reader.linkSettings();
    EXPECT_EQ(settings.source, LinkSettingsSource::LinkSettingsIoctl);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GLINKSETTINGS), 2u);
    EXPECT_EQ(reader.rings().rx_max_pending, 256u);
    EXPECT_EQ(reader.coalesce().rx_max_coalesced_frames, 1u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GRINGPARAM), 1u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GCOALESCE), 1u);
    EXPECT_EQ(netlink.queries(), 3u);  // link info, rings, coalescing: each tried once
}

TEST(EthtoolNetlinkFallback, UnknownMessageTypeFallsBackToTheLegacyChain)
{
    ReplayChannel ioctl(data("ethtool/composed_legacy_gset"));
    RefusingNetlinkChannel netlink(EINVAL);
    auto settings = EthtoolReader(ioctl, "eth0", &netlink).linkSettings();
    EXPECT_EQ(settings.source, LinkSettingsSource::LegacyIoctl);
}

TEST(EthtoolNetlinkFallback, MissingLinkModesMessageFallsBackForTheWholeSettings)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    // Only LINKINFO answers: a kernel without LINKMODES takes the ioctl for both halves.
    NetlinkReplayChannel partial(data("ethtool_netlink/linkinfo_only"));
    auto settings = EthtoolReader(ioctl, "eth0", &partial).linkSettings();
    EXPECT_EQ(settings.source, LinkSettingsSource::LinkSettingsIoctl);
    EXPECT_EQ(partial.queries(ETHTOOL_MSG_LINKMODES_GET), 1u);
}

TEST(EthtoolNetlinkFallback, VanishedDeviceFailsWithoutAskingTheIoctl)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    RefusingNetlinkChannel netlink(ENODEV);
    EthtoolReader reader(ioctl, "eth0", &netlink);
    EXPECT_EQ(errorOf([&] { reader.linkSettings(); }), ENODEV);
    EXPECT_EQ(errorOf([&] { reader.rings(); }), ENODEV);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GLINKSETTINGS), 0u);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GRINGPARAM), 0u);
}

TEST(EthtoolNetlinkBitset, BitListWithMaskGivesSupportedAdvertisedAndPartner)
{
    LinkSettings settings;
    ASSERT_TRUE(parseLinkModes(copperLinkModesAsBitList(), settings));
    EXPECT_EQ(settings.autoneg, AUTONEG_ENABLE);
    EXPECT_EQ(settings.speed, static_cast<std::uint32_t>(SPEED_1000));
    EXPECT_EQ(settings.duplex, DUPLEX_FULL);
    for (unsigned bit : {kBit10Full, kBit100Full, kBit1000Full, kBitAutoneg, kBitTP}) {
        EXPECT_TRUE(settings.supported.test(bit)) << bit;
    }
    EXPECT_FALSE(settings.advertising.test(kBit10Full));
    EXPECT_FALSE(settings.advertising.test(kBit100Full));
    EXPECT_TRUE(settings.advertising.test(kBit1000Full));
    EXPECT_TRUE(settings.partner.test(kBit100Full));
    EXPECT_FALSE(settings.partner.test(kBit10Full));
    NN::PnicInfo info;
    fillLinkPart(info, settings, true);
    EXPECT_EQ(info.supportedLinkModes, (std::vector<NN::LinkMode>{{NN::CONNECTION_10, NN::DUPLEX_MODE_FULL},
                                                                  {NN::CONNECTION_100, NN::DUPLEX_MODE_FULL},
                                                                  {NN::CONNECTION_1000, NN::DUPLEX_MODE_FULL}}));
    EXPECT_EQ(info.advertisedLinkModes, (std::vector<NN::LinkMode>{{NN::CONNECTION_1000, NN::DUPLEX_MODE_FULL}}));
    EXPECT_EQ(info.speed, NN::CONNECTION_1000);
    EXPECT_TRUE(info.autoNegotiation);
    EXPECT_EQ(info.supportedPorts, (std::vector<NN::PnicPortMode>{NN::PNICPORT_MODE_TP}));
}

TEST(EthtoolNetlinkBitset, CompactAndBitListFormsReadTheSame)
{
    LinkSettings fromList, fromCompact;
    ASSERT_TRUE(parseLinkModes(copperLinkModesAsBitList(), fromList));
    ASSERT_TRUE(parseLinkModes(copperLinkModesCompact(), fromCompact));
    expectSameSettings(fromList, fromCompact);
}

TEST(EthtoolNetlinkBitset, BitIndexBeyondAnyMaskIsMalformed)
{
    auto message = copperLinkModes()
                       .bitList(ETHTOOL_A_LINKMODES_OURS, 121, {{127 * 32, "beyond", true}}, true)
                       .message();
    LinkSettings settings;
    EXPECT_FALSE(parseLinkModes(message, settings));
}

TEST(EthtoolNetlinkBitset, CompactWithoutItsMaskIsMalformed)
{
    LinkSettings settings;
    // Value only and no NOMASK flag: the mask the bitset claims is missing.
    auto noMask = copperLinkModes().compact(ETHTOOL_A_LINKMODES_OURS, 32, {1}, {}, true).message();
    EXPECT_FALSE(parseLinkModes(noMask, settings));
    auto flagged = copperLinkModes().compact(ETHTOOL_A_LINKMODES_PEER, 32, {1}, {}, false).message();
    ASSERT_TRUE(parseLinkModes(flagged, settings));
    EXPECT_TRUE(settings.partner.test(0));
}

TEST(EthtoolNetlinkMessages, WakeOnLanModesBitListAndSecureOnPassword)
{
    const std::uint8_t password[6] = {1, 2, 3, 4, 5, 6};
    auto message = GenlReply(ETHTOOL_MSG_WOL_GET_REPLY)
                       .bitList(ETHTOOL_A_WOL_MODES, 8,
                                {{1, "ucast", false}, {5, "magic", true}, {6, "magicsecure", true}}, true)
                       .binary(ETHTOOL_A_WOL_SOPASS, password, sizeof password)
                       .message();
    ethtool_wolinfo wol{};
    ASSERT_TRUE(parseWakeOnLan(message, wol));
    EXPECT_EQ(wol.supported, WAKE_UCAST | WAKE_MAGIC | WAKE_MAGICSECURE);
    EXPECT_EQ(wol.wolopts, WAKE_MAGIC | WAKE_MAGICSECURE);
    EXPECT_EQ(std::memcmp(wol.sopass, password, sizeof password), 0);
}

TEST(EthtoolNetlinkMessages, PauseFlagsIntoThePauseStructure)
{
    auto message = GenlReply(ETHTOOL_MSG_PAUSE_GET_REPLY)
                       .u8(ETHTOOL_A_PAUSE_AUTONEG, 1)
                       .u8(ETHTOOL_A_PAUSE_RX, 1)
                       .u8(ETHTOOL_A_PAUSE_TX, 0)
                       .message();
    ethtool_pauseparam pause{};
    ASSERT_TRUE(parsePause(message, pause));
    EXPECT_EQ(pause.cmd, static_cast<std::uint32_t>(ETHTOOL_GPAUSEPARAM));
    EXPECT_EQ(pause.autoneg, 1u);
    EXPECT_EQ(pause.rx_pause, 1u);
    EXPECT_EQ(pause.tx_pause, 0u);
}

TEST(EthtoolNetlinkMessages, ReplyOfAnotherKindIsRefused)
{
    NetlinkReplayChannel netlink(data("ethtool_netlink/virtio_net"));
    NetlinkMessage linkInfo;
    ASSERT_EQ(netlink.query(ETHTOOL_MSG_LINKINFO_GET, "eth0", linkInfo), 0);
    LinkSettings settings;
    EXPECT_TRUE(parseLinkInfo(linkInfo, settings));
    EXPECT_FALSE(parseLinkModes(linkInfo, settings));
    ethtool_ringparam rings{};
    EXPECT_FALSE(parseRings(linkInfo, rings));
}

TEST(EthtoolNetlinkMessages, TruncatedOrMisSizedReplyIsRefused)
{
    NetlinkReplayChannel netlink(data("ethtool_netlink/virtio_net"));
    NetlinkMessage linkInfo;
    ASSERT_EQ(netlink.query(ETHTOOL_MSG_LINKINFO_GET, "eth0", linkInfo), 0);
    LinkSettings settings;
    NetlinkMessage truncated(linkInfo.begin(), linkInfo.begin() + 18);
    EXPECT_FALSE(parseLinkInfo(truncated, settings));
    auto wrongSize = GenlReply(ETHTOOL_MSG_LINKINFO_GET_REPLY).u32(ETHTOOL_A_LINKINFO_PORT, PORT_TP).message();
    EXPECT_FALSE(parseLinkInfo(wrongSize, settings));
}

TEST(EthtoolNetlinkMessages, MalformedReplyFailsTheCallWithEproto)
{
    ReplayChannel ioctl(data("ethtool/virtio_net"));
    NetlinkReplayChannel netlink(data("ethtool_netlink/malformed_rings"));
    EXPECT_EQ(errorOf([&] { EthtoolReader(ioctl, "eth0", &netlink).rings(); }), EPROTO);
    EXPECT_EQ(ioctl.exchanges(ETHTOOL_GRINGPARAM), 0u);
}
