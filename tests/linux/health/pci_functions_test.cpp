// PCI storage and network controllers on PCI trees with the AER statistics
// files of the kernel's PCI ABI: a server whose controllers saw correctable,
// non-fatal and fatal errors, functions without AER, and other classes.
#include "health/controller_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

std::string correctable(int total)
{
    return "Receiver Error " + std::to_string(total) + "\nBad TLP 0\nBad DLLP 0\nRELAY_NUM Rollover 0\n"
           "Replay Timer Timeout 0\nAdvisory Non-Fatal 0\nCorrected Internal Error 0\nHeader Log Overflow 0\n"
           "TOTAL_ERR_COR " + std::to_string(total);
}

std::string uncorrectable(const std::string& total, int count)
{
    return "Undefined 0\nData Link Protocol " + std::to_string(count) + "\nSurprise Down Error 0\nPoisoned TLP 0\n"
           "Flow Control Protocol 0\nCompletion Timeout 0\nCompleter Abort 0\nUnexpected Completion 0\n"
           "Receiver Overflow 0\nMalformed TLP 0\nECRC 0\nUnsupported Request 0\nACS Violation 0\n"
           "Uncorrectable Internal Error 0\nMC Blocked TLP 0\nAtomicOp Egress Blocked 0\nTLP Prefix Blocked Error 0\n" +
           total + " " + std::to_string(count);
}

void function(const SysfsTree& tree, const std::string& address, const std::string& classCode,
              const std::string& driver, int cor, int nonfatal, int fatal, bool aer = true)
{
    const std::string dir = "devices/pci0000:00/" + address;
    tree.writeAll(dir, {{"class", classCode}, {"vendor", "0x8086"}, {"device", "0x1572"}});
    if (aer) {
        tree.write(dir + "/aer_dev_correctable", correctable(cor));
        tree.write(dir + "/aer_dev_nonfatal", uncorrectable("TOTAL_ERR_NONFATAL", nonfatal));
        tree.write(dir + "/aer_dev_fatal", uncorrectable("TOTAL_ERR_FATAL", fatal));
    }
    if (!driver.empty()) {
        tree.mkdir("bus/pci/drivers/" + driver);
        tree.link("bus/pci/drivers/" + driver, dir + "/driver");
    }
    tree.link(dir, "bus/pci/devices/" + address);
}

class PciServer : public ::testing::Test {
protected:
    void SetUp() override
    {
        function(tree, "0000:00:00.0", "0x060000", "", 0, 0, 0);
        function(tree, "0000:00:1f.2", "0x010601", "ahci", 0, 0, 0);
        function(tree, "0000:03:00.0", "0x010802", "nvme", 2, 0, 0);
        function(tree, "0000:04:00.0", "0x010400", "megaraid_sas", 1, 1, 1);
        function(tree, "0000:02:00.0", "0x020000", "i40e", 0, 3, 0);
        function(tree, "0000:02:00.1", "0x020000", "", 0, 0, 0, false);
    }
    SysfsTree tree;
};

TEST_F(PciServer, StorageControllersAreTheMassStorageFunctionsKeyedByPciAddress)
{
    auto elements = storageControllerElements(tree.root());
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(elements[0].className, "Orvane_Controller");
    EXPECT_EQ(keyOf(elements[0], "CreationClassName"), "Orvane_Controller");
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "pci:0000:00:1f.2");
    EXPECT_EQ(keyOf(elements[1], "DeviceID"), "pci:0000:03:00.0");
    EXPECT_EQ(keyOf(elements[2], "DeviceID"), "pci:0000:04:00.0");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "PCI 8086:1572 at 0000:00:1f.2 (ahci)");
}

TEST_F(PciServer, ControllerHealthFollowsTheWorstAerCounter)
{
    auto elements = storageControllerElements(tree.root());
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(healthOf(elements[1]), 10);
    EXPECT_EQ(healthOf(elements[2]), 25);
}

TEST_F(PciServer, NetworkControllersWithAndWithoutAer)
{
    auto elements = networkControllerElements(tree.root());
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(elements[0].className, "Orvane_PortController");
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "pci:0000:02:00.0");
    EXPECT_EQ(healthOf(elements[0]), 20);
    EXPECT_EQ(keyOf(elements[1], "DeviceID"), "pci:0000:02:00.1");
    EXPECT_FALSE(elements[1].healthState);
    EXPECT_EQ(property<std::string>(elements[1], "ElementName"), "PCI 8086:1572 at 0000:02:00.1");
}

TEST(AerFiles, TotalLineWinsElseTheLinesAreSummed)
{
    EXPECT_EQ(aerTotal(correctable(7), "TOTAL_ERR_COR"), 7u);
    EXPECT_EQ(aerTotal("Receiver Error 2\nBad TLP 3\n", "TOTAL_ERR_COR"), 5u);
    EXPECT_EQ(aerTotal("", "TOTAL_ERR_COR"), std::nullopt);
    EXPECT_EQ(aerTotal("garbage\n", "TOTAL_ERR_COR"), std::nullopt);
}

TEST(NoPci, MachineWithoutPciAnswersNothing)
{
    SysfsTree tree;
    EXPECT_TRUE(storageControllerElements(tree.root()).empty());
    EXPECT_TRUE(networkControllerElements(tree.root()).empty());
}

}  // namespace
