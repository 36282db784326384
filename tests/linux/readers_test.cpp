// Parsers and mappings of the Linux substitute on captured or written-out kernel answers.
#include "cpu_state.hpp"
#include "cpu_topology.hpp"
#include "cpuid_reader.hpp"
#include "interface_addresses.hpp"
#include "ksi_records.hpp"
#include "link_modes.hpp"
#include "linux_backend.hpp"
#include "os_version.hpp"
#include "pci_address.hpp"
#include "pnic_records.hpp"
#include "rtnetlink_links.hpp"
#include "text_files.hpp"

#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <net/if.h>
#include <netinet/in.h>

using namespace orv::linuxhost;
namespace NN = NodeMgr::Network;

TEST(PciAddress, ParsesSysfsForm)
{
    auto address = parsePciAddress("0001:3b:1f.7");
    ASSERT_TRUE(address);
    EXPECT_EQ(address->segment, 1);
    EXPECT_EQ(address->bus, 0x3b);
    EXPECT_EQ(address->slot, 0x1f);
    EXPECT_EQ(address->function, 7);
}

TEST(PciAddress, RejectsOtherDeviceNames)
{
    EXPECT_FALSE(parsePciAddress("virtio2"));
    EXPECT_FALSE(parsePciAddress("0000:00:20.0"));  // slot above 0x1f
    EXPECT_FALSE(parsePciAddress("0000:00:03.8"));  // function above 7
    EXPECT_FALSE(parsePciAddress("0000:00:03.0x"));
    EXPECT_FALSE(parsePciAddress("pci0000:00"));
}

TEST(TextFiles, NumbersInDecimalAndHexadecimal)
{
    EXPECT_EQ(parseNumber("0x1af4\n"), 0x1af4u);
    EXPECT_EQ(parseNumber(" 1500 "), 1500u);
    EXPECT_FALSE(parseNumber("-1"));
    EXPECT_FALSE(parseNumber("12ab"));
    EXPECT_FALSE(parseNumber(""));
}

TEST(CpuList, RangesAndSingles)
{
    auto cpus = parseCpuList("0-3,5,8-9\n");
    ASSERT_TRUE(cpus);
    EXPECT_EQ(*cpus, (std::vector<unsigned>{0, 1, 2, 3, 5, 8, 9}));
    EXPECT_FALSE(parseCpuList("3-1"));
    EXPECT_FALSE(parseCpuList("a"));
}

TEST(CpuTopologyOrder, FirstThreadOfEveryCoreThenTheSiblings)
{
    CpuTopology topology;
    topology.onlineCpus = {0, 1, 2, 3, 4, 5, 6, 7};
    topology.packages = {CpuPackage{0, {CpuCore{{0, 4}}, CpuCore{{1, 5}}}}, CpuPackage{1, {CpuCore{{2, 6}}, CpuCore{{3, 7}}}}};
    EXPECT_EQ(topology.cpuOrder(), (std::vector<unsigned>{0, 1, 2, 3, 4, 5, 6, 7}));
    EXPECT_EQ(topology.coreCount(), 4u);
    // a package's first CPU sits at the sum of the core counts before it
    EXPECT_EQ(topology.cpuOrder()[2], topology.packages[1].cores[0].cpus.front());
}

TEST(ProcStat, PerCpuBusyAndIdleTicks)
{
    const char* text =
        "cpu  100 0 50 1000 10 0 0 0 0 0\n"
        "cpu0 60 1 30 500 5 2 3 4 0 0\n"
        "cpu1 40 0 20 500 5 0 0 0 0 0\n"
        "intr 12345\n";
    auto cpus = parseProcStat(text);
    ASSERT_EQ(cpus.size(), 2u);
    EXPECT_EQ(cpus[0].busy, 60u + 1 + 30 + 2 + 3 + 4);
    EXPECT_EQ(cpus[0].idle, 505u);
    EXPECT_EQ(cpus[1].busy, 60u);
}

