// The sysfs readers on a sysfs tree written out by the test: PCI functions
// under bus/pci/devices, and a CPU topology. NIC pnics made from link records
// written by the test and replayed ethtool answers.
#include "cpu_topology.hpp"
#include "linux_pnic.hpp"
#include "pci_identity.hpp"
#include "support/ethtool_replay.hpp"
#include "support/test_data.hpp"

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <linux/ethtool.h>
#include <linux/if.h>
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
        pciFunction("0000:00:03.0", "0x1af4", "0x1041");  // a virtio NIC's PCI function
        pciFunction("0000:00:14.0", "0x8086", "0xa36d");  // a USB host controller
        pciFunction("0000:00:05.0", "0x8086", "0x10fb");
        buildCpus();
    }
    void TearDown() override { fs::remove_all(root_); }

    void write(const fs::path& file, const std::string& text)
    {
        fs::create_directories(file.parent_path());
        std::ofstream(file) << text;
    }
    // A PCI function with its identity files, as bus/pci/devices shows it.
    void pciFunction(const std::string& address, const std::string& vendor, const std::string& device)
    {
        const fs::path pci = root_ / "bus/pci/devices" / address;
        write(pci / "vendor", vendor + "\n");
        write(pci / "device", device + "\n");
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

TEST_F(SysfsTree, PciIdentityIsTheFunctionAtTheDriversBusAddress)
{
    auto pci = readPciIdentity(root_.string(), "0000:00:03.0");
    ASSERT_TRUE(pci);
    EXPECT_EQ(pci->address.segment, 0);
    EXPECT_EQ(pci->address.bus, 0);
    EXPECT_EQ(pci->address.slot, 3);
    EXPECT_EQ(pci->address.function, 0);
    EXPECT_EQ(pci->vendorId, 0x1af4);
    EXPECT_EQ(pci->deviceId, 0x1041);
    EXPECT_FALSE(readPciIdentity(root_.string(), "0000:00:09.0"));  // no such function
    EXPECT_FALSE(readPciIdentity(root_.string(), ""));              // a virtual device names no bus address
}

TEST_F(SysfsTree, UsbNicHasNoPciIdentityOfItsHostController)
{
    // A USB NIC's driver names the USB port behind the controller's address.
    EXPECT_FALSE(readPciIdentity(root_.string(), "usb-0000:00:14.0-1"));
    EXPECT_TRUE(readPciIdentity(root_.string(), "0000:00:14.0"));
}

TEST_F(SysfsTree, OneReadingPerBusAddressWithinAListing)
{
    PciIdentities identities(root_.string());
    auto first = identities.of("0000:00:05.0");
    ASSERT_TRUE(first);
    fs::remove_all(root_ / "bus/pci/devices/0000:00:05.0");
    auto second = identities.of("0000:00:05.0");  // a second port of the same function
    ASSERT_TRUE(second);
    EXPECT_EQ(second->deviceId, 0x10fb);
    EXPECT_FALSE(PciIdentities(root_.string()).of("0000:00:05.0"));  // the next listing reads again
}

TEST_F(SysfsTree, PnicPciIdentityFollowsTheDriverInfoBusAddress)
{
    auto channel = std::make_shared<orv::linuxtest::ReplayChannel>(orv::linuxtest::testData("ethtool/virtio_net"));
    LinkRecord link;
    link.name = "eth0";
    link.parentDevice = "virtio2";
    LinuxPnic pnic("eth0", NicKernel{channel, nullptr, nullptr, root_.string()}, link);
    auto* pci = pnic.GetPciDevice();
    ASSERT_NE(pci, nullptr);  // the capture's bus-info is 0000:00:03.0
    EXPECT_EQ(pci->GetSlot(), 3);
    EXPECT_EQ(pci->GetVendorId(), 0x1af4);
    EXPECT_EQ(pci->GetDeviceId(), 0x1041);
}

TEST_F(SysfsTree, LinkDownNicShowsNoSpeedOrDuplex)
{
    // The driver still answers 1000 Mb/s full duplex after the cable is out.
    auto channel = std::make_shared<orv::linuxtest::ReplayChannel>(orv::linuxtest::testData("ethtool/composed_copper_1g"));
    LinkRecord link;
    link.name = "eno1";
    link.flags = IFF_UP | IFF_BROADCAST | IFF_MULTICAST;
    link.carrier = false;
    LinuxPnic down("eno1", NicKernel{channel, nullptr, nullptr, root_.string()}, link);
    EXPECT_TRUE(down.IsEnabled());
    EXPECT_FALSE(down.IsLinkUp());
    EXPECT_EQ(down.GetLinkSpeed(), NodeMgr::Network::CONNECTION_AUTO);
    EXPECT_EQ(down.GetDuplex(), NodeMgr::Network::DUPLEX_MODE_AUTO);
    link.carrier = true;  // the cable back in
    auto again = std::make_shared<orv::linuxtest::ReplayChannel>(orv::linuxtest::testData("ethtool/composed_copper_1g"));
    LinuxPnic up("eno1", NicKernel{again, nullptr, nullptr, root_.string()}, link);
    EXPECT_TRUE(up.IsLinkUp());
    EXPECT_EQ(up.GetLinkSpeed(), NodeMgr::Network::CONNECTION_1000);
    EXPECT_EQ(up.GetDuplex(), NodeMgr::Network::DUPLEX_MODE_FULL);
    NodeMgr::Network::PnicInfo info;
    up.GetPnicInfo(info);
    EXPECT_EQ(info.speed, NodeMgr::Network::CONNECTION_1000);
    // One settings handshake for the pnic's speed, duplex and record.
    EXPECT_EQ(again->exchanges(ETHTOOL_GLINKSETTINGS), 2u);
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
