// The whole Linux substitute against this machine: every value equals what
// ip, ethtool, uname and /proc report.
#include "linux_backend.hpp"
#include "stack_params.hpp"
#include "mac_text.hpp"
#include "tool_output.hpp"

#include "nodemgr/lib/NodeMgrException.h"
#include "orv/platform/backend/Selector.h"
#include "tmkctl/util/AutoVector.h"

#include <arpa/inet.h>
#include <atomic>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <set>
#include <sys/utsname.h>
#include <thread>

using namespace orv::linuxhost;
using orv::linuxtest::fieldAfter;
using orv::linuxtest::macText;
using orv::linuxtest::stackParams;
using orv::linuxtest::toolOutput;
using json = nlohmann::json;
namespace NN = NodeMgr::Network;

namespace {

std::unique_ptr<orv::platform::Backend> machine()
{
    std::string error;
    auto backend = orv::platform::makeLinuxBackend(error);
    EXPECT_TRUE(backend) << error;
    return backend;
}

json toolJson(const std::string& command)
{
    auto text = toolOutput(command);
    if (!text) ADD_FAILURE() << "the test needs `" << command << "` (iproute2, ethtool)";
    return text ? json::parse(*text) : json::array();
}

std::vector<std::string> pnicNames(orv::platform::Backend& backend)
{
    TmkCtl::Util::AutoVector<NN::Pnic> pnics;
    for (auto* pnic : backend.network().getPnics()) pnics.push_back(pnic);
    std::vector<std::string> names;
    for (auto* pnic : pnics) names.push_back(pnic->GetName());
    return names;
}

std::unique_ptr<NN::Pnic> pnicNamed(orv::platform::Backend& backend, const std::string& name)
{
    return std::unique_ptr<NN::Pnic>(backend.network().getPnicByName(name));
}

// Values of "key : value" lines of /proc/cpuinfo, in order.
std::vector<std::string> cpuinfoValues(const std::string& key)
{
    auto text = toolOutput("cat /proc/cpuinfo").value_or("");
    std::vector<std::string> values;
    for (int i = 0;; ++i) {
        auto value = fieldAfter(text, key, i);
        if (value.empty()) break;
        values.push_back(value);
    }
    return values;
}

}  // namespace

TEST(Machine, NicsAreTheLinksIpShowsWithAParentBus)
{
    auto backend = machine();
    std::vector<std::string> expected;
    for (const auto& link : toolJson("ip -d -j link show")) {
        if (link.contains("parentbus")) expected.push_back(link["ifname"]);
    }
    ASSERT_FALSE(expected.empty()) << "this machine should have a NIC on a bus";
    EXPECT_EQ(pnicNames(*backend), expected);
}

TEST(Machine, NicLinkStateMtuAndAddressesEqualIp)
{
    auto backend = machine();
    for (const auto& name : pnicNames(*backend)) {
        auto link = toolJson("ip -j link show dev " + name).at(0);
        auto pnic = pnicNamed(*backend, name);
        ASSERT_TRUE(pnic);
        std::set<std::string> flags(link["flags"].begin(), link["flags"].end());
        EXPECT_EQ(pnic->GetMTU(), link["mtu"].get<unsigned>()) << name;
        EXPECT_EQ(pnic->IsEnabled(), flags.count("UP") == 1) << name;
        EXPECT_EQ(pnic->IsLinkUp(), flags.count("LOWER_UP") == 1) << name;
        EXPECT_EQ(pnic->IsOperationalLinkUp(), link["operstate"] == "UP") << name;
        EXPECT_EQ(macText(pnic->GetVirtualMacAddress()), link["address"].get<std::string>()) << name;
        auto permanent = fieldAfter(toolOutput("ethtool -P " + name).value_or(""), "Permanent address");
        EXPECT_EQ(macText(pnic->GetMacAddress()), permanent) << name;
    }
}