TEST(CpuActivity, HaltedWhenIdleTicksPassedAndLoadRoundedUp)
{
    auto busy = activityBetween({100, 100}, {101, 200});
    EXPECT_TRUE(busy.halted);
    EXPECT_EQ(busy.activeLoad, 1u);  // 1 of 101 ticks busy is 0.99 %, rounded up
    auto idle = activityBetween({100, 100}, {100, 110});
    EXPECT_TRUE(idle.halted);
    EXPECT_EQ(idle.activeLoad, 0u);
    auto saturated = activityBetween({100, 100}, {120, 100});
    EXPECT_FALSE(saturated.halted);
    EXPECT_EQ(saturated.activeLoad, 100u);
}

TEST(SmtState, ControlFileMapping)
{
    EXPECT_EQ(htStateFrom("on", true), HtState::Enabled);
    EXPECT_EQ(htStateFrom("on", false), HtState::KernelDisabled);
    EXPECT_EQ(htStateFrom("off", false), HtState::KernelDisabled);
    EXPECT_EQ(htStateFrom("forceoff", false), HtState::FirmwareDisabled);
    EXPECT_EQ(htStateFrom("notsupported", false), HtState::NotPresent);
    EXPECT_EQ(htStateFrom("notimplemented", false), HtState::NotPresent);
    EXPECT_EQ(htStateFrom("", false), HtState::NotPresent);
}

TEST(PowerPolicy, GovernorMapping)
{
    EXPECT_EQ(policyForGovernor("").shortName, "off");
    EXPECT_EQ(policyForGovernor("performance").shortName, "static");
    EXPECT_EQ(policyForGovernor("powersave").shortName, "low");
    EXPECT_EQ(policyForGovernor("userspace").shortName, "custom");
    EXPECT_EQ(policyForGovernor("schedutil").shortName, "dynamic");
    EXPECT_EQ(policyForGovernor("ondemand").shortName, "dynamic");
    EXPECT_EQ(policyForGovernor("conservative").shortName, "dynamic");
    auto record = toPolicyRecord(policyForGovernor("performance"));
    EXPECT_STREQ(record.shortName, "static");
    EXPECT_EQ(record.id, 2u);
}

TEST(ModelName, FirstProcessorsModelName)
{
    EXPECT_EQ(parseModelName("processor\t: 0\nvendor_id\t: AuthenticAMD\nmodel name\t: AMD EPYC\nmodel name\t: other\n"),
              "AMD EPYC");
    EXPECT_EQ(parseModelName("processor\t: 0\n"), "");
    KSI_HardwareCharArray48 record;
    toModelName(std::string(60, 'x'), record);
    EXPECT_EQ(std::string(record, 48), std::string(48, 'x'));  // cut at 48, not terminated
}

TEST(CpuidSignature, FamilyModelSteppingDecoding)
{
    auto amd = decodeSignature(0x00a00f11);  // family 0xF + 0x0A = 25, model 1, stepping 1
    EXPECT_EQ(amd.family, 25u);
    EXPECT_EQ(amd.model, 1u);
    EXPECT_EQ(amd.stepping, 1u);
    auto intel = decodeSignature(0x000906ea);  // family 6, extended model 9 -> 0x9e, stepping 10
    EXPECT_EQ(intel.family, 6u);
    EXPECT_EQ(intel.model, 0x9eu);
    EXPECT_EQ(intel.stepping, 10u);
}

TEST(CpuidLeaves, LeavesAboveTheAnnouncedMaximumReadZero)
{
    CpuidLeaves leaves;
    leaves.leaves[0] = {1, 0x68747541, 0x444d4163, 0x69746e65};  // max basic leaf 1
    leaves.leaves[1] = {0x00a00f11, 1, 2, 3};
    leaves.leaves[2] = {0x80000001, 0, 0, 0};                     // max extended 0x80000001
    leaves.leaves[3] = {0, 0, 4, 5};
    leaves.leaves[4] = {7, 7, 7, 7};
    leaves.leaves[5] = {9, 9, 9, 9};
    auto clamped = clampToAnnounced(leaves);
    EXPECT_EQ(clamped.leaf(0x80000001).edx, 5u);
    EXPECT_EQ(clamped.leaf(0x80000008).eax, 0u);
    EXPECT_EQ(clamped.leaf(0x8000000A).ebx, 0u);
    EXPECT_EQ(clamped.leaf(1).eax, 0x00a00f11u);
}

