// Run-time choice of the substitute and the root-directory override.
#include <gtest/gtest.h>

#include <cstdlib>

#include "KsiHelpers.h"
#include "orv/platform/Paths.h"
#include "orv/platform/backend/Selector.h"
#include "tmkctl/network/NetworkInfoImpl.h"

namespace orv::platform::test {
namespace {

TEST(Selection, UnknownSubstituteIsAnErrorNamingTheVariable)
{
    setenv("ORV_PLATFORM", "windows", 1);
    testing::internal::CaptureStderr();
    reselectBackend();
    const std::string reported = testing::internal::GetCapturedStderr();
    EXPECT_NE(reported.find("ORV_PLATFORM=windows"), std::string::npos) << reported;
    EXPECT_NE(selectionError().find("ORV_PLATFORM=windows"), std::string::npos);
    EXPECT_EQ(checkSignature(), KSI_ERR_FAILURE);
    EXPECT_THROW(TmkCtl::Network::NetworkInfoImpl().GetPnics(), NodeMgr::Lib::NodeMgrException);
    unsetenv("ORV_PLATFORM");
}

TEST(Selection, SimWithoutFixtureIsAnErrorNamingTheVariable)
{
    setenv("ORV_PLATFORM", "sim", 1);
    unsetenv("ORV_SIM_FIXTURE");
    testing::internal::CaptureStderr();
    reselectBackend();
    const std::string reported = testing::internal::GetCapturedStderr();
    EXPECT_NE(reported.find("ORV_SIM_FIXTURE"), std::string::npos) << reported;
    EXPECT_STREQ(activeBackend().name(), "none");
    unsetenv("ORV_PLATFORM");
}

TEST(Selection, DefaultIsLinuxWhenBuiltInElseSim)
{
    unsetenv("ORV_PLATFORM");
    setenv("ORV_SIM_FIXTURE", "/nonexistent.json", 1);
    testing::internal::CaptureStderr();
    reselectBackend();
    testing::internal::GetCapturedStderr();
#if ORV_TEST_HAVE_LINUX
    EXPECT_STREQ(activeBackend().name(), "linux");
#else
    EXPECT_STREQ(activeBackend().name(), "sim");
#endif
    unsetenv("ORV_SIM_FIXTURE");
}

TEST(RootPath, UnsetOrSlashLeavesPathsAlone)
{
    unsetenv("ORV_ROOT");
    EXPECT_EQ(orvRootPath("/etc/sfcb/sfcb.cfg"), "/etc/sfcb/sfcb.cfg");
    setenv("ORV_ROOT", "/", 1);
    EXPECT_EQ(orvRootPath("/altbootbank/boot.cfg"), "/altbootbank/boot.cfg");
    unsetenv("ORV_ROOT");
}

TEST(RootPath, RootDirectoryPrefixesFixedPaths)
{
    setenv("ORV_ROOT", "/tmp/orv-root/", 1);
    EXPECT_EQ(orvRootPath("/etc/sfcb/sfcb.cfg"), "/tmp/orv-root/etc/sfcb/sfcb.cfg");
    EXPECT_EQ(orvRootPath("/altbootbank/boot.cfg"), "/tmp/orv-root/altbootbank/boot.cfg");
    unsetenv("ORV_ROOT");
}

} // namespace
} // namespace orv::platform::test
