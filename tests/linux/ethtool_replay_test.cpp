// The ethtool readers and the NIC record mappings on replayed kernel answers.
#include "ethtool_reader.hpp"
#include "rtnetlink_links.hpp"
#include "linux_call_error.hpp"
#include "linux_pnic.hpp"
#include "pnic_records.hpp"
#include "support/ethtool_replay.hpp"
#include "support/test_data.hpp"

#include <cerrno>
#include <fstream>
#include <gtest/gtest.h>
#include <map>

using namespace orv::linuxhost;
using orv::linuxtest::ReplayChannel;
using orv::linuxtest::errorOf;
namespace NN = NodeMgr::Network;

namespace {

std::string fixture(const std::string& name)
{
    return orv::linuxtest::testData("ethtool/" + name);
}

NetlinkMessage readHexFile(const std::string& path)
{
    std::ifstream in(path);
    NetlinkMessage bytes;
    for (std::string word; in >> word;) bytes.push_back(static_cast<std::uint8_t>(std::stoul(word, nullptr, 16)));
    return bytes;
}

}  // namespace

TEST(VirtioCapture, LinkSettingsTakeTheWordCountHandshake)
{
    ReplayChannel channel(fixture("virtio_net"));
    EthtoolReader reader(channel, "eth0");
    auto settings = reader.linkSettings();
    EXPECT_EQ(channel.exchanges(ETHTOOL_GLINKSETTINGS), 2u);
    EXPECT_EQ(settings.source, LinkSettingsSource::LinkSettingsIoctl);
    EXPECT_EQ(settings.supported.words.size(), 4u);  // the kernel asked for 4 words
    EXPECT_EQ(settings.speed, static_cast<std::uint32_t>(SPEED_UNKNOWN));
    EXPECT_EQ(settings.duplex, DUPLEX_UNKNOWN);
    EXPECT_EQ(settings.port, PORT_OTHER);
    EXPECT_EQ(settings.autoneg, AUTONEG_DISABLE);
    NN::PnicInfo info;
    fillLinkPart(info, settings, true);
    EXPECT_TRUE(info.supportedLinkModes.empty());
    EXPECT_TRUE(info.supportedPorts.empty());
    EXPECT_EQ(info.speed, NN::CONNECTION_AUTO);
    EXPECT_EQ(info.duplex, NN::DUPLEX_MODE_AUTO);
    EXPECT_EQ(info.port, NN::PNICPORT_MODE_UNKNOWN);
    EXPECT_EQ(info.transceiver, NN::TRANSCEIVER_MODE_INTERNAL);
    EXPECT_FALSE(info.autoNegotiation);
}

TEST(VirtioCapture, DriverInfoAsEthtoolReportedIt)
{
    ReplayChannel channel(fixture("virtio_net"));
    auto info = toDriverInfo(EthtoolReader(channel, "eth0").driverInfo());
    EXPECT_EQ(info.name, "virtio_net");
    EXPECT_EQ(info.version, "1.0.0");
    EXPECT_EQ(info.firmwareVersion, "");
    EXPECT_EQ(info.busInfo, "0000:00:03.0");
}

TEST(VirtioCapture, CoalesceRingsAndPermanentAddress)
{
    ReplayChannel channel(fixture("virtio_net"));
    EthtoolReader reader(channel, "eth0");
    auto coalesce = toCoalesceInfo(reader.coalesce());
    EXPECT_EQ(coalesce.rxUsecs, 0u);
    EXPECT_EQ(coalesce.rxFrames, 1u);
    EXPECT_EQ(coalesce.txFrames, 1u);
    EXPECT_FALSE(coalesce.adaptiveRX);
    NN::PnicRingInfo preset, current;
    toRingInfo(reader.rings(), preset, current);
    EXPECT_EQ(preset.rx, 256u);
    EXPECT_EQ(preset.tx, 256u);
    EXPECT_EQ(current.rx, 256u);
    EXPECT_EQ(current.rxJumbo, 0u);
    EXPECT_EQ(reader.permanentAddress(), (std::vector<std::uint8_t>{0x02, 0xfc, 0, 0, 0, 1}));
}

TEST(VirtioCapture, UnsupportedOperationsFailThatCallOnly)
{
    ReplayChannel channel(fixture("virtio_net"));
    EthtoolReader reader(channel, "eth0");
    EXPECT_FALSE(reader.wakeOnLan());  // not implemented: nothing, no failure
    EXPECT_EQ(errorOf([&] { reader.pause(); }), EOPNOTSUPP);
    EXPECT_FALSE(reader.messageLevel());
    EXPECT_NO_THROW(reader.rings());  // the refusals above leave other calls working
}