TEST(PcpuRecord, PositionsAndLeavesOfOneCpu)
{
    CpuTopology topology;
    topology.onlineCpus = {0, 1, 2, 3};
    topology.packages = {CpuPackage{7, {CpuCore{{0, 2}}, CpuCore{{1, 3}}}}};
    CpuidLeaves leaves;
    leaves.leaves[1] = {0x00a00f11, 0x05000800, 0, 0};
    leaves.leaves[3] = {0, 0, 0x4, 0x20100000};
    auto record = toPcpuInfo(3, topology, leaves);
    EXPECT_EQ(record.family, 25);
    EXPECT_EQ(record.stepping, 1);
    EXPECT_EQ(record.packageId, 7u);
    EXPECT_EQ(record.coreId, 1u);
    EXPECT_EQ(record.threadId, 1u);
    EXPECT_EQ(record.apicId, 5u);
    EXPECT_EQ(record.cpuid.id81.edx, 0x20100000u);
    EXPECT_EQ(record.cpuid.id1.ebx, 0x05000800u);
}

TEST(OsRelease, QuotedValuesAndComments)
{
    auto fields = parseOsRelease("# comment\nNAME=\"Debian GNU/Linux\"\nVERSION_ID='12'\nID=debian\nPRETTY=\"a \\\"b\\\"\"\n");
    EXPECT_EQ(fields["NAME"], "Debian GNU/Linux");
    EXPECT_EQ(fields["VERSION_ID"], "12");
    EXPECT_EQ(fields["ID"], "debian");
    EXPECT_EQ(fields["PRETTY"], "a \"b\"");
}

TEST(OsRelease, VersionRecordMapping)
{
    auto version = describeSystem({{"NAME", "Debian GNU/Linux"}, {"VERSION_ID", "12"}},
                                  {"6.1.0-18-amd64", "#1 SMP PREEMPT_DYNAMIC Debian 6.1.76-1 (2024-02-01)"});
    EXPECT_EQ(version.product, "Debian GNU/Linux");
    EXPECT_EQ(version.productVersion, "12");
    EXPECT_EQ(version.buildVersion, "6.1.0-18-amd64");
    EXPECT_EQ(version.buildDate, "Feb 1 2024");
    EXPECT_EQ(version.build, 1u);
    TmkuserVersion_SystemVersionInfo record{};
    fillVersionRecord(version, record);
    EXPECT_STREQ(record.product, "Debian GNU/Linux");
    EXPECT_STREQ(record.buildVersion, "6.1.0-18-amd64");
    EXPECT_EQ(record.talmekBuild, 1u);
}

TEST(OsRelease, BuildDateFromClassicKernelVersionText)
{
    EXPECT_EQ(buildDateOf("#42 SMP Thu Jan  4 10:00:00 UTC 2024"), "Jan 4 2024");
    EXPECT_EQ(buildTimeOf("#42 SMP Thu Jan  4 10:00:00 UTC 2024"), "10:00:00");
    EXPECT_EQ(buildDateOf("#1 SMP PREEMPT_DYNAMIC @0"), "");
    auto version = describeSystem({}, {"6.18.44", "#42 SMP Thu Jan  4 10:00:00 UTC 2024"});
    EXPECT_EQ(version.product, "Linux");
    EXPECT_EQ(version.build, 42u);
}

TEST(HostType, FalseUnlessConfigured)
{
    EXPECT_FALSE(parseHostTypeSetting(nullptr));
    EXPECT_FALSE(parseHostTypeSetting(""));
    EXPECT_FALSE(parseHostTypeSetting("0"));
    EXPECT_TRUE(parseHostTypeSetting("1"));
    EXPECT_TRUE(parseHostTypeSetting("Yes"));
    EXPECT_TRUE(parseHostTypeSetting("TRUE"));
}

namespace {

// An ifaddrs list written out by hand, as getifaddrs would answer it.
struct FakeAddresses {
    std::vector<ifaddrs> entries;
    std::vector<sockaddr_in6> storage;
    std::vector<std::string> names;

