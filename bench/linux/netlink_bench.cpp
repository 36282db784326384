// Per NIC: the link data the ethtool netlink path reads (link settings,
// wake-on-LAN, rings, pause, coalescing: queries, parsing and any fall back to
// the ioctls) against its floor, the same generic-netlink requests sent on the
// open socket with nothing parsed; and the ioctl path for the same data.
#include "ethtool_reader.hpp"
#include "rtnetlink_links.hpp"

#include <benchmark/benchmark.h>
#include <linux/ethtool_netlink.h>

using namespace orv::linuxhost;

namespace {

constexpr std::uint8_t kMessages[] = {ETHTOOL_MSG_LINKINFO_GET, ETHTOOL_MSG_LINKMODES_GET, ETHTOOL_MSG_WOL_GET,
                                      ETHTOOL_MSG_RINGS_GET, ETHTOOL_MSG_PAUSE_GET, ETHTOOL_MSG_COALESCE_GET};

std::string firstBusNic()
{
    for (const auto& link : RouteLinks().all()) {
        if (link.onBus()) return link.name;
    }
    return {};
}

template <typename Call>
void refusalCounts(Call&& call)
{
    try {
        benchmark::DoNotOptimize(call());
    } catch (const std::exception&) {
        // a query the driver does not support costs its refusal
    }
}

void readLinkData(const EthtoolReader& reader)
{
    refusalCounts([&] { return reader.linkSettings(); });
    refusalCounts([&] { return reader.wakeOnLan(); });
    refusalCounts([&] { return reader.rings(); });
    refusalCounts([&] { return reader.pause(); });
    refusalCounts([&] { return reader.coalesce(); });
}

void NetlinkLinkDataPerNic(benchmark::State& state)
{
    const std::string name = firstBusNic();
    if (name.empty()) return state.SkipWithError("no NIC on a bus");
    IoctlEthtoolChannel ioctl;
    GenlEthtoolChannel netlink;
    EthtoolReader reader(ioctl, name, &netlink);
    for (auto _ : state) readLinkData(reader);
}

void NetlinkFloorPerNic(benchmark::State& state)
{
    const std::string name = firstBusNic();
    if (name.empty()) return state.SkipWithError("no NIC on a bus");
    GenlEthtoolChannel netlink;
    NetlinkMessage answer;
    for (auto _ : state) {
        for (std::uint8_t message : kMessages) benchmark::DoNotOptimize(netlink.query(message, name, answer));
    }
}

void IoctlLinkDataPerNic(benchmark::State& state)
{
    const std::string name = firstBusNic();
    if (name.empty()) return state.SkipWithError("no NIC on a bus");
    IoctlEthtoolChannel ioctl;
    EthtoolReader reader(ioctl, name);
    for (auto _ : state) readLinkData(reader);
}

}  // namespace

BENCHMARK(NetlinkLinkDataPerNic);
BENCHMARK(NetlinkFloorPerNic);
BENCHMARK(IoctlLinkDataPerNic);
BENCHMARK_MAIN();
