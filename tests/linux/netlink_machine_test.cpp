// Ethtool netlink against this machine: for every NIC the netlink path answers
// what the ioctls answer, and a kernel without the family (a family name the
// controller does not know) sends every query to the ioctls.
#include "ethtool_reader.hpp"
#include "linux_call_error.hpp"
#include "rtnetlink_links.hpp"

#include <cerrno>
#include <cstring>
#include <gtest/gtest.h>
#include <linux/ethtool_netlink.h>
#include <optional>
#include <chrono>
#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>
#include <vector>

using namespace orv::linuxhost;

namespace {

// The answer, or the errno of the refusal.
template <typename Query>
auto outcome(Query&& query) -> std::pair<std::optional<decltype(query())>, int>
{
    try {
        return {query(), 0};
    } catch (const LinuxCallError& error) {
        return {std::nullopt, error.error()};
    }
}

template <typename Structure>
void expectSameStructure(const std::pair<std::optional<Structure>, int>& netlink,
                         const std::pair<std::optional<Structure>, int>& ioctl, const char* what)
{
    ASSERT_EQ(netlink.second, ioctl.second) << what;
    if (netlink.first) {
        EXPECT_EQ(std::memcmp(&*netlink.first, &*ioctl.first, sizeof(Structure)), 0) << what;
    }
}

std::vector<std::string> nics()
{
    std::vector<std::string> names;
    for (const auto& link : RouteLinks().all()) {
        if (link.onBus()) names.push_back(link.name);
    }
    if (names.empty()) ADD_FAILURE() << "this machine has no NIC on a bus";
    return names;
}

}  // namespace

TEST(EthtoolNetlinkMachine, KernelHasTheEthtoolFamily)
{
    GenlEthtoolChannel netlink;
    NetlinkMessage answer;
    for (const auto& name : nics()) {
        EXPECT_EQ(netlink.query(ETHTOOL_MSG_LINKINFO_GET, name, answer), 0) << name;
    }
}

TEST(EthtoolNetlinkMachine, LinkSettingsAgreeWithTheIoctlsForEveryNic)
{
    GenlEthtoolChannel netlink;
    IoctlEthtoolChannel ioctl;
    for (const auto& name : nics()) {
        auto viaNetlink = EthtoolReader(ioctl, name, &netlink).linkSettings();
        auto viaIoctl = EthtoolReader(ioctl, name).linkSettings();
        EXPECT_EQ(viaNetlink.source, LinkSettingsSource::Netlink);
        EXPECT_NE(viaIoctl.source, LinkSettingsSource::Netlink);
        EXPECT_EQ(viaNetlink.speed, viaIoctl.speed) << name;
        EXPECT_EQ(viaNetlink.duplex, viaIoctl.duplex) << name;
        EXPECT_EQ(viaNetlink.port, viaIoctl.port) << name;
        EXPECT_EQ(viaNetlink.phyAddress, viaIoctl.phyAddress) << name;
        EXPECT_EQ(viaNetlink.transceiver, viaIoctl.transceiver) << name;
        EXPECT_EQ(viaNetlink.autoneg, viaIoctl.autoneg) << name;
        EXPECT_TRUE(viaNetlink.supported.sameBits(viaIoctl.supported)) << name;
        EXPECT_TRUE(viaNetlink.advertising.sameBits(viaIoctl.advertising)) << name;
        EXPECT_TRUE(viaNetlink.partner.sameBits(viaIoctl.partner)) << name;
    }
}

TEST(EthtoolNetlinkMachine, WakeOnRingsPauseCoalescingAgreeWithTheIoctlsForEveryNic)
{
    GenlEthtoolChannel netlink;
    IoctlEthtoolChannel ioctl;
    for (const auto& name : nics()) {
        EthtoolReader both(ioctl, name, &netlink);
        EthtoolReader plain(ioctl, name);
        auto wolNetlink = outcome([&] { return both.wakeOnLan(); });
        auto wolIoctl = outcome([&] { return plain.wakeOnLan(); });
        ASSERT_EQ(wolNetlink.second, wolIoctl.second) << name;
        if (wolNetlink.first) {
            ASSERT_EQ(wolNetlink.first->has_value(), wolIoctl.first->has_value()) << name;  // both: implemented or not
            if (wolNetlink.first->has_value()) {
                EXPECT_EQ((*wolNetlink.first)->supported, (*wolIoctl.first)->supported);
                EXPECT_EQ((*wolNetlink.first)->wolopts, (*wolIoctl.first)->wolopts);
            }
        }
        expectSameStructure(outcome([&] { return both.rings(); }), outcome([&] { return plain.rings(); }), "rings");
        expectSameStructure(outcome([&] { return both.pause(); }), outcome([&] { return plain.pause(); }), "pause");
        expectSameStructure(outcome([&] { return both.coalesce(); }), outcome([&] { return plain.coalesce(); }),
                            "coalescing");
    }
}

TEST(EthtoolNetlinkMachine, FamilyUnknownToTheControllerFallsBackToTheIoctls)
{
    GenlEthtoolChannel missing("orv_nofamily");  // within GENL_NAMSIZ
    NetlinkMessage answer;
    IoctlEthtoolChannel ioctl;
    for (const auto& name : nics()) {
        EXPECT_EQ(missing.query(ETHTOOL_MSG_LINKMODES_GET, name, answer), ENOENT);
        EthtoolReader reader(ioctl, name, &missing);
        EXPECT_NE(reader.linkSettings().source, LinkSettingsSource::Netlink) << name;
        auto rings = outcome([&] { return reader.rings(); });
        auto ioctlRings = outcome([&] { return EthtoolReader(ioctl, name).rings(); });
        expectSameStructure(rings, ioctlRings, "rings");
    }
}

TEST(EthtoolNetlinkMachine, DeviceThatDoesNotExistIsRefusedWithEnodev)
{
    GenlEthtoolChannel netlink;
    NetlinkMessage answer;
    EXPECT_EQ(netlink.query(ETHTOOL_MSG_LINKINFO_GET, "orvnosuch0", answer), ENODEV);
}

TEST(EthtoolNetlinkMachine, AChannelThatCouldNotOpenTriesAgainLater)
{
    GenlEthtoolChannel netlink("ethtool", std::chrono::milliseconds(0));
    NetlinkMessage answer;
    // Every descriptor taken: the channel cannot open its socket.
    rlimit saved{};
    ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &saved), 0);
    std::vector<int> taken;
    rlimit low = saved;
    low.rlim_cur = 64;
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &low), 0);
    for (int fd; (fd = ::open("/dev/null", O_RDONLY | O_CLOEXEC)) >= 0;) taken.push_back(fd);
    const int refused = netlink.query(ETHTOOL_MSG_LINKINFO_GET, "lo", answer);
    for (int fd : taken) ::close(fd);
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &saved), 0);
    EXPECT_EQ(refused, EMFILE);
    // Descriptors free again: the next query opens the channel ("lo" answers or is not supported).
    const int again = netlink.query(ETHTOOL_MSG_LINKINFO_GET, "lo", answer);
    EXPECT_TRUE(again == 0 || again == EOPNOTSUPP) << std::strerror(again);
}
