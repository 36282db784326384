// The firmware identity from a written-out /sys/class/dmi/id tree, read
// directly and through the substitute under ORV_ROOT.
#include "dmi_identity.hpp"

#include "orv/platform/backend/Selector.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>

namespace {

namespace fs = std::filesystem;
using orv::platform::SystemIdentity;

class DmiTree : public ::testing::Test {
protected:
    DmiTree()
        : root_(fs::temp_directory_path() / ("orv-dmi-" + std::to_string(::getpid()) + "-" +
                                             ::testing::UnitTest::GetInstance()->current_test_info()->name()))
    {
        fs::create_directories(root_ / "sys/class/dmi/id");
    }
    ~DmiTree() override { fs::remove_all(root_); }

    void write(const std::string& file, const std::string& text)
    {
        std::ofstream(root_ / "sys/class/dmi/id" / file) << text;
    }

    fs::path root_;
};

TEST_F(DmiTree, EveryValueIsReadWithoutItsLineEnd)
{
    write("sys_vendor", "QEMU\n");
    write("product_name", "Standard PC (Q35 + ICH9, 2009)\n");
    write("product_serial", "SN 0042  \n");
    write("product_uuid", "4c4c4544-0042-3610-8057-b7c04f563232\n");
    const SystemIdentity identity = orv::linuxhost::readDmiIdentity(root_.string());
    EXPECT_EQ(identity.vendor, "QEMU");
    EXPECT_EQ(identity.product, "Standard PC (Q35 + ICH9, 2009)");
    EXPECT_EQ(identity.serialNumber, "SN 0042");
    EXPECT_EQ(identity.uuid, "4c4c4544-0042-3610-8057-b7c04f563232");
}

// The kernel makes product_serial and product_uuid readable by root only; a
// file that cannot be read (here a folder in its place), a blank one and a
// missing one leave their values out.
TEST_F(DmiTree, UnreadableBlankOrMissingFilesLeaveTheirValuesOut)
{
    write("sys_vendor", "QEMU\n");
    write("product_name", " \n");
    fs::create_directories(root_ / "sys/class/dmi/id/product_serial");
    SystemIdentity expected;
    expected.vendor = "QEMU";
    EXPECT_EQ(orv::linuxhost::readDmiIdentity(root_.string()), expected);
}

TEST_F(DmiTree, MachineWithoutFirmwareTablesTellsNothing)
{
    fs::remove_all(root_ / "sys");
    EXPECT_EQ(orv::linuxhost::readDmiIdentity(root_.string()), SystemIdentity{});
}

TEST_F(DmiTree, SubstituteReadsUnderTheRootOverride)
{
    write("sys_vendor", "Orvane Labs\n");
    write("product_uuid", "00000000-0000-0000-0000-000000000001\n");
    ::setenv("ORV_ROOT", root_.c_str(), 1);
    std::string error;
    std::unique_ptr<orv::platform::Backend> backend = orv::platform::makeLinuxBackend(error);
    ::unsetenv("ORV_ROOT");
    ASSERT_NE(backend, nullptr) << error;
    SystemIdentity expected;
    expected.vendor = "Orvane Labs";
    expected.uuid = "00000000-0000-0000-0000-000000000001";
    EXPECT_EQ(backend->host().systemIdentity(), expected);
}

}  // namespace