    void add(const char* name, unsigned flags, int family, const char* address, const char* mask)
    {
        names.emplace_back(name);
        ifaddrs entry{};
        entry.ifa_flags = flags;
        entries.push_back(entry);
        pending.push_back({family, address ? address : "", mask ? mask : ""});
    }
    const ifaddrs* list()
    {
        storage.assign(entries.size() * 2, sockaddr_in6{});
        for (std::size_t i = 0; i < entries.size(); ++i) {
            entries[i].ifa_name = names[i].data();
            entries[i].ifa_next = i + 1 < entries.size() ? &entries[i + 1] : nullptr;
            fill(pending[i].family, pending[i].address, &storage[2 * i], &entries[i].ifa_addr);
            fill(pending[i].family, pending[i].mask, &storage[2 * i + 1], &entries[i].ifa_netmask);
        }
        return entries.data();
    }

private:
    struct Pending { int family; std::string address, mask; };
    std::vector<Pending> pending;
    static void fill(int family, const std::string& text, sockaddr_in6* slot, sockaddr** out)
    {
        if (family == AF_PACKET || text.empty()) {
            slot->sin6_family = static_cast<sa_family_t>(family);
            *out = family == AF_PACKET ? reinterpret_cast<sockaddr*>(slot) : nullptr;
            return;
        }
        if (family == AF_INET) {
            auto* v4 = reinterpret_cast<sockaddr_in*>(slot);
            v4->sin_family = AF_INET;
            inet_pton(AF_INET, text.c_str(), &v4->sin_addr);
        } else {
            slot->sin6_family = AF_INET6;
            inet_pton(AF_INET6, text.c_str(), &slot->sin6_addr);
        }
        *out = reinterpret_cast<sockaddr*>(slot);
    }
};

}  // namespace

TEST(InterfaceAddresses, FirstIpv4AllIpv6LoopbackLeftOut)
{
    FakeAddresses fake;
    fake.add("lo", IFF_LOOPBACK | IFF_UP, AF_PACKET, nullptr, nullptr);
    fake.add("eth0", IFF_UP, AF_PACKET, nullptr, nullptr);
    fake.add("veth1", IFF_UP, AF_PACKET, nullptr, nullptr);
    fake.add("lo", IFF_LOOPBACK | IFF_UP, AF_INET, "127.0.0.1", "255.0.0.0");
    fake.add("eth0", IFF_UP, AF_INET, "192.0.2.2", "255.255.255.0");
    fake.add("eth0:1", IFF_UP, AF_INET, "198.51.100.1", "255.255.0.0");
    fake.add("eth0", IFF_UP, AF_INET6, "fd00::2", "ffff:ffff:ffff:ffff::");
    fake.add("eth0", IFF_UP, AF_INET6, "fe80::1", "ffff:ffff:ffff:ffff:ffff::");
    auto interfaces = collectInterfaceAddresses(fake.list());
    ASSERT_EQ(interfaces.size(), 2u);
    EXPECT_EQ(interfaces[0].name, "eth0");
    ASSERT_TRUE(interfaces[0].ipv4);
    EXPECT_EQ(interfaces[0].ipv4->address, inet_addr("192.0.2.2"));
    EXPECT_EQ(interfaces[0].ipv4->netmask, inet_addr("255.255.255.0"));
    ASSERT_EQ(interfaces[0].ipv6.size(), 2u);
    EXPECT_EQ(interfaces[0].ipv6[0].address, "fd00::2");
    EXPECT_EQ(interfaces[0].ipv6[0].prefixLength, 64u);
    EXPECT_EQ(interfaces[0].ipv6[1].prefixLength, 80u);
    EXPECT_EQ(interfaces[1].name, "veth1");
    EXPECT_FALSE(interfaces[1].ipv4);
    EXPECT_TRUE(interfaces[1].ipv6.empty());
}

