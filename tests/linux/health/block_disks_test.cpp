// Disk drives on /sys/block trees shaped after the block, SCSI and NVMe sysfs
// interfaces: an NVMe namespace, a SATA disk behind libata, a virtio disk, an
// optical drive and virtual block devices; SMART answers come from byte
// buffers standing in for the drives.
#include "health/disk_elements.hpp"
#include "health/nvme_smart.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

#include <map>
#include <numeric>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

class ScriptedProbe final : public SmartProbe {
public:
    std::optional<std::vector<std::uint8_t>> nvmeHealthLog(const std::string& node) override
    {
        asked.push_back(node);
        auto found = nvme.find(node);
        if (found == nvme.end()) return std::nullopt;
        return found->second;
    }
    std::optional<AtaSmartAnswers> ataSmart(const std::string& node) override
    {
        asked.push_back(node);
        auto found = ata.find(node);
        if (found == ata.end()) return std::nullopt;
        return found->second;
    }

    std::map<std::string, std::vector<std::uint8_t>> nvme;
    std::map<std::string, AtaSmartAnswers> ata;
    std::vector<std::string> asked;
};

const std::string kNvmeCtrl = "devices/pci0000:00/0000:00:1d.0/0000:3d:00.0/nvme/nvme0";
const std::string kScsiDev = "devices/pci0000:00/0000:00:17.0/ata2/host1/target1:0:0/1:0:0:0";

void buildMachine(const SysfsTree& tree)
{
    tree.writeAll(kNvmeCtrl, {{"model", "Samsung SSD 980 PRO 1TB                 "}, {"serial", "S5GXNF0R123456A"}});
    tree.mkdir("class/nvme");
    tree.link("class/nvme", kNvmeCtrl + "/subsystem");
    tree.writeAll(kNvmeCtrl + "/nvme0n1", {{"size", "1953525168"}, {"nsid", "1"},
                                            {"wwid", "eui.002538b911b2c3d4"}});
    tree.link(kNvmeCtrl, kNvmeCtrl + "/nvme0n1/device");
    tree.link(kNvmeCtrl + "/nvme0n1", "block/nvme0n1");

    tree.writeAll(kScsiDev, {{"vendor", "ATA     "}, {"model", "WDC WD40EFRX-68N"}, {"type", "0"},
                             {"wwid", "naa.50014ee2b5c1d2e3"}});
    tree.mkdir("bus/scsi");
    tree.link("bus/scsi", kScsiDev + "/subsystem");
    tree.write(kScsiDev + "/block/sda/size", "7814037168");
    tree.link(kScsiDev, kScsiDev + "/block/sda/device");
    tree.link(kScsiDev + "/block/sda", "block/sda");

    const std::string cdrom = "devices/pci0000:00/0000:00:17.0/ata3/host2/target2:0:0/2:0:0:0";
    tree.writeAll(cdrom, {{"vendor", "HL-DT-ST"}, {"model", "DVDRAM GH24NSD1"}, {"type", "5"}});
    tree.link("bus/scsi", cdrom + "/subsystem");
    tree.write(cdrom + "/block/sr0/size", "2097151");
    tree.link(cdrom, cdrom + "/block/sr0/device");
    tree.link(cdrom + "/block/sr0", "block/sr0");

    const std::string virtio = "devices/pci0000:00/0000:00:02.0/virtio1";
    tree.mkdir(virtio);
    tree.writeAll(virtio + "/block/vda", {{"size", "83886080"}, {"serial", "overlayblk"}});
    tree.link(virtio, virtio + "/block/vda/device");
    tree.link(virtio + "/block/vda", "block/vda");

    tree.write("devices/virtual/block/loop0/size", "0");
    tree.link("devices/virtual/block/loop0", "block/loop0");
    tree.write("devices/virtual/block/md0/size", "100");
    tree.link("devices/virtual/block/md0", "block/md0");
}

std::vector<std::uint8_t> nvmeLog(std::uint8_t warning)
{
    std::vector<std::uint8_t> log(512, 0);
    log[0] = warning;
    log[3] = 100;
    log[4] = 10;
    return log;
}

std::vector<std::uint8_t> statusSense(std::uint8_t mid, std::uint8_t high)
{
    std::vector<std::uint8_t> sense(22, 0);
    sense[0] = 0x72;
    sense[7] = 14;
    sense[8] = 0x09;
    sense[9] = 0x0C;
    sense[17] = mid;
    sense[19] = high;
    return sense;
}

