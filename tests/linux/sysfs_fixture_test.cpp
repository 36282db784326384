// The sysfs readers on a sysfs tree written out by the test: a NIC on a PCI bus
// behind a virtio device, a virtual device without a bus, and a CPU topology.
#include "cpu_topology.hpp"
#include "linux_call_error.hpp"
#include "linux_pnic.hpp"
#include "sysfs_net.hpp"

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <unistd.h>

using namespace orv::linuxhost;
namespace fs = std::filesystem;

namespace {

class SysfsTree : public ::testing::Test {
protected:
    void SetUp() override
    {
        root_ = fs::temp_directory_path() / ("orv-sysfs-" + std::to_string(::getpid()));
        fs::remove_all(root_);
        buildNet();
        buildCpus();
    }
    void TearDown() override { fs::remove_all(root_); }

    void write(const fs::path& file, const std::string& text)
    {
        fs::create_directories(file.parent_path());
        std::ofstream(file) << text;
    }
    void link(const fs::path& target, const fs::path& at)
    {
        fs::create_directories(at.parent_path());
        fs::create_symlink(target, at);
    }
    void netDevice(const fs::path& dir, const std::string& index, const std::string& mtu)
    {
        write(dir / "ifindex", index + "\n");
        write(dir / "flags", "0x1003\n");
        write(dir / "mtu", mtu + "\n");
        write(dir / "operstate", "up\n");
        write(dir / "carrier", "1\n");
        write(dir / "address", "02:fc:00:00:00:01\n");
        write(dir / "speed", "-1\n");
        write(dir / "duplex", "unknown\n");
    }
    // A PCI function at devices/pci0000:00/<address> with its identity files.
    fs::path pciFunction(const std::string& address, const std::string& vendor, const std::string& device)
    {
        const fs::path pci = root_ / "devices/pci0000:00" / address;
        write(pci / "vendor", vendor + "\n");
        write(pci / "device", device + "\n");
        link(root_ / "bus/pci", pci / "subsystem");
        return pci;
    }
    // The net device `name` of a bus device, with its `device` link and class entry.
    fs::path netDeviceOf(const fs::path& busDevice, const std::string& name, const std::string& index)
    {
        netDevice(busDevice / "net" / name, index, "1500");
        link(busDevice, busDevice / "net" / name / "device");
        link(busDevice / "net" / name, root_ / "class/net" / name);
        return busDevice / "net" / name;
    }
    void buildNet()
    {
        const fs::path virtio = pciFunction("0000:00:03.0", "0x1af4", "0x1000") / "virtio2";
        write(virtio / "vendor", "0x1af4\n");
        link(root_ / "bus/virtio", virtio / "subsystem");
        write(netDeviceOf(virtio, "eth0", "4") / "mtu", "1400\n");
        netDevice(root_ / "devices/virtual/net/veth0", "2", "1500");
        link(root_ / "devices/virtual/net/veth0", root_ / "class/net/veth0");
        buildUsbNic();
        buildLinkDownNic();
    }
    // A USB NIC: its interface sits under the USB host controller, a PCI function.
    void buildUsbNic()
    {
        const fs::path device = pciFunction("0000:00:14.0", "0x8086", "0xa36d") / "usb1/1-1";
        write(device / "idVendor", "0bda\n");
        link(root_ / "bus/usb", device / "subsystem");
        const fs::path interface = device / "1-1:1.0";
        link(root_ / "bus/usb", interface / "subsystem");
        netDeviceOf(interface, "usb0", "5");
    }
    // A PCI NIC whose cable is out: up, no carrier, the driver still showing the last speed.
    void buildLinkDownNic()
    {
        const fs::path eth1 = netDeviceOf(pciFunction("0000:00:05.0", "0x8086", "0x10fb"), "eth1", "6");
        write(eth1 / "carrier", "0\n");
        write(eth1 / "operstate", "down\n");
        write(eth1 / "speed", "10000\n");
        write(eth1 / "duplex", "full\n");
    }
    void buildCpus()
    {
        const fs::path cpus = root_ / "devices/system/cpu";
        write(cpus / "online", "0-5,7\n");
        // two packages; package 1 holds CPUs 0,1 (one core, two threads) and 4; package 0 holds 2,3,5,7
        const std::vector<std::tuple<int, int, std::string>> layout = {
            {0, 1, "0-1"}, {1, 1, "0-1"}, {2, 0, "2,5"}, {3, 0, "3"}, {4, 1, "4"}, {5, 0, "2,5"}, {7, 0, "7"}};
        for (const auto& [cpu, package, siblings] : layout) {
            const fs::path topology = cpus / ("cpu" + std::to_string(cpu)) / "topology";
            write(topology / "physical_package_id", std::to_string(package) + "\n");
            write(topology / "thread_siblings_list", siblings + "\n");
        }
    }