TEST(InterfaceAddresses, PrefixLengthStopsAtTheFirstClearBit)
{
    const std::uint8_t full[16] = {0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff,
                                   0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff};
    const std::uint8_t mask56[16] = {0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0};
    const std::uint8_t mask61[16] = {0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xf8};
    EXPECT_EQ(prefixLength(full, 16), 128u);
    EXPECT_EQ(prefixLength(mask56, 16), 56u);
    EXPECT_EQ(prefixLength(mask61, 16), 61u);
    auto summary = toIpv6Summary({"fd00::2", 64});
    EXPECT_STREQ(summary.address, "fd00::2");
    EXPECT_EQ(summary.prefixLength, 64u);
}

TEST(LinkModes, EveryKernelSpeedBitIsKnown)
{
    // bits that are not speeds: autoneg, ports, pause, backplane, FEC
    const std::vector<unsigned> notSpeeds = {6, 7, 8, 9, 10, 11, 13, 14, 16, 49, 50, 51, 74};
    for (unsigned bit = 0; bit < __ETHTOOL_LINK_MODE_MASK_NBITS; ++bit) {
        bool speed = std::find(notSpeeds.begin(), notSpeeds.end(), bit) == notSpeeds.end();
        EXPECT_EQ(kernelLinkMode(bit).has_value(), speed) << "link-mode bit " << bit;
    }
    EXPECT_EQ(kernelLinkMode(ETHTOOL_LINK_MODE_1000baseT_Full_BIT)->speed, 1000u);
    EXPECT_EQ(kernelLinkMode(ETHTOOL_LINK_MODE_10baseT_Half_BIT)->duplex, DUPLEX_HALF);
    EXPECT_EQ(kernelLinkMode(ETHTOOL_LINK_MODE_56000baseKR4_Full_BIT)->speed, 56000u);
    EXPECT_EQ(kernelLinkMode(ETHTOOL_LINK_MODE_2500baseX_Full_BIT)->speed, 2500u);
    EXPECT_EQ(kernelLinkMode(114)->speed, 800000u);
}

TEST(LinkModes, PairsDeduplicatedSortedAndLimitedToRecordSpeeds)
{
    LinkModeMask mask;
    mask.set(ETHTOOL_LINK_MODE_1000baseT_Full_BIT);
    mask.set(ETHTOOL_LINK_MODE_1000baseKX_Full_BIT);  // same pair again
    mask.set(ETHTOOL_LINK_MODE_10baseT_Half_BIT);
    mask.set(ETHTOOL_LINK_MODE_10baseT_Full_BIT);
    mask.set(ETHTOOL_LINK_MODE_200000baseCR4_Full_BIT);  // beyond the records' speeds
    mask.set(ETHTOOL_LINK_MODE_Autoneg_BIT);
    auto modes = toLinkModes(mask);
    ASSERT_EQ(modes.size(), 3u);
    EXPECT_EQ(modes[0], NN::LinkMode(NN::CONNECTION_10, NN::DUPLEX_MODE_FULL));
    EXPECT_EQ(modes[1], NN::LinkMode(NN::CONNECTION_10, NN::DUPLEX_MODE_HALF));
    EXPECT_EQ(modes[2], NN::LinkMode(NN::CONNECTION_1000, NN::DUPLEX_MODE_FULL));
}

TEST(LinkModes, CurrentSpeedDuplexPortTransceiver)
{
    EXPECT_EQ(toLinkSpeed(25000), NN::CONNECTION_25000);
    EXPECT_EQ(toLinkSpeed(static_cast<std::uint32_t>(SPEED_UNKNOWN)), NN::CONNECTION_AUTO);
    EXPECT_EQ(toLinkSpeed(200000), NN::CONNECTION_AUTO);
    EXPECT_EQ(toDuplex(DUPLEX_FULL), NN::DUPLEX_MODE_FULL);
    EXPECT_EQ(toDuplex(DUPLEX_HALF), NN::DUPLEX_MODE_HALF);
    EXPECT_EQ(toDuplex(DUPLEX_UNKNOWN), NN::DUPLEX_MODE_AUTO);
    EXPECT_EQ(recordPort(PORT_TP), NN::PNICPORT_MODE_TP);
    EXPECT_EQ(recordPort(PORT_MII), NN::PNICPORT_MODE_MII);
    EXPECT_EQ(recordPort(PORT_FIBRE), NN::PNICPORT_MODE_FIBRE);
    EXPECT_EQ(recordPort(PORT_BNC), NN::PNICPORT_MODE_BNC);
    EXPECT_EQ(recordPort(PORT_DA), NN::PNICPORT_MODE_DA);
    EXPECT_EQ(recordPort(PORT_OTHER), NN::PNICPORT_MODE_UNKNOWN);
    EXPECT_EQ(recordPort(PORT_NONE), NN::PNICPORT_MODE_UNKNOWN);
    EXPECT_EQ(recordTransceiver(XCVR_EXTERNAL), NN::TRANSCEIVER_MODE_EXTERNAL);
    EXPECT_EQ(recordTransceiver(XCVR_DUMMY1), NN::TRANSCEIVER_MODE_UNKNOWN);
}

