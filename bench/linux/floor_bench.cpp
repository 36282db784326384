// Cost of the Linux substitute against the system-call floor, side by side in
// one process: each round times one unit through the substitute, then the same
// unit made of bare system calls written here (none of the substitute's
// readers), so both see the same machine state. Prints, per unit, the median
// time of each and their ratio.
//
//   linux_floor_bench [rounds]      (default 2000)
#include "linux_backend.hpp"
#include "linux_pnic.hpp"
#include "nic_records.hpp"

#include "nodemgr/lib/NodeMgrException.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <functional>
#include <linux/ethtool.h>
#include <linux/if_link.h>
#include <linux/netlink.h>
#include <linux/rtnetlink.h>
#include <linux/sockios.h>
#include <memory>
#include <net/if.h>
#include <string>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>
#include <vector>

using namespace orv::linuxhost;
namespace NN = NodeMgr::Network;
using orv::linuxbench::tolerate;

namespace {

// ---- the floor: bare system calls -------------------------------------------------

struct FloorNic {
    std::string name;
    std::string pciDir;  // /sys/bus/pci/devices/<address>/, empty when not on PCI
    int ioctlFd = -1;
    int routeFd = -1;
    std::vector<char> buffer = std::vector<char>(65536);
};

int ethtool(FloorNic& nic, void* command)
{
    ifreq request{};
    std::strncpy(request.ifr_name, nic.name.c_str(), IFNAMSIZ - 1);
    request.ifr_data = static_cast<char*>(command);
    return ::ioctl(nic.ioctlFd, SIOCETHTOOL, &request);
}

// One RTM_GETLINK for the named link; the reply is left in nic.buffer.
void getLink(FloorNic& nic)
{
    struct {
        nlmsghdr header;
        ifinfomsg info;
        char attributes[64];
    } request{};
    request.header.nlmsg_type = RTM_GETLINK;
    request.header.nlmsg_flags = NLM_F_REQUEST;
    request.info.ifi_family = AF_UNSPEC;
    auto* name = reinterpret_cast<rtattr*>(request.attributes);
    name->rta_type = IFLA_IFNAME;
    name->rta_len = static_cast<unsigned short>(RTA_LENGTH(nic.name.size() + 1));
    std::memcpy(RTA_DATA(name), nic.name.c_str(), nic.name.size() + 1);
    request.header.nlmsg_len = NLMSG_LENGTH(sizeof(ifinfomsg)) + RTA_ALIGN(name->rta_len);
    ::send(nic.routeFd, &request, request.header.nlmsg_len, 0);
    ::recv(nic.routeFd, nic.buffer.data(), nic.buffer.size(), 0);
}

void readSmallFile(const std::string& path, char* out, std::size_t size)
{
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return;
    (void)!::read(fd, out, size);
    ::close(fd);
}

// A zeroed, suitably aligned request of a fixed header and trailing words.
struct Request {
    alignas(8) std::uint8_t bytes[sizeof(ethtool_link_settings) + 3 * 127 * 4]{};
    template <typename Header>
    Header* as() { return reinterpret_cast<Header*>(bytes); }
};

void linkSettings(FloorNic& nic)
{
    Request request;
    auto* settings = request.as<ethtool_link_settings>();
    settings->cmd = ETHTOOL_GLINKSETTINGS;
    ethtool(nic, settings);  // the kernel answers the mask size
    settings->link_mode_masks_nwords = static_cast<std::int8_t>(-settings->link_mode_masks_nwords);
    settings->cmd = ETHTOOL_GLINKSETTINGS;
    ethtool(nic, settings);
}

template <typename Record>
void simpleQuery(FloorNic& nic, std::uint32_t command)
{
    Record record{};
    record.cmd = command;
    ethtool(nic, &record);
}

void permanentAddress(FloorNic& nic)
{
    Request request;
    auto* address = request.as<ethtool_perm_addr>();
    address->cmd = ETHTOOL_GPERMADDR;
    address->size = 32;
    ethtool(nic, address);
}

void pciIdentity(FloorNic& nic)
{
    if (nic.pciDir.empty()) return;
    char text[16];
    readSmallFile(nic.pciDir + "vendor", text, sizeof text);
    readSmallFile(nic.pciDir + "device", text, sizeof text);
}

void driverStatistics(FloorNic& nic)
{
    Request request;
    auto* sset = request.as<ethtool_sset_info>();
    sset->cmd = ETHTOOL_GSSET_INFO;
    sset->sset_mask = 1ull << ETH_SS_STATS;
    if (ethtool(nic, sset) != 0 || sset->sset_mask == 0 || sset->data[0] == 0) return;
    const std::uint32_t count = sset->data[0];
    std::vector<std::uint64_t> strings((sizeof(ethtool_gstrings) + std::size_t{count} * ETH_GSTRING_LEN) / 8 + 1);
    auto* names = reinterpret_cast<ethtool_gstrings*>(strings.data());
    names->cmd = ETHTOOL_GSTRINGS;
    names->string_set = ETH_SS_STATS;
    names->len = count;
    ethtool(nic, names);
    std::vector<std::uint64_t> values(sizeof(ethtool_stats) / 8 + count + 1);
    auto* stats = reinterpret_cast<ethtool_stats*>(values.data());
    stats->cmd = ETHTOOL_GSTATS;
    stats->n_stats = count;
    ethtool(nic, stats);
}

// Every NIC record: link, settings, wake-on-LAN, message level, statistics,
// driver info, coalescing, pause, rings, permanent address, PCI identity.
void floorNicRecords(FloorNic& nic)
{
    getLink(nic);
    linkSettings(nic);
    simpleQuery<ethtool_wolinfo>(nic, ETHTOOL_GWOL);
    simpleQuery<ethtool_value>(nic, ETHTOOL_GMSGLVL);
    simpleQuery<ethtool_drvinfo>(nic, ETHTOOL_GDRVINFO);
    driverStatistics(nic);
    simpleQuery<ethtool_coalesce>(nic, ETHTOOL_GCOALESCE);
    simpleQuery<ethtool_pauseparam>(nic, ETHTOOL_GPAUSEPARAM);
    simpleQuery<ethtool_ringparam>(nic, ETHTOOL_GRINGPARAM);
    permanentAddress(nic);
    pciIdentity(nic);
}

// What one Ethernet port instance needs: link state, MTU, addresses, speed and
// duplex (link settings), wake-on-LAN, message level, PCI identity.
void floorPortInstance(FloorNic& nic)
{
    getLink(nic);
    linkSettings(nic);
    simpleQuery<ethtool_wolinfo>(nic, ETHTOOL_GWOL);
    simpleQuery<ethtool_value>(nic, ETHTOOL_GMSGLVL);
    permanentAddress(nic);
    pciIdentity(nic);
}

// One processor package: the CPU topology files, the six CPUID leaves of its
// first CPU and one /proc/stat reading.
void floorPackage(const std::vector<unsigned>& cpus)
{
    char text[4096];
    readSmallFile("/sys/devices/system/cpu/online", text, sizeof text);
    for (unsigned cpu : cpus) {
        const std::string base = "/sys/devices/system/cpu/cpu" + std::to_string(cpu) + "/topology/";
        readSmallFile(base + "physical_package_id", text, sizeof text);
        readSmallFile(base + "thread_siblings_list", text, sizeof text);
    }
    int fd = ::open("/dev/cpu/0/cpuid", O_RDONLY | O_CLOEXEC);
    if (fd >= 0) {
        std::uint32_t regs[4];
        for (off_t leaf : {0x0L, 0x1L, 0x80000000L, 0x80000001L, 0x80000008L, 0x8000000AL}) (void)!::pread(fd, regs, sizeof regs, leaf);
        ::close(fd);
    }
    readSmallFile("/proc/stat", text, sizeof text);
}

// ---- the substitute ------------------------------------------------------------------

void substituteNicRecords(LinuxNetwork& network, const std::string& name)
{
    std::unique_ptr<NN::Pnic> pnic(network.getPnicByName(name));
    orv::linuxbench::readAllNicRecords(*pnic);
}

// The calls the Ethernet port provider makes for one instance.
void substitutePortInstance(LinuxNetwork& network, const std::string& name)
{
    std::unique_ptr<NN::Pnic> pnic(network.getPnicByName(name));
    NN::PnicInfo info;
    tolerate([&] { (void)pnic->IsEnabled(); });
    tolerate([&] { (void)pnic->IsLinkUp(); });
    tolerate([&] { (void)pnic->GetLinkSpeed(); });
    tolerate([&] { (void)pnic->GetDuplex(); });
    tolerate([&] { (void)pnic->GetMTU(); });
    tolerate([&] { (void)pnic->GetMacAddress(); });
    (void)pnic->GetPciDevice();
    tolerate([&] { pnic->GetPnicInfo(info); });
    tolerate([&] { (void)pnic->GetWakeOnLANEnabled(); });
    tolerate([&] { (void)pnic->GetWakeOnLANSupported(); });
}

void substitutePackage(LinuxKsi& ksi)
{
    std::uint32_t version = 0;
    ksi.checkSig(KSI_SIGNATURE, KSI_SIGNATURE_LENGTH, &version);
    std::optional<orv::platform::KsiParams> packages, cpus;
    ksi.getInstanceList(KSI_NODE_hardware_cpu_packageList, {}, packages);
    ksi.getInstanceList(KSI_NODE_hardware_cpu_cpuList, {}, cpus);
    Hardware_CPUPackageInfoStruct package{};
    Hardware_PCPUInfoStruct pcpu{};
    SchedKsi_PcpuInfo stats{};
    ksi.get(KSI_NODE_hardware_cpu_packageList, {packages->front()}, &package, sizeof package);
    ksi.get(KSI_NODE_hardware_cpu_cpuList, {cpus->front()}, &pcpu, sizeof pcpu);
    ksi.get(KSI_NODE_sched_pcpus_stats, {cpus->front()}, &stats, sizeof stats);
}

// ---- interleaved timing ------------------------------------------------------------------

struct Row {
    const char* unit;
    std::function<void()> substitute;
    std::function<void()> floor;
};

double medianMicroseconds(std::vector<double>& samples)
{
    std::nth_element(samples.begin(), samples.begin() + samples.size() / 2, samples.end());
    return samples[samples.size() / 2];
}

void measure(const Row& row, int rounds)
{
    using Clock = std::chrono::steady_clock;
    std::vector<double> substitute, floor;
    for (int warm = 0; warm < 50; ++warm) {
        row.substitute();
        row.floor();
    }
    for (int round = 0; round < rounds; ++round) {
        auto t0 = Clock::now();
        row.substitute();
        auto t1 = Clock::now();
        row.floor();
        auto t2 = Clock::now();
        substitute.push_back(std::chrono::duration<double, std::micro>(t1 - t0).count());
        floor.push_back(std::chrono::duration<double, std::micro>(t2 - t1).count());
    }
    const double s = medianMicroseconds(substitute), f = medianMicroseconds(floor);
    std::printf("| %s | %.1f us | %.1f us | %.2f |\n", row.unit, s, f, s / f);
}

}  // namespace

