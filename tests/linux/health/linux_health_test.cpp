// The Linux substitute's health interface on one written machine: each
// watched class answered by its own reader, the processors and classes that
// are not watched answered by nothing; and the drive probe on device nodes
// that cannot answer SMART.
#include "health/linux_health.hpp"
#include "health/smart_probe.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

#include <thread>

using namespace orv::linuxtest;
using orv::linuxhost::LinuxHealth;

namespace {

void buildServer(const SysfsTree& tree)
{
    const std::string hwmon = "devices/platform/coretemp.0/hwmon/hwmon2";
    tree.writeAll(hwmon, {{"name", "coretemp"}, {"temp1_input", "101000"}, {"temp1_crit", "100000"}});
    tree.link(hwmon, "class/hwmon/hwmon2");
    tree.writeAll("devices/system/edac/mc/mc0/dimm0", {{"dimm_label", "A1"}, {"dimm_ce_count", "0"}, {"dimm_ue_count", "0"}});
    tree.writeAll("class/power_supply/AC", {{"type", "Mains"}, {"online", "1"}});
    tree.writeAll("class/power_supply/BAT0", {{"type", "Battery"}, {"health", "Good"}});
    tree.writeAll("devices/pci0000:00/0000:00:1f.2", {{"class", "0x010601"}, {"vendor", "0x8086"}, {"device", "0xa352"}});
    tree.link("devices/pci0000:00/0000:00:1f.2", "bus/pci/devices/0000:00:1f.2");
    tree.writeAll("devices/pci0000:00/0000:00:19.0", {{"class", "0x020000"}, {"vendor", "0x8086"}, {"device", "0x15bc"}});
    tree.link("devices/pci0000:00/0000:00:19.0", "bus/pci/devices/0000:00:19.0");
    tree.writeAll("devices/virtual/block/md0", {{"size", "2048"}, {"md/level", "raid1"}, {"md/array_state", "clean"},
                                                 {"md/raid_disks", "2"}, {"md/degraded", "1"}});
    tree.writeAll("devices/virtual/block/md0/md/dev-sda1", {{"slot", "0"}, {"state", "in_sync"}});
    tree.link("devices/virtual/block/md0", "block/md0");
    const std::string virtio = "devices/pci0000:00/0000:00:02.0/virtio1";
    tree.write(virtio + "/block/vda/serial", "disk0");
    tree.link(virtio, virtio + "/block/vda/device");
    tree.link(virtio + "/block/vda", "block/vda");
    const std::string phy = "devices/pci0000:00/0000:03:00.0/host0/phy-0:0/sas_phy/phy-0:0";
    tree.writeAll(phy, {{"sas_address", "0x5000000000000001"}, {"phy_identifier", "0"}, {"invalid_dword_count", "0"}});
    tree.link(phy, "class/sas_phy/phy-0:0");
}

struct Expected {
    const char* watched;
    const char* className;
    std::size_t count;
};

TEST(LinuxHealthBackend, EachWatchedClassAnswersFromItsSource)
{
    SysfsTree tree;
    buildServer(tree);
    LinuxHealth health(tree.root(), tree.path("dev"));
    const Expected expected[] = {
        {"CIM_Sensor", "Orvane_NumericSensor", 1},        {"CIM_PhysicalMemory", "Orvane_PhysicalMemory", 1},
        {"CIM_PowerSupply", "Orvane_PowerSupply", 1},     {"Orvane_Battery", "Orvane_Battery", 1},
        {"Orvane_Controller", "Orvane_Controller", 1},    {"Orvane_PortController", "Orvane_PortController", 1},
        {"Orvane_StorageVolume", "Orvane_StorageVolume", 1}, {"Orvane_StorageExtent", "Orvane_StorageExtent", 1},
        {"Orvane_StoragePool", "Orvane_StoragePool", 1},  {"Orvane_DiskDrive", "Orvane_DiskDrive", 1},
        {"Orvane_SASSATAPort", "Orvane_SASSATAPort", 1},
    };
    for (const Expected& want : expected) {
        auto elements = health.elements(want.watched);
        ASSERT_EQ(elements.size(), want.count) << want.watched;
        EXPECT_EQ(elements[0].className, want.className) << want.watched;
        EXPECT_FALSE(elements[0].hostName) << want.watched;
    }
    EXPECT_EQ(healthOf(health.elements("CIM_Sensor").at(0)), 25);
    EXPECT_EQ(healthOf(health.elements("Orvane_StorageVolume").at(0)), 10);
}

TEST(LinuxHealthBackend, ProcessorsAndClassesNotWatchedAnswerNothing)
{
    SysfsTree tree;
    buildServer(tree);
    LinuxHealth health(tree.root(), tree.path("dev"));
    EXPECT_TRUE(health.elements("CIM_Processor").empty());
    EXPECT_TRUE(health.elements("CIM_Fan").empty());
    EXPECT_TRUE(health.elements("").empty());
}

TEST(LinuxHealthBackend, EmptyMachineAnswersEveryClassWithNothing)
{
    SysfsTree tree;
    LinuxHealth health(tree.root(), tree.path("dev"));
    for (const char* watched : {"CIM_Sensor", "CIM_PhysicalMemory", "CIM_Processor", "CIM_PowerSupply",
                                "Orvane_PortController", "Orvane_Controller", "Orvane_Battery", "Orvane_StorageVolume",
                                "Orvane_StorageExtent", "Orvane_DiskDrive", "Orvane_SASSATAPort", "Orvane_StoragePool"}) {
        EXPECT_TRUE(health.elements(watched).empty()) << watched;
    }
}

TEST(LinuxHealthBackend, ConcurrentRequestsGetTheSameAnswers)
{
    SysfsTree tree;
    buildServer(tree);
    LinuxHealth health(tree.root(), tree.path("dev"));
    const char* classes[] = {"CIM_Sensor", "Orvane_StorageExtent", "Orvane_DiskDrive", "Orvane_Battery"};
    std::vector<std::size_t> expected;
    for (const char* watched : classes) expected.push_back(health.elements(watched).size());
    std::vector<std::thread> threads;
    std::vector<int> mismatches(4, 0);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&, t] {
            for (int round = 0; round < 20; ++round) {
                for (std::size_t c = 0; c < 4; ++c) {
                    if (health.elements(classes[c]).size() != expected[c]) ++mismatches[t];
                }
            }
        });
    }
    for (auto& thread : threads) thread.join();
    EXPECT_EQ(mismatches, std::vector<int>(4, 0));
}

TEST(DeviceSmartProbe, MissingNodeAndNodesThatAreNotDrivesGiveNoAnswers)
{
    orv::linuxhost::health::DeviceSmartProbe missing("/nonexistent-dev-root");
    EXPECT_FALSE(missing.nvmeHealthLog("nvme0"));
    EXPECT_FALSE(missing.ataSmart("sda"));
    orv::linuxhost::health::DeviceSmartProbe dev("/dev");
    EXPECT_FALSE(dev.nvmeHealthLog("null"));
    auto answers = dev.ataSmart("null");
    ASSERT_TRUE(answers);
    EXPECT_TRUE(answers->statusSense.empty());
    EXPECT_TRUE(answers->data.empty());
    EXPECT_TRUE(answers->thresholds.empty());
}

}  // namespace