TEST(WakeOnLan, UnsupportedWhenTheDriverRefuses)
{
    NN::PnicInfo info;
    fillWakeOnPart(info, std::nullopt);
    EXPECT_FALSE(info.wolSupported);
    EXPECT_EQ(info.supportsWakeOn, std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_UNSUPPORTED});
    EXPECT_EQ(info.wakeOn, std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_DISABLE});
}

TEST(WakeOnLan, ModesInBitOrderDisabledWhenNoneEnabled)
{
    NN::PnicInfo info;
    ethtool_wolinfo wol{};
    wol.supported = WAKE_PHY | WAKE_MAGIC | WAKE_MAGICSECURE;
    wol.wolopts = 0;
    fillWakeOnPart(info, wol);
    EXPECT_TRUE(info.wolSupported);
    EXPECT_EQ(info.supportsWakeOn,
              (std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_PHY, NN::WAKEON_MODE_MAGIC, NN::WAKEON_MODE_MAGICSECURE}));
    EXPECT_EQ(info.wakeOn, std::vector<NN::WakeOnMode>{NN::WAKEON_MODE_DISABLE});
}

TEST(PnicStatsMapping, InterfaceCountersThenDriverCountersByName)
{
    rtnl_link_stats64 link{};
    link.rx_packets = 1;
    link.tx_packets = 2;
    link.rx_bytes = 3;
    link.tx_bytes = 4;
    link.multicast = 5;
    link.rx_crc_errors = 6;
    link.tx_carrier_errors = 7;
    link.rx_missed_errors = 8;
    std::vector<DriverStatistic> driver = {{"rx_broadcast", 9}, {"tx_pause", 10}, {"tx_multicast", 11}};
    auto stats = toStats(link, driver);
    EXPECT_EQ(stats.packetsRx, 1u);
    EXPECT_EQ(stats.packetsTx, 2u);
    EXPECT_EQ(stats.bytesRx, 3u);
    EXPECT_EQ(stats.bytesTx, 4u);
    EXPECT_EQ(stats.multicastPktsRx, 5u);
    EXPECT_EQ(stats.RxCRCErrors, 6u);
    EXPECT_EQ(stats.dot3StatsFCSErrors, 6u);
    EXPECT_EQ(stats.dot3StatsCarrierSenseErrors, 7u);
    EXPECT_EQ(stats.RxMissedErrors, 8u);
    EXPECT_EQ(stats.broadcastPktsRx, 9u);
    EXPECT_EQ(stats.dot3OutPauseFrames, 10u);
    EXPECT_EQ(stats.multicastPktsTx, 11u);
    EXPECT_EQ(stats.broadcastPktsTx, 0u);  // no counter of that name
}

TEST(MacAddress, SixBytesOrNone)
{
    unsigned char bytes[6];
    toMacAddress({0x02, 0xfc, 0, 0, 0, 0x01}).GetBinaryAddress(bytes);
    EXPECT_EQ(bytes[1], 0xfc);
    EXPECT_EQ(bytes[5], 0x01);
    toMacAddress({0x02, 0xfc, 0, 0, 0}).GetBinaryAddress(bytes);
    EXPECT_EQ(bytes[1], 0);
    EXPECT_EQ(addressText({0x02, 0xfc, 0, 0, 0, 0x01}), "02:fc:00:00:00:01");
    EXPECT_EQ(addressText({}), "");
}