int main(int argc, char** argv)
{
    const int rounds = argc > 1 ? std::max(1, std::atoi(argv[1])) : 2000;
    LinuxNetwork network("/sys", std::make_shared<IoctlEthtoolChannel>());
    std::vector<std::string> nics;
    for (auto* pnic : network.getPnics()) {
        nics.push_back(pnic->GetName());
        delete pnic;
    }
    std::printf("| per unit | substitute (median) | floor (median) | ratio |\n|---|---|---|---|\n");
    if (nics.empty()) {
        std::printf("(no NIC on a bus: NIC rows skipped)\n");
    } else {
        FloorNic nic;
        nic.name = nics.front();
        nic.ioctlFd = ::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
        nic.routeFd = ::socket(AF_NETLINK, SOCK_RAW | SOCK_CLOEXEC, NETLINK_ROUTE);
        ethtool_drvinfo driver{};
        driver.cmd = ETHTOOL_GDRVINFO;
        if (ethtool(nic, &driver) == 0 && ::access(("/sys/bus/pci/devices/" + std::string(driver.bus_info)).c_str(), F_OK) == 0) {
            nic.pciDir = "/sys/bus/pci/devices/" + std::string(driver.bus_info) + "/";
        }
        const std::string unitNic = "NIC " + nic.name + ", all records";
        measure({unitNic.c_str(), [&] { substituteNicRecords(network, nic.name); }, [&] { floorNicRecords(nic); }}, rounds);
        measure({"one Ethernet port instance", [&] { substitutePortInstance(network, nic.name); }, [&] { floorPortInstance(nic); }},
                rounds);
        ::close(nic.ioctlFd);
        ::close(nic.routeFd);
    }
    LinuxKsi ksi(LinuxRoots{});
    std::vector<unsigned> cpus;
    for (unsigned cpu = 0; cpu < ::sysconf(_SC_NPROCESSORS_ONLN); ++cpu) cpus.push_back(cpu);
    measure({"processor package", [&] { substitutePackage(ksi); }, [&] { floorPackage(cpus); }}, rounds);
    return 0;
}