TEST(Machine, NicDriverPciRingsAndCoalesceEqualEthtool)
{
    auto backend = machine();
    for (const auto& name : pnicNames(*backend)) {
        auto pnic = pnicNamed(*backend, name);
        auto drvinfo = toolOutput("ethtool -i " + name).value_or("");
        NN::PnicDriverInfo driver;
        pnic->GetPnicDriverInfo(driver);
        EXPECT_EQ(driver.name, fieldAfter(drvinfo, "driver"));
        EXPECT_EQ(driver.version, fieldAfter(drvinfo, "version"));
        EXPECT_EQ(driver.firmwareVersion, fieldAfter(drvinfo, "firmware-version"));
        EXPECT_EQ(driver.busInfo, fieldAfter(drvinfo, "bus-info"));
        EXPECT_EQ(pnic->GetDriverName(), driver.name);

        NN::PciDevice* pci = pnic->GetPciDevice();
        ASSERT_NE(pci, nullptr) << name;
        char address[16];
        std::snprintf(address, sizeof address, "%04x:%02x:%02x.%x", pci->GetSegment(), pci->GetBus(), pci->GetSlot(),
                      pci->GetFunction());
        EXPECT_EQ(address, driver.busInfo);
        auto vendor = toolOutput("cat /sys/bus/pci/devices/" + driver.busInfo + "/vendor").value_or("");
        EXPECT_EQ(pci->GetVendorId(), std::stoul(vendor, nullptr, 16));

        auto rings = toolOutput("ethtool -g " + name);
        NN::PnicRingInfo preset, current;
        if (rings) {
            pnic->GetPnicRingInfo(preset, current);
            EXPECT_EQ(std::to_string(preset.rx), fieldAfter(*rings, "RX", 0));
            EXPECT_EQ(std::to_string(current.rx), fieldAfter(*rings, "RX", 1));
            EXPECT_EQ(std::to_string(current.tx), fieldAfter(*rings, "TX", 1));
        } else {
            EXPECT_THROW(pnic->GetPnicRingInfo(preset, current), NodeMgr::Lib::NodeMgrException);
        }
        auto coalesce = toolOutput("ethtool -c " + name);
        NN::PnicCoalesceInfo info;
        if (coalesce) {
            pnic->GetPnicCoalesceInfo(info);
            EXPECT_EQ(std::to_string(info.rxFrames), fieldAfter(*coalesce, "rx-frames"));
            EXPECT_EQ(std::to_string(info.rxUsecs), fieldAfter(*coalesce, "rx-usecs"));
        } else {
            EXPECT_THROW(pnic->GetPnicCoalesceInfo(info), NodeMgr::Lib::NodeMgrException);
        }
    }
}

TEST(Machine, UnsupportedQueriesFailThatCallAsEthtoolFails)
{
    auto backend = machine();
    for (const auto& name : pnicNames(*backend)) {
        auto pnic = pnicNamed(*backend, name);
        NN::PnicPauseInfo pause;
        if (toolOutput("ethtool -a " + name)) {
            EXPECT_NO_THROW(pnic->GetPnicPauseInfo(pause));
        } else {
            EXPECT_THROW(pnic->GetPnicPauseInfo(pause), NodeMgr::Lib::NodeMgrException);
        }
        NN::PnicInfo info;
        EXPECT_NO_THROW(pnic->GetPnicInfo(info));  // its own queries still answer
        const bool wolReported = !fieldAfter(toolOutput("ethtool " + name).value_or(""), "Supports Wake-on").empty();
        EXPECT_EQ(info.wolSupported, wolReported && fieldAfter(toolOutput("ethtool " + name).value_or(""), "Supports Wake-on") != "d");
    }
}

TEST(Machine, NicSettingsEqualEthtool)
{
    auto backend = machine();
    for (const auto& name : pnicNames(*backend)) {
        auto pnic = pnicNamed(*backend, name);
        auto settings = toolOutput("ethtool " + name).value_or("");
        NN::PnicInfo info;
        pnic->GetPnicInfo(info);
        EXPECT_EQ(info.autoNegotiation, fieldAfter(settings, "Auto-negotiation") == "on");
        EXPECT_EQ(std::to_string(info.PHYAD), fieldAfter(settings, "PHYAD"));
        EXPECT_EQ(info.transceiver == NN::TRANSCEIVER_MODE_INTERNAL, fieldAfter(settings, "Transceiver") == "internal");
        EXPECT_EQ(info.supportsAutoNegotiation, fieldAfter(settings, "Supports auto-negotiation") == "Yes");
        auto speed = fieldAfter(settings, "Speed");
        if (speed.find("Mb/s") != std::string::npos && info.linkStatus == "Up") {
            EXPECT_EQ(std::to_string(info.speed) + "Mb/s", speed);
        } else {
            EXPECT_EQ(info.speed, NN::CONNECTION_AUTO);
        }
        EXPECT_EQ(info.linkStatus == "Up", fieldAfter(settings, "Link detected") == "yes");
    }
}