TEST(VirtioCapture, DriverStatisticsByName)
{
    ReplayChannel channel(fixture("virtio_net"));
    auto statistics = EthtoolReader(channel, "eth0").driverStatistics();
    ASSERT_FALSE(statistics.empty());
    std::map<std::string, std::uint64_t> byName;
    for (const auto& s : statistics) byName[s.name] = s.value;
    EXPECT_TRUE(byName.count("rx_drops"));
    EXPECT_TRUE(byName.count("tx_kicks"));
    EXPECT_EQ(byName.size(), statistics.size());
}

TEST(VirtioCapture, LinkStatisticsFromTheRtnetlinkAnswer)
{
    auto message = readHexFile(fixture("virtio_net/rtm_newlink.hex"));
    auto link = parseLinkRecord(message);
    ASSERT_TRUE(link);
    ASSERT_TRUE(link->statistics);
    const auto* statistics = &*link->statistics;
    std::ifstream expected(fixture("virtio_net/rtm_newlink.expected"));
    std::map<std::string, std::uint64_t> values;
    std::string key;
    std::uint64_t value = 0;
    while (expected >> key >> value) values[key] = value;
    EXPECT_EQ(statistics->rx_packets, values.at("rx_packets"));
    EXPECT_EQ(statistics->rx_bytes, values.at("rx_bytes"));
    EXPECT_EQ(statistics->tx_packets, values.at("tx_packets"));
    EXPECT_EQ(statistics->tx_bytes, values.at("tx_bytes"));
}

TEST(RtnetlinkAnswer, LinkDataOfTheVirtioNic)
{
    auto link = parseLinkRecord(readHexFile(fixture("virtio_net/rtm_newlink.hex")));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->name, "eth0");
    EXPECT_GT(link->index, 0);
    EXPECT_EQ(link->address.size(), 6u);
    EXPECT_GT(link->mtu, 0u);
}

TEST(RtnetlinkAnswer, TruncatedMessageGivesNothingAndOneWithoutCountersNoCounters)
{
    auto message = readHexFile(fixture("virtio_net/rtm_newlink.hex"));
    NetlinkMessage truncated(message.begin(), message.begin() + 20);
    EXPECT_FALSE(parseLinkRecord(truncated));
    NetlinkMessage header(message.begin(), message.begin() + 32);  // header and ifinfomsg only: no name
    reinterpret_cast<nlmsghdr*>(header.data())->nlmsg_len = 32;
    EXPECT_FALSE(parseLinkRecord(header));
}

TEST(CopperAdapter, LinkModesPortsAndAutoNegotiation)
{
    ReplayChannel channel(fixture("composed_copper_1g"));
    NN::PnicInfo info;
    fillLinkPart(info, EthtoolReader(channel, "eno1").linkSettings(), true);
    EXPECT_EQ(info.supportedPorts, std::vector<NN::PnicPortMode>{NN::PNICPORT_MODE_TP});
    EXPECT_EQ(info.supportedLinkModes,
              (std::vector<NN::LinkMode>{{NN::CONNECTION_10, NN::DUPLEX_MODE_FULL}, {NN::CONNECTION_10, NN::DUPLEX_MODE_HALF},
                                         {NN::CONNECTION_100, NN::DUPLEX_MODE_FULL}, {NN::CONNECTION_100, NN::DUPLEX_MODE_HALF},
                                         {NN::CONNECTION_1000, NN::DUPLEX_MODE_FULL}}));
    EXPECT_EQ(info.advertisedLinkModes, info.supportedLinkModes);
    EXPECT_TRUE(info.supportsAutoNegotiation);
    EXPECT_TRUE(info.advertisedAutoNegotiation);
    EXPECT_TRUE(info.autoNegotiation);
    EXPECT_EQ(info.speed, NN::CONNECTION_1000);
    EXPECT_EQ(info.duplex, NN::DUPLEX_MODE_FULL);
    EXPECT_EQ(info.PHYAD, 1u);
    EXPECT_EQ(info.linkStatus, "Up");
}

TEST(CopperAdapter, LinkDownReportsNoSpeed)
{
    ReplayChannel channel(fixture("composed_copper_1g"));
    NN::PnicInfo info;
    fillLinkPart(info, EthtoolReader(channel, "eno1").linkSettings(), false);
    EXPECT_EQ(info.speed, NN::CONNECTION_AUTO);
    EXPECT_EQ(info.duplex, NN::DUPLEX_MODE_AUTO);
    EXPECT_EQ(info.linkStatus, "Down");
}

