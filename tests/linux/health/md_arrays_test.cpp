// Software RAID on /sys/block/md* trees shaped after the md driver's sysfs
// interface: a clean mirror, a degraded mirror with a faulty member, a RAID-5
// that lost two members, a broken stripe, an inactive array, a spare, and
// metadata containers.
#include "health/md_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

struct Member {
    std::string disk;  // "sda1"
    std::string slot;  // "0", "none"
    std::string state;
    std::string errors = "0";
};

void array(const SysfsTree& tree, const std::string& name, const std::string& level, const std::string& state,
           int raidDisks, int degraded, const std::vector<Member>& members, const std::string& uuid = "")
{
    const std::string block = "devices/virtual/block/" + name;
    tree.write(block + "/size", "41910272");
    tree.writeAll(block + "/md", {{"level", level}, {"array_state", state}, {"raid_disks", std::to_string(raidDisks)},
                                  {"degraded", std::to_string(degraded)}, {"sync_action", "idle"}});
    if (!uuid.empty()) tree.write(block + "/md/uuid", uuid);
    for (const Member& member : members) {
        const std::string disk = "devices/pci0000:00/0000:00:1f.2/ata1/host0/target0:0:0/0:0:0:0/block/" +
                                 member.disk.substr(0, 3) + "/" + member.disk;
        tree.write(disk + "/size", "20955136");
        const std::string dir = block + "/md/dev-" + member.disk;
        tree.writeAll(dir, {{"slot", member.slot}, {"state", member.state}, {"errors", member.errors}});
        tree.link(disk, dir + "/block");
    }
    tree.link(block, "block/" + name);
}

TEST(MdMirror, CleanMirrorIsAnOkVolumePoolAndExtentsKeyedByUuidAndSlot)
{
    SysfsTree tree;
    array(tree, "md0", "raid1", "clean", 2, 0, {{"sdb1", "1", "in_sync"}, {"sda1", "0", "in_sync"}},
          "3f2a94c1-1d2b-4c3e-9f00-1234567890ab");
    auto volumes = volumeElements(tree.root());
    ASSERT_EQ(volumes.size(), 1u);
    EXPECT_EQ(volumes[0].className, "Orvane_StorageVolume");
    EXPECT_EQ(keyOf(volumes[0], "CreationClassName"), "Orvane_StorageVolume");
    EXPECT_EQ(keyOf(volumes[0], "DeviceID"), "md:3f2a94c1-1d2b-4c3e-9f00-1234567890ab");
    EXPECT_EQ(property<std::string>(volumes[0], "ElementName"), "md0");
    EXPECT_EQ(property<std::uint64_t>(volumes[0], "NumberOfBlocks"), 41910272u);
    EXPECT_EQ(property<std::uint64_t>(volumes[0], "BlockSize"), 512u);
    EXPECT_EQ(healthOf(volumes[0]), 5);

    auto pools = poolElements(tree.root());
    ASSERT_EQ(pools.size(), 1u);
    EXPECT_EQ(pools[0].className, "Orvane_StoragePool");
    ASSERT_EQ(pools[0].keys.size(), 1u);
    EXPECT_EQ(keyOf(pools[0], "InstanceID"), "md:3f2a94c1-1d2b-4c3e-9f00-1234567890ab");
    EXPECT_EQ(property<std::string>(pools[0], "PoolID"), "md0");
    EXPECT_EQ(property<bool>(pools[0], "Primordial"), false);
    EXPECT_EQ(property<std::uint64_t>(pools[0], "TotalManagedSpace"), 41910272ull * 512);
    EXPECT_EQ(healthOf(pools[0]), 5);

    auto extents = extentElements(tree.root());
    ASSERT_EQ(extents.size(), 2u);
    EXPECT_EQ(extents[0].className, "Orvane_StorageExtent");
    EXPECT_EQ(keyOf(extents[0], "DeviceID"), "md:3f2a94c1-1d2b-4c3e-9f00-1234567890ab/slot0");
    EXPECT_EQ(property<std::string>(extents[0], "ElementName"), "sda1");
    EXPECT_EQ(property<std::uint64_t>(extents[0], "NumberOfBlocks"), 20955136u);
    EXPECT_EQ(keyOf(extents[1], "DeviceID"), "md:3f2a94c1-1d2b-4c3e-9f00-1234567890ab/slot1");
    EXPECT_EQ(healthOf(extents[0]), 5);
    EXPECT_EQ(healthOf(extents[1]), 5);
}