TEST(Machine, NicStatisticsBetweenTwoReadingsOfIp)
{
    auto backend = machine();
    for (const auto& name : pnicNames(*backend)) {
        // The pnic is its request's snapshot: its counters are read when it is made.
        auto before = toolJson("ip -s -j link show dev " + name).at(0)["stats64"];
        auto pnic = pnicNamed(*backend, name);
        NN::PnicStats stats;
        pnic->GetPnicStats(stats);
        auto after = toolJson("ip -s -j link show dev " + name).at(0)["stats64"];
        EXPECT_GE(stats.packetsRx, before["rx"]["packets"].get<std::uint64_t>());
        EXPECT_LE(stats.packetsRx, after["rx"]["packets"].get<std::uint64_t>());
        EXPECT_GE(stats.bytesTx, before["tx"]["bytes"].get<std::uint64_t>());
        EXPECT_LE(stats.bytesTx, after["tx"]["bytes"].get<std::uint64_t>());
        EXPECT_EQ(stats.errorsRx, after["rx"]["errors"].get<std::uint64_t>());
    }
}

TEST(Machine, KernelInterfacesAndAddressesEqualIp)
{
    auto backend = machine();
    backend->beginBatch();
    auto& ksi = backend->ksi();
    std::optional<orv::platform::KsiParams> list;
    ASSERT_EQ(ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics, stackParams({}), list), KSI_OK);
    ASSERT_TRUE(list);
    std::vector<std::string> names;
    for (const auto& param : *list) names.push_back(param.text);

    std::vector<std::string> expected;
    for (const auto& link : toolJson("ip -j addr show")) {
        auto flags = link["flags"];
        if (std::find(flags.begin(), flags.end(), "LOOPBACK") != flags.end()) continue;
        const std::string name = link["ifname"];
        expected.push_back(name);
        std::optional<json> firstV4;
        std::vector<json> v6;
        for (const auto& address : link["addr_info"]) {
            if (address["family"] == "inet" && !firstV4) firstV4 = address;
            if (address["family"] == "inet6") v6.push_back(address);
        }
        std::uint32_t ip = 0, mask = 0;
        KSI_Status status = ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({name}), &ip, 4);
        if (!firstV4) {
            EXPECT_EQ(status, KSI_ERR_NOT_FOUND) << name;
        } else {
            ASSERT_EQ(status, KSI_OK) << name;
            EXPECT_EQ(ip, inet_addr((*firstV4)["local"].get<std::string>().c_str())) << name;
            ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, stackParams({name}), &mask, 4), KSI_OK);
            EXPECT_EQ(__builtin_popcount(mask), (*firstV4)["prefixlen"].get<int>()) << name;
        }
        std::optional<orv::platform::KsiParams> addresses;
        ASSERT_EQ(ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, stackParams({name}), addresses), KSI_OK);
        ASSERT_EQ(addresses->size(), v6.size()) << name;
        for (std::size_t i = 0; i < v6.size(); ++i) {
            TcpipKsi_VnicIPv6AddrSummary summary{};
            ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary,
                              stackParams({name, (*addresses)[i].text}), &summary, sizeof summary), KSI_OK);
            bool found = false;
            for (const auto& address : v6) {
                if (address["local"] == summary.address) {
                    found = true;
                    EXPECT_EQ(summary.prefixLength, address["prefixlen"].get<std::uint32_t>());
                }
            }
            EXPECT_TRUE(found) << summary.address;
        }
    }
    EXPECT_EQ(names, expected);
}

