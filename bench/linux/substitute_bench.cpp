// Per NIC: reading every NIC record through the substitute (a fresh pnic, as a
// provider request makes one) against the bare ethtool ioctls, rtnetlink
// request and sysfs reads that it makes. Per package: the package and first-CPU
// nodes against the bare sysfs reads and cpuid-device reads.
#include "cpu_topology.hpp"
#include "cpuid_reader.hpp"
#include "ethtool_reader.hpp"
#include "link_statistics.hpp"
#include "linux_backend.hpp"
#include "linux_pnic.hpp"
#include "sysfs_net.hpp"
#include "text_files.hpp"
#include "nic_records.hpp"

#include "nodemgr/lib/NodeMgrException.h"

#include <benchmark/benchmark.h>
#include <linux/netlink.h>

using namespace orv::linuxhost;
using orv::linuxbench::tolerate;
namespace NN = NodeMgr::Network;

namespace {

std::string firstNic()
{
    auto nics = SysfsNet().busDevices();
    return nics.empty() ? std::string() : nics.front();
}

void SubstitutePerNic(benchmark::State& state)
{
    const std::string name = firstNic();
    if (name.empty()) return state.SkipWithError("no NIC on a bus");
    LinuxNetwork network("/sys", std::make_shared<IoctlEthtoolChannel>(), std::make_shared<GenlEthtoolChannel>());
    for (auto _ : state) {
        std::unique_ptr<NN::Pnic> pnic(network.getPnicByName(name));
        orv::linuxbench::readAllNicRecords(*pnic);
    }
}

// The same kernel requests, made once each with everything held open.
void FloorPerNic(benchmark::State& state)
{
    const std::string name = firstNic();
    if (name.empty()) return state.SkipWithError("no NIC on a bus");
    IoctlEthtoolChannel channel;
    NetlinkSocket route(NETLINK_ROUTE);
    EthtoolReader reader(channel, name);
    SysfsNet sysfs;
    for (auto _ : state) {
        tolerate([&] { benchmark::DoNotOptimize(sysfs.linkAttributes(name)); });  // link state
        tolerate([&] { benchmark::DoNotOptimize(reader.linkSettings()); });       // GetPnicInfo
        tolerate([&] { benchmark::DoNotOptimize(reader.wakeOnLan()); });
        tolerate([&] { benchmark::DoNotOptimize(reader.messageLevel()); });
        tolerate([&] { benchmark::DoNotOptimize(readLinkStatistics(route, name)); });  // GetPnicStats
        tolerate([&] { benchmark::DoNotOptimize(reader.driverStatistics()); });
        tolerate([&] { benchmark::DoNotOptimize(reader.driverInfo()); });
        tolerate([&] { benchmark::DoNotOptimize(reader.coalesce()); });
        tolerate([&] { benchmark::DoNotOptimize(reader.pause()); });
        tolerate([&] { benchmark::DoNotOptimize(reader.rings()); });
        tolerate([&] { benchmark::DoNotOptimize(sysfs.linkAttributes(name)); });  // GetMTU
        tolerate([&] { benchmark::DoNotOptimize(reader.permanentAddress()); });
        benchmark::DoNotOptimize(sysfs.pciDevice(name));
    }
}

void SubstitutePerPackage(benchmark::State& state)
{
    LinuxKsi ksi(LinuxRoots{});
    for (auto _ : state) {
        ksi.invalidate();  // a new request
        std::optional<orv::platform::KsiParams> packages, cpus;
        ksi.getInstanceList(KSI_NODE_hardware_cpu_packageList, {}, packages);
        ksi.getInstanceList(KSI_NODE_hardware_cpu_cpuList, {}, cpus);
        Hardware_CPUPackageInfoStruct package{};
        Hardware_PCPUInfoStruct pcpu{};
        ksi.get(KSI_NODE_hardware_cpu_packageList, {packages->front()}, &package, sizeof package);
        ksi.get(KSI_NODE_hardware_cpu_cpuList, {cpus->front()}, &pcpu, sizeof pcpu);
        benchmark::DoNotOptimize(pcpu);
    }
}

void FloorPerPackage(benchmark::State& state)
{
    for (auto _ : state) {
        benchmark::DoNotOptimize(readCpuTopology());
        benchmark::DoNotOptimize(readCpuidLeaves(0));
    }
}

}  // namespace

BENCHMARK(SubstitutePerNic);
BENCHMARK(FloorPerNic);
BENCHMARK(SubstitutePerPackage);
BENCHMARK(FloorPerPackage);
BENCHMARK_MAIN();