TEST(BlockDisks, DisksWithABusDeviceKeyedByWorldWideIdOrSerial)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    auto elements = diskElements(tree.root(), probe);
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(elements[0].className, "Orvane_DiskDrive");
    EXPECT_EQ(keyOf(elements[0], "CreationClassName"), "Orvane_DiskDrive");
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "wwid:eui.002538b911b2c3d4");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "Samsung SSD 980 PRO 1TB");
    EXPECT_EQ(property<std::string>(elements[0], "Name"), "nvme0n1");
    EXPECT_EQ(property<std::uint64_t>(elements[0], "MaxMediaSize"), 1953525168ull * 512 / 1000);
    EXPECT_EQ(keyOf(elements[1], "DeviceID"), "wwid:naa.50014ee2b5c1d2e3");
    EXPECT_EQ(property<std::string>(elements[1], "ElementName"), "WDC WD40EFRX-68N");
    EXPECT_EQ(keyOf(elements[2], "DeviceID"), "serial:overlayblk");
    EXPECT_EQ(property<std::string>(elements[2], "ElementName"), "vda");
}

TEST(BlockDisks, SmartAskedOfTheNvmeControllerAndTheAtaDiskOnly)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    auto elements = diskElements(tree.root(), probe);
    EXPECT_EQ(probe.asked, (std::vector<std::string>{"nvme0", "sda"}));
    for (const auto& element : elements) EXPECT_FALSE(element.healthState) << *keyOf(element, "DeviceID");
}

TEST(BlockDisks, HealthyDrivesAreOk)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    probe.nvme["nvme0"] = nvmeLog(0);
    probe.ata["sda"] = AtaSmartAnswers{false, statusSense(0x4F, 0xC2), {}, {}};
    auto elements = diskElements(tree.root(), probe);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(healthOf(elements[1]), 5);
    EXPECT_FALSE(elements[2].healthState);
}

TEST(BlockDisks, FailingSmartStatusAndNvmeCriticalWarnings)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    probe.nvme["nvme0"] = nvmeLog(kNvmeReadOnly);
    probe.ata["sda"] = AtaSmartAnswers{false, statusSense(0xF4, 0x2C), {}, {}};
    auto elements = diskElements(tree.root(), probe);
    EXPECT_EQ(healthOf(elements[0]), 25);
    EXPECT_EQ(healthOf(elements[1]), 20);
    EXPECT_EQ(property<std::vector<std::uint16_t>>(elements[1], "OperationalStatus"), std::vector<std::uint16_t>{6});
}

TEST(BlockDisks, RefusedOrUnparsableAnswersLeaveTheHealthOut)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    probe.nvme["nvme0"] = std::vector<std::uint8_t>(64, 0);
    probe.ata["sda"] = AtaSmartAnswers{};
    auto elements = diskElements(tree.root(), probe);
    EXPECT_FALSE(elements[0].healthState);
    EXPECT_FALSE(elements[1].healthState);
}

TEST(BlockDisks, AtaDriveInStandbyIsNotJudged)
{
    SysfsTree tree;
    buildMachine(tree);
    ScriptedProbe probe;
    AtaSmartAnswers standby;
    standby.standby = true;
    standby.statusSense = statusSense(0xF4, 0x2C);
    probe.ata["sda"] = standby;
    EXPECT_FALSE(diskElements(tree.root(), probe).at(1).healthState);
}

TEST(BlockDisks, NvmeNamespaceWithoutWwidIsKeyedByControllerSerialAndNamespace)
{
    SysfsTree tree;
    buildMachine(tree);
    tree.remove(kNvmeCtrl + "/nvme0n1/wwid");
    ScriptedProbe probe;
    EXPECT_EQ(keyOf(diskElements(tree.root(), probe).at(0), "DeviceID"), "serial:S5GXNF0R123456A/ns1");
}

TEST(BlockDisks, DiskWithoutIdentityIsKeyedByItsDevicePath)
{
    SysfsTree tree;
    buildMachine(tree);
    tree.remove(kScsiDev + "/wwid");
    ScriptedProbe probe;
    EXPECT_EQ(keyOf(diskElements(tree.root(), probe).at(1), "DeviceID"),
              "path:pci0000:00/0000:00:17.0/ata2/host1/target1:0:0/1:0:0:0");
}

TEST(BlockDisks, MachineWithoutDisksAnswersNothing)
{
    SysfsTree tree;
    ScriptedProbe probe;
    EXPECT_TRUE(diskElements(tree.root(), probe).empty());
    EXPECT_TRUE(probe.asked.empty());
}

}  // namespace