TEST(CopperAdapter, WakeOnPauseMessageLevelAndStatistics)
{
    ReplayChannel channel(fixture("composed_copper_1g"));
    EthtoolReader reader(channel, "eno1");
    NN::PnicInfo info;
    fillWakeOnPart(info, reader.wakeOnLan());
    EXPECT_TRUE(info.wolSupported);
    EXPECT_EQ(info.supportsWakeOn, (std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_PHY, NN::WAKEON_MODE_UCAST,
                                                                NN::WAKEON_MODE_MCAST, NN::WAKEON_MODE_BCAST,
                                                                NN::WAKEON_MODE_MAGIC}));
    EXPECT_EQ(info.wakeOn, std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_MAGIC});
    EXPECT_EQ(reader.messageLevel(), std::optional<std::uint32_t>(7u));
    auto settings = reader.linkSettings();
    auto pause = toPauseInfo(reader.pause(), &settings);
    EXPECT_TRUE(pause.supported);
    EXPECT_TRUE(pause.autoNegotiate);
    EXPECT_TRUE(pause.rxStatus);
    EXPECT_TRUE(pause.txStatus);
    EXPECT_EQ(pause.rxAutoNegRes, NN::AUTO_NEG_ON);
    auto stats = toStats(rtnl_link_stats64{}, reader.driverStatistics());
    EXPECT_EQ(stats.broadcastPktsRx, 11u);
    EXPECT_EQ(stats.broadcastPktsTx, 22u);
    EXPECT_EQ(stats.multicastPktsTx, 33u);
    EXPECT_EQ(stats.dot3StatsAlignmentErrors, 44u);
    EXPECT_EQ(reader.permanentAddress(), (std::vector<std::uint8_t>{0x00, 0x1b, 0x21, 0xaa, 0xbb, 0xcc}));
    auto driver = toDriverInfo(reader.driverInfo());
    EXPECT_EQ(driver.name, "e1000e");
    EXPECT_EQ(driver.firmwareVersion, "0.13-4");
}

TEST(LegacyDriver, FallsBackToGsetWhenLinkSettingsAreUnsupported)
{
    ReplayChannel channel(fixture("composed_legacy_gset"));
    EthtoolReader reader(channel, "eth9");
    auto settings = reader.linkSettings();
    EXPECT_EQ(settings.source, LinkSettingsSource::LegacyIoctl);
    EXPECT_EQ(channel.exchanges(ETHTOOL_GSET), 1u);
    NN::PnicInfo info;
    fillLinkPart(info, settings, true);
    EXPECT_EQ(info.speed, NN::CONNECTION_100);
    EXPECT_EQ(info.duplex, NN::DUPLEX_MODE_FULL);
    EXPECT_EQ(info.port, NN::PNICPORT_MODE_MII);
    EXPECT_EQ(info.transceiver, NN::TRANSCEIVER_MODE_EXTERNAL);
    EXPECT_EQ(info.supportedPorts, std::vector<NN::PnicPortMode>{NN::PNICPORT_MODE_MII});
    EXPECT_EQ(info.supportedLinkModes, (std::vector<NN::LinkMode>{{NN::CONNECTION_100, NN::DUPLEX_MODE_FULL},
                                                                  {NN::CONNECTION_100, NN::DUPLEX_MODE_HALF}}));
    EXPECT_EQ(info.advertisedLinkModes, (std::vector<NN::LinkMode>{{NN::CONNECTION_100, NN::DUPLEX_MODE_FULL}}));
}

TEST(LegacyDriver, StatisticsCountFromDriverInfoWhenStringSetsAreUnsupported)
{
    ReplayChannel channel(fixture("composed_legacy_gset"));
    EthtoolReader reader(channel, "eth9");
    EXPECT_TRUE(reader.driverStatistics().empty());  // n_stats 0 in the driver info
    EXPECT_EQ(channel.exchanges(ETHTOOL_GDRVINFO), 1u);
    EXPECT_EQ(errorOf([&] { reader.coalesce(); }), EOPNOTSUPP);
}

TEST(CopperAdapter, APortAsksWakeOnLanOnce)
{
    auto channel = std::make_shared<ReplayChannel>(fixture("composed_copper_1g"));
    LinuxPnic pnic("eth0", NicKernel{channel});
    EXPECT_TRUE(pnic.GetWakeOnLANSupported());
    EXPECT_TRUE(pnic.GetWakeOnLANEnabled());  // magic packet
    EXPECT_EQ(channel->exchanges(ETHTOOL_GWOL), 1u);
}
