// Memory modules on EDAC trees shaped after the kernel's EDAC sysfs interface:
// a two-controller server with per-DIMM folders, a machine with rank folders,
// an older kernel with chip-select rows only, with corrected and uncorrected errors.
#include "health/memory_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

const std::string kMc = "devices/system/edac/mc/";

void dimm(const SysfsTree& tree, const std::string& at, const std::string& label, const std::string& ce,
          const std::string& ue)
{
    tree.writeAll(kMc + at, {{"dimm_label", label}, {"dimm_location", "channel 0 slot 0"}, {"size", "16384"},
                             {"dimm_mem_type", "Registered-DDR4"}, {"dimm_dev_type", "x4"},
                             {"dimm_edac_mode", "S4ECD4ED"}, {"dimm_ce_count", ce}, {"dimm_ue_count", ue}});
}

TEST(EdacServer, OneElementPerDimmTaggedByControllerAndDimm)
{
    SysfsTree tree;
    tree.writeAll(kMc + "mc0", {{"mc_name", "Skylake Socket#0 IMC#0"}, {"ce_count", "3"}, {"ue_count", "1"}});
    dimm(tree, "mc0/dimm0", "CPU_SrcID#0_MC#0_Chan#0_DIMM#0", "0", "0");
    dimm(tree, "mc0/dimm1", "CPU_SrcID#0_MC#0_Chan#1_DIMM#0", "3", "0");
    dimm(tree, "mc1/dimm0", "CPU_SrcID#1_MC#0_Chan#0_DIMM#0", "0", "1");
    tree.write(kMc + "power/control", "auto");
    auto elements = memoryElements(tree.root());
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(elements[0].className, "Orvane_PhysicalMemory");
    EXPECT_EQ(keyOf(elements[0], "CreationClassName"), "Orvane_PhysicalMemory");
    EXPECT_EQ(keyOf(elements[0], "Tag"), "edac:mc0/dimm0");
    EXPECT_EQ(keyOf(elements[1], "Tag"), "edac:mc0/dimm1");
    EXPECT_EQ(keyOf(elements[2], "Tag"), "edac:mc1/dimm0");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "CPU_SrcID#0_MC#0_Chan#0_DIMM#0");
    EXPECT_EQ(property<std::string>(elements[0], "BankLabel"), "CPU_SrcID#0_MC#0_Chan#0_DIMM#0");
    EXPECT_EQ(property<std::uint64_t>(elements[0], "Capacity"), 16384ull * 1024 * 1024);
    EXPECT_EQ(property<std::uint16_t>(elements[0], "MemoryType"), 1);
}

TEST(EdacServer, CleanDimmIsOkCorrectedErrorsDegradeUncorrectedAreMajorFailure)
{
    SysfsTree tree;
    dimm(tree, "mc0/dimm0", "A1", "0", "0");
    dimm(tree, "mc0/dimm1", "A2", "12", "0");
    dimm(tree, "mc0/dimm2", "A3", "5", "2");
    auto elements = memoryElements(tree.root());
    ASSERT_EQ(elements.size(), 3u);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(healthOf(elements[1]), 10);
    EXPECT_EQ(healthOf(elements[2]), 20);
    EXPECT_EQ(property<std::vector<std::uint16_t>>(elements[2], "OperationalStatus"), std::vector<std::uint16_t>{6});
}

TEST(EdacServer, DimmWithoutCountsReportsNoHealthAndDimmsSortByNumber)
{
    SysfsTree tree;
    tree.writeAll(kMc + "mc0/dimm10", {{"dimm_label", "B1"}, {"size", "8192"}});
    tree.writeAll(kMc + "mc0/dimm9", {{"dimm_label", ""}, {"dimm_location", "channel 1 slot 1"}});
    auto elements = memoryElements(tree.root());
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(keyOf(elements[0], "Tag"), "edac:mc0/dimm9");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "channel 1 slot 1");
    EXPECT_FALSE(elements[0].healthState);
    EXPECT_FALSE(elements[1].healthState);
    EXPECT_FALSE(propertyOf(elements[1], "OperationalStatus"));
}

TEST(EdacRanks, RankFoldersStandForDimms)
{
    SysfsTree tree;
    tree.writeAll(kMc + "mc0/rank0", {{"dimm_label", "DIMM_A0"}, {"dimm_ce_count", "0"}, {"dimm_ue_count", "0"},
                                      {"dimm_mem_type", "Unbuffered-DDR3"}});
    auto elements = memoryElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(keyOf(elements[0], "Tag"), "edac:mc0/rank0");
    EXPECT_EQ(property<std::uint16_t>(elements[0], "MemoryType"), 24);
    EXPECT_EQ(healthOf(elements[0]), 5);
}

TEST(EdacCsrows, OlderKernelsGiveOneElementPerChipSelectRow)
{
    SysfsTree tree;
    tree.writeAll(kMc + "mc0/csrow0", {{"ce_count", "0"}, {"ue_count", "0"}, {"size_mb", "2048"},
                                       {"mem_type", "Registered-DDR2"}, {"ch0_dimm_label", "DIMM_A1"},
                                       {"ch1_dimm_label", "DIMM_B1"}, {"ch0_ce_count", "0"}});
    tree.writeAll(kMc + "mc0/csrow1", {{"ce_count", "0"}, {"ue_count", "4"}, {"size_mb", "2048"}});
    auto elements = memoryElements(tree.root());
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(keyOf(elements[0], "Tag"), "edac:mc0/csrow0");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "DIMM_A1, DIMM_B1");
    EXPECT_EQ(property<std::uint16_t>(elements[0], "MemoryType"), 21);
    EXPECT_EQ(healthOf(elements[0]), 5);
    EXPECT_EQ(healthOf(elements[1]), 20);
    EXPECT_EQ(property<std::string>(elements[1], "ElementName"), "mc0/csrow1");
}

TEST(EdacNone, MachineWithoutEdacAnswersNothing)
{
    SysfsTree tree;
    tree.mkdir("devices/system");
    EXPECT_TRUE(memoryElements(tree.root()).empty());
}

TEST(EdacTypes, MemoryTypesTheClassKnows)
{
    EXPECT_EQ(memoryTypeOf("DDR"), 20);
    EXPECT_EQ(memoryTypeOf("Registered-DDR"), 20);
    EXPECT_EQ(memoryTypeOf("Unbuffered-DDR2"), 21);
    EXPECT_EQ(memoryTypeOf("Registered-DDR3"), 24);
    EXPECT_EQ(memoryTypeOf("Unbuffered-DDR5"), 1);
    EXPECT_EQ(memoryTypeOf("Unknown"), 0);
}

}  // namespace