    fs::path root_;
};

}  // namespace

TEST_F(SysfsTree, NicsAreTheDevicesWithABusDevice)
{
    SysfsNet sysfs(root_.string());
    EXPECT_EQ(sysfs.allDevices(), (std::vector<std::string>{"veth0", "eth0", "usb0", "eth1"}));  // interface-index order
    EXPECT_EQ(sysfs.busDevices(), (std::vector<std::string>{"eth0", "usb0", "eth1"}));
    EXPECT_FALSE(sysfs.hasBusDevice("veth0"));
}

TEST_F(SysfsTree, PciFunctionIsTheNearestPciAncestor)
{
    SysfsNet sysfs(root_.string());
    auto pci = sysfs.pciDevice("eth0");
    ASSERT_TRUE(pci);
    EXPECT_EQ(pci->address.segment, 0);
    EXPECT_EQ(pci->address.bus, 0);
    EXPECT_EQ(pci->address.slot, 3);
    EXPECT_EQ(pci->address.function, 0);
    EXPECT_EQ(pci->vendorId, 0x1af4);
    EXPECT_EQ(pci->deviceId, 0x1000);  // the PCI function's, not the virtio device's
    EXPECT_FALSE(sysfs.pciDevice("veth0"));
}

TEST_F(SysfsTree, LinkAttributesAndAVanishedDevice)
{
    SysfsNet sysfs(root_.string());
    auto link = sysfs.linkAttributes("eth0");
    EXPECT_EQ(link.ifindex, 4);
    EXPECT_EQ(link.mtu, 1400u);
    EXPECT_EQ(link.flags, 0x1003u);
    EXPECT_EQ(link.operstate, "up");
    EXPECT_EQ(link.carrier, true);
    EXPECT_EQ(link.speed, -1);
    EXPECT_EQ(link.address, "02:fc:00:00:00:01");
    fs::remove_all(root_ / "devices/pci0000:00/0000:00:03.0/virtio2/net/eth0");
    try {
        sysfs.linkAttributes("eth0");
        FAIL() << "a vanished device must not answer";
    } catch (const LinuxCallError& error) {
        EXPECT_TRUE(error.vanished());
    }
    EXPECT_EQ(sysfs.busDevices(), (std::vector<std::string>{"usb0", "eth1"}));
}

TEST_F(SysfsTree, PciNicIsItsOwnPciFunction)
{
    auto pci = SysfsNet(root_.string()).pciDevice("eth1");
    ASSERT_TRUE(pci);
    EXPECT_EQ(pci->address.slot, 5);
    EXPECT_EQ(pci->vendorId, 0x8086);
    EXPECT_EQ(pci->deviceId, 0x10fb);
}

TEST_F(SysfsTree, UsbNicHasNoPciIdentityOfItsHostController)
{
    SysfsNet sysfs(root_.string());
    EXPECT_FALSE(sysfs.pciDevice("usb0"));
    LinuxPnic pnic("usb0", root_.string(), std::make_shared<IoctlEthtoolChannel>());
    EXPECT_EQ(pnic.GetPciDevice(), nullptr);
}

TEST_F(SysfsTree, LinkDownNicShowsNoSpeedOrDuplex)
{
    LinuxPnic pnic("eth1", root_.string(), std::make_shared<IoctlEthtoolChannel>());
    EXPECT_FALSE(pnic.IsLinkUp());
    EXPECT_EQ(pnic.GetLinkSpeed(), NodeMgr::Network::CONNECTION_AUTO);
    EXPECT_EQ(pnic.GetDuplex(), NodeMgr::Network::DUPLEX_MODE_AUTO);
    write(root_ / "class/net/eth1/carrier", "1\n");  // the cable back in
    EXPECT_TRUE(pnic.IsLinkUp());
    EXPECT_EQ(pnic.GetLinkSpeed(), NodeMgr::Network::CONNECTION_10000);
    EXPECT_EQ(pnic.GetDuplex(), NodeMgr::Network::DUPLEX_MODE_FULL);
}

TEST_F(SysfsTree, PackagesCoresAndCpuOrder)
{
    auto topology = readCpuTopology(root_.string());
    ASSERT_EQ(topology.packages.size(), 2u);
    EXPECT_EQ(topology.packages[0].packageId, 0u);
    ASSERT_EQ(topology.packages[0].cores.size(), 3u);  // {2,5} {3} {7}
    EXPECT_EQ(topology.packages[0].cores[0].cpus, (std::vector<unsigned>{2, 5}));
    ASSERT_EQ(topology.packages[1].cores.size(), 2u);  // {0,1} {4}
    EXPECT_EQ(topology.cpuOrder(), (std::vector<unsigned>{2, 3, 7, 0, 4, 1, 5}));
    EXPECT_EQ(topology.coreCount(), 5u);
}