TEST(Machine, ProcessorPackagesCoresModelAndSignatureEqualProcCpuinfo)
{
    auto backend = machine();
    backend->beginBatch();
    auto& ksi = backend->ksi();
    std::set<std::string> physicalIds;
    for (const auto& id : cpuinfoValues("physical id")) physicalIds.insert(id);
    std::optional<orv::platform::KsiParams> packages;
    ASSERT_EQ(ksi.getInstanceList(KSI_NODE_hardware_cpu_packageList, {}, packages), KSI_OK);
    ASSERT_EQ(packages->size(), physicalIds.size());
    Hardware_CPUPackageInfoStruct package{};
    ASSERT_EQ(ksi.get(KSI_NODE_hardware_cpu_packageList, {packages->front()}, &package, sizeof package), KSI_OK);
    EXPECT_EQ(std::to_string(package.numCores), cpuinfoValues("cpu cores").front());

    char model[48];
    ASSERT_EQ(ksi.get(KSI_NODE_hardware_cpu_cpuModelName, {}, model, sizeof model), KSI_OK);
    EXPECT_EQ(std::string(model, strnlen(model, 48)), cpuinfoValues("model name").front().substr(0, 48));

    std::optional<orv::platform::KsiParams> cpus;
    ASSERT_EQ(ksi.getInstanceList(KSI_NODE_hardware_cpu_cpuList, {}, cpus), KSI_OK);
    EXPECT_EQ(cpus->size(), cpuinfoValues("processor").size());
    Hardware_PCPUInfoStruct pcpu{};
    ASSERT_EQ(ksi.get(KSI_NODE_hardware_cpu_cpuList, {cpus->front()}, &pcpu, sizeof pcpu), KSI_OK);
    EXPECT_EQ(std::to_string(pcpu.family), cpuinfoValues("cpu family").front());
    EXPECT_EQ(std::to_string(pcpu.stepping), cpuinfoValues("stepping").front());
    EXPECT_EQ(std::to_string(pcpu.model), cpuinfoValues("model").front());
    const char* vendor = reinterpret_cast<const char*>(&pcpu.cpuid.id0.ebx);
    std::string vendorText = std::string(vendor, 4) + std::string(reinterpret_cast<const char*>(&pcpu.cpuid.id0.edx), 4) +
                             std::string(reinterpret_cast<const char*>(&pcpu.cpuid.id0.ecx), 4);
    EXPECT_EQ(vendorText, cpuinfoValues("vendor_id").front());
    const bool lm = cpuinfoValues("flags").front().find(" lm ") != std::string::npos;
    EXPECT_EQ(((pcpu.cpuid.id81.edx >> 29) & 1u) != 0, lm);
}

TEST(Machine, HyperthreadingStateFollowsTheKernelsSmtControl)
{
    auto backend = machine();
    Hardware_CPUGlobalInfoStruct global{};
    ASSERT_EQ(backend->ksi().get(KSI_NODE_hardware_cpu_cpuInfo, {}, &global, sizeof global), KSI_OK);
    auto control = toolOutput("cat /sys/devices/system/cpu/smt/control").value_or("notsupported\n");
    auto active = toolOutput("cat /sys/devices/system/cpu/smt/active").value_or("0\n");
    EXPECT_EQ(global.htState, static_cast<Hardware_HTStateEnum>(htStateFrom(control.substr(0, control.find('\n')), active[0] == '1')));
    EXPECT_EQ(std::to_string(global.numPCPUs), std::to_string(cpuinfoValues("processor").size()));
}

TEST(Machine, SchedulerAccountingForEveryCpu)
{
    auto backend = machine();
    backend->beginBatch();
    std::optional<orv::platform::KsiParams> cpus;
    ASSERT_EQ(backend->ksi().getInstanceList(KSI_NODE_hardware_cpu_cpuList, {}, cpus), KSI_OK);
    for (const auto& cpu : *cpus) {
        SchedKsi_PcpuInfo info{};
        SchedKsi_PcpuLoad load{};
        ASSERT_EQ(backend->ksi().get(KSI_NODE_sched_pcpus_stats, {cpu}, &info, sizeof info), KSI_OK);
        ASSERT_EQ(backend->ksi().get(KSI_NODE_sched_pcpus_load, {cpu}, &load, sizeof load), KSI_OK);
        EXPECT_LE(load.activeLoad, 100u);
        EXPECT_GT(info.usedTimeUs + info.idleTimeUs, 0u);
    }
    EXPECT_EQ(backend->ksi().get(KSI_NODE_sched_pcpus_load, {KSI_Param::ofInt(4096)}, nullptr, 36), KSI_ERR_BAD_PARAM);
    SchedKsi_PcpuLoad load{};
    EXPECT_EQ(backend->ksi().get(KSI_NODE_sched_pcpus_load, {KSI_Param::ofInt(4096)}, &load, sizeof load), KSI_ERR_NOT_FOUND);
}