TEST(MdMirror, DegradedMirrorWithFaultyMemberAndSpare)
{
    SysfsTree tree;
    array(tree, "md1", "raid1", "active", 2, 1,
          {{"sda2", "0", "in_sync"}, {"sdb2", "none", "faulty"}, {"sdc2", "none", "spare"}});
    auto volumes = volumeElements(tree.root());
    ASSERT_EQ(volumes.size(), 1u);
    EXPECT_EQ(keyOf(volumes[0], "DeviceID"), "md:md1");
    EXPECT_EQ(healthOf(volumes[0]), 10);
    EXPECT_EQ(healthOf(poolElements(tree.root()).at(0)), 10);
    auto extents = extentElements(tree.root());
    ASSERT_EQ(extents.size(), 3u);
    EXPECT_EQ(keyOf(extents[0], "DeviceID"), "md:md1/slot0");
    EXPECT_EQ(keyOf(extents[1], "DeviceID"), "md:md1/dev-sdb2");
    EXPECT_EQ(healthOf(extents[1]), 20);
    EXPECT_EQ(keyOf(extents[2], "DeviceID"), "md:md1/dev-sdc2");
    EXPECT_EQ(healthOf(extents[2]), 5);
}

TEST(MdRaid5, MoreMembersLostThanTheLevelSurvivesIsCriticalFailure)
{
    SysfsTree tree;
    array(tree, "md2", "raid5", "active", 3, 2, {{"sda3", "0", "in_sync"}});
    EXPECT_EQ(healthOf(volumeElements(tree.root()).at(0)), 25);
}

TEST(MdRaid5, WriteErrorsAndCorrectedReadErrorsDegradeAMember)
{
    SysfsTree tree;
    array(tree, "md3", "raid5", "clean", 3, 0,
          {{"sda4", "0", "in_sync,write_error"}, {"sdb4", "1", "in_sync", "7"}, {"sdc4", "2", "in_sync,want_replacement"}});
    auto extents = extentElements(tree.root());
    ASSERT_EQ(extents.size(), 3u);
    EXPECT_EQ(healthOf(extents[0]), 10);
    EXPECT_EQ(healthOf(extents[1]), 10);
    EXPECT_EQ(healthOf(extents[2]), 10);
    EXPECT_EQ(healthOf(volumeElements(tree.root()).at(0)), 5);
}

TEST(MdStripe, BrokenAndInactiveArraysAreCriticalFailures)
{
    SysfsTree tree;
    array(tree, "md4", "raid0", "broken", 2, 0, {{"sda5", "0", "in_sync"}});
    array(tree, "md5", "raid1", "inactive", 2, 0, {});
    auto volumes = volumeElements(tree.root());
    ASSERT_EQ(volumes.size(), 2u);
    EXPECT_EQ(healthOf(volumes[0]), 25);
    EXPECT_EQ(healthOf(volumes[1]), 25);
}

TEST(MdContainers, ContainersAndClearedArraysAreLeftOut)
{
    SysfsTree tree;
    array(tree, "md127", "container", "inactive", 0, 0, {{"sda", "none", "spare"}});
    array(tree, "md9", "", "clear", 0, 0, {});
    EXPECT_TRUE(volumeElements(tree.root()).empty());
    EXPECT_TRUE(extentElements(tree.root()).empty());
    EXPECT_TRUE(poolElements(tree.root()).empty());
}

TEST(MdLevels, RedundancyOfEachLevel)
{
    EXPECT_EQ(redundancyOf("raid1", 3), 2u);
    EXPECT_EQ(redundancyOf("raid5", 4), 1u);
    EXPECT_EQ(redundancyOf("raid6", 6), 2u);
    EXPECT_EQ(redundancyOf("raid10", 4), 1u);
    EXPECT_EQ(redundancyOf("raid0", 2), 0u);
    EXPECT_EQ(redundancyOf("linear", 2), 0u);
}

TEST(NoMd, MachineWithoutSoftwareRaidAnswersNothing)
{
    SysfsTree tree;
    tree.writeAll("devices/virtual/block/loop0", {{"size", "0"}});
    tree.link("devices/virtual/block/loop0", "block/loop0");
    EXPECT_TRUE(volumeElements(tree.root()).empty());
    EXPECT_TRUE(extentElements(tree.root()).empty());
    EXPECT_TRUE(poolElements(tree.root()).empty());
}

}  // namespace
