// SAS phys and SATA links on trees shaped after the kernel's sas_phy and ata
// class ABIs: a SAS HBA with link errors on one phy, an AHCI controller whose
// ports hold a healthy disk, a disk libata slowed down, an empty port and a
// port multiplier.
#include "health/port_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

const std::string kAhci = "devices/pci0000:00/0000:00:1f.2";

void sasPhy(const SysfsTree& tree, int phy, const std::string& invalidDwords)
{
    const std::string name = "phy-0:" + std::to_string(phy);
    const std::string dir = "devices/pci0000:00/0000:00:03.0/0000:03:00.0/host0/" + name + "/sas_phy/" + name;
    tree.writeAll(dir, {{"sas_address", "0x500605b0000272b0"}, {"phy_identifier", std::to_string(phy)},
                        {"negotiated_linkrate", "12.0 Gbit"}, {"maximum_linkrate_hw", "12.0 Gbit"},
                        {"invalid_dword_count", invalidDwords}, {"running_disparity_error_count", "0"},
                        {"loss_of_dword_sync_count", "0"}, {"phy_reset_problem_count", "0"}, {"enable", "1"}});
    tree.link(dir, "class/sas_phy/" + name);
}

// Port ataN of the AHCI controller with link `link` and, when spdn is given, a disk behind it.
void sataLink(const SysfsTree& tree, int n, const std::string& link, const std::string& speed,
              std::optional<std::string> spdn)
{
    const std::string port = kAhci + "/ata" + std::to_string(n);
    tree.write(port + "/ata_port/ata" + std::to_string(n) + "/port_no", std::to_string(n));
    const std::string linkDir = port + "/" + link;
    tree.writeAll(linkDir + "/ata_link/" + link, {{"sata_spd", speed}, {"hw_sata_spd_limit", "6.0 Gbps"},
                                                  {"sata_spd_limit", "<unknown>"}});
    tree.link(linkDir + "/ata_link/" + link, "class/ata_link/" + link);
    if (spdn) {
        const std::string dev = "dev" + link.substr(4) + ".0";
        tree.writeAll(linkDir + "/" + dev + "/ata_device/" + dev, {{"spdn_cnt", *spdn}, {"class", "ata"}});
    }
}

TEST(SasHba, PhysKeyedBySasAddressAndPhyWithLinkErrorsDegraded)
{
    SysfsTree tree;
    sasPhy(tree, 0, "0");
    sasPhy(tree, 1, "12");
    auto elements = storagePortElements(tree.root());
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(elements[0].className, "Orvane_SASSATAPort");
    EXPECT_EQ(keyOf(elements[0], "CreationClassName"), "Orvane_SASSATAPort");
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "sas:0x500605b0000272b0/phy0");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "SAS phy 0 of 0x500605b0000272b0");
    EXPECT_EQ(property<std::uint64_t>(elements[0], "Speed"), 12000000000ull);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(keyOf(elements[1], "DeviceID"), "sas:0x500605b0000272b0/phy1");
    EXPECT_EQ(healthOf(elements[1]), 10);
}

TEST(AhciPorts, LinksKeyedByControllerAndPortWithSpeedDownsDegraded)
{
    SysfsTree tree;
    sataLink(tree, 1, "link1", "6.0 Gbps", "0");
    sataLink(tree, 2, "link2", "1.5 Gbps", "2");
    sataLink(tree, 3, "link3", "<unknown>", std::nullopt);
    auto elements = storagePortElements(tree.root());
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "ata:0000:00:1f.2/port1");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "SATA port 1 of 0000:00:1f.2");
    EXPECT_EQ(property<std::uint64_t>(elements[0], "Speed"), 6000000000ull);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(healthOf(elements[1]), 10);
    EXPECT_EQ(property<std::uint64_t>(elements[1], "Speed"), 1500000000ull);
    EXPECT_EQ(keyOf(elements[2], "DeviceID"), "ata:0000:00:1f.2/port3");
    EXPECT_FALSE(elements[2].healthState);
    EXPECT_FALSE(propertyOf(elements[2], "Speed"));
}

TEST(AhciPorts, PortMultiplierLinksCarryTheirPort)
{
    SysfsTree tree;
    sataLink(tree, 4, "link4.1", "3.0 Gbps", "0");
    auto elements = storagePortElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "ata:0000:00:1f.2/port4.1");
    EXPECT_EQ(healthOf(elements[0]), 5);
}

TEST(LinkRates, KernelRateTexts)
{
    EXPECT_EQ(linkRateBits("1.5 Gbps"), 1500000000ull);
    EXPECT_EQ(linkRateBits("22.5 Gbit"), 22500000000ull);
    EXPECT_EQ(linkRateBits("<unknown>"), std::nullopt);
    EXPECT_EQ(linkRateBits("Phy disabled"), std::nullopt);
    EXPECT_EQ(linkRateBits("Unknown"), std::nullopt);
}

TEST(NoPorts, MachineWithoutSasOrAtaAnswersNothing)
{
    SysfsTree tree;
    EXPECT_TRUE(storagePortElements(tree.root()).empty());
}

}  // namespace