TEST(Machine, VersionRecordFromOsReleaseAndUname)
{
    auto backend = machine();
    TmkuserVersion_SystemVersionInfo info{};
    ASSERT_EQ(backend->version().getSystemVersion(info), TMKUSER_STATUS_OK);
    auto name = toolOutput("sh -c '. /etc/os-release && printf %s \"$NAME\"'").value_or("");
    auto versionId = toolOutput("sh -c '. /etc/os-release && printf %s \"$VERSION_ID\"'").value_or("");
    auto release = toolOutput("uname -r").value_or("");
    EXPECT_EQ(std::string(info.product), name.substr(0, 31));
    EXPECT_EQ(std::string(info.productVersion), versionId);
    EXPECT_EQ(std::string(info.buildVersion) + "\n", release);
    EXPECT_FALSE(backend->version().osIsTmk());
}

TEST(Machine, HostNameFqdnAndUptime)
{
    auto backend = machine();
    std::string name, fqdn;
    ASSERT_TRUE(backend->host().hostName(name));
    EXPECT_EQ(name + "\n", toolOutput("hostname").value_or(""));
    ASSERT_TRUE(backend->host().fqdn(fqdn));
    if (auto tool = toolOutput("hostname -f")) {
        EXPECT_EQ(fqdn + "\n", *tool);
    }
    struct sysinfo info{};
    ASSERT_EQ(backend->host().sysInfo(info), 0);
    double uptime = std::stod(toolOutput("cat /proc/uptime").value_or("0"));
    EXPECT_NEAR(static_cast<double>(info.uptime), uptime, 2.0);
}

TEST(Machine, OffloadsEqualEthtoolFeatures)
{
    auto backend = machine();
    auto isOn = [](const std::string& text, const std::string& key) { return fieldAfter(text, key).rfind("on", 0) == 0; };
    for (const auto& name : pnicNames(*backend)) {
        auto pnic = pnicNamed(*backend, name);
        NN::PnicOffloadInfo info;
        ASSERT_NO_THROW(pnic->GetPnicOffloadInfo(info)) << name;
        auto features = toolOutput("ethtool -k " + name);
        ASSERT_TRUE(features) << name;
        EXPECT_EQ(info.rxChecksum, isOn(*features, "rx-checksumming")) << name;
        EXPECT_EQ(info.scatterGather, isOn(*features, "scatter-gather")) << name;
        EXPECT_EQ(info.tcpSegmentation, isOn(*features, "tcp-segmentation-offload")) << name;
        EXPECT_EQ(info.genericSegmentation, isOn(*features, "generic-segmentation-offload")) << name;
        EXPECT_EQ(info.largeReceive, isOn(*features, "large-receive-offload")) << name;
        EXPECT_EQ(info.udpFragmentation, isOn(*features, "udp-fragmentation-offload")) << name;
    }
}

TEST(Machine, ConcurrentNicRequestsShareTheBackendsSocketsAndAgree)
{
    auto backend = machine();
    const auto expected = pnicNames(*backend);
    ASSERT_FALSE(expected.empty());
    std::atomic<unsigned> disagreements{0}, failures{0};
    std::vector<std::thread> clients;
    for (int client = 0; client < 4; ++client) {
        clients.emplace_back([&] {
            for (int request = 0; request < 50; ++request) {
                if (pnicNames(*backend) != expected) ++disagreements;
                for (const auto& name : expected) {
                    try {
                        auto pnic = pnicNamed(*backend, name);
                        NN::PnicInfo info;
                        NN::PnicStats stats;
                        pnic->GetPnicInfo(info);
                        pnic->GetPnicStats(stats);
                        if (pnic->GetMTU() == 0 || pnic->GetPciDevice() == nullptr) ++disagreements;
                    } catch (const NodeMgr::Lib::NodeMgrException&) {
                        ++failures;
                    }
                }
            }
        });
    }
    for (auto& client : clients) client.join();
    EXPECT_EQ(disagreements.load(), 0u);
    EXPECT_EQ(failures.load(), 0u);
}
