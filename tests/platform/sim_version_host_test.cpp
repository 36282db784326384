// Version service, host type and host identity answered by the sim substitute.
#include <gtest/gtest.h>

#include <cerrno>
#include <cstring>

#include "SimHost.h"
#include "ksi/HostType.h"
#include "orv/platform/HostInfo.h"
#include "tmkuser/Version.h"

namespace orv::platform::test {
namespace {

TEST(SimVersion, RecordIsTheFixtures)
{
    SimHost host(defaultHost());
    TmkuserVersion_SystemVersionInfo info;
    ASSERT_EQ(TmkuserVersion_GetSystemVersion(&info), TMKUSER_STATUS_OK);
    EXPECT_STREQ(info.product, "Orvane Zolti");
    EXPECT_STREQ(info.productVersion, "6.0.0");
    EXPECT_STREQ(info.buildVersion, "build-4192238");
    EXPECT_STREQ(info.buildDate, "Jul 5 2016");
    EXPECT_EQ(info.talmekBuild, 4192238u);
}

TEST(SimVersion, FailureCodeComesWithItsErrnoAndMessage)
{
    Json fixture = defaultHost();
    fixture["version"] = {{"failure", {{"code", 195887107}, {"errno", 2}, {"message", "Not found"}}}};
    SimHost host(fixture);
    TmkuserVersion_SystemVersionInfo info;
    std::memset(&info, 0x7a, sizeof info);
    const TmkuserStatus_Code code = TmkuserVersion_GetSystemVersion(&info);
    EXPECT_EQ(code, 195887107u);
    EXPECT_EQ(static_cast<unsigned char>(info.product[0]), 0x7a);  // left as it was
    EXPECT_EQ(TmkuserStatus_CodeToErrno(code), 2);
    char buffer[1024];
    EXPECT_STREQ(TmkuserStatus_CodeToString(code, buffer, sizeof buffer), "Not found");
}

TEST(SimVersion, CodeToStringTruncatesToTheBuffer)
{
    SimHost host(defaultHost());
    char buffer[8];
    TmkuserStatus_CodeToString(0x1234, buffer, sizeof buffer);
    EXPECT_STREQ(buffer, "Unknown");
    EXPECT_EQ(TmkuserStatus_CodeToErrno(0x1234), EIO);
}

TEST(SimHostType, IsTheFixturesFlag)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    EXPECT_TRUE(HostType_OSIsTMK());
    fixture["host"]["osIsTmk"] = false;
    host.rewrite(fixture);
    EXPECT_FALSE(HostType_OSIsTMK());
}

TEST(SimHostInfo, FqdnHostNameAndUptime)
{
    SimHost host(defaultHost());
    char name[64];
    ASSERT_EQ(OrvHost_GetFqdn(name, sizeof name), 0);
    EXPECT_STREQ(name, "orvhost01.lab.example.com");
    ASSERT_EQ(OrvHost_GetHostName(name, sizeof name), 0);
    EXPECT_STREQ(name, "orvhost01");
    struct sysinfo info;
    ASSERT_EQ(OrvHost_Sysinfo(&info), 0);
    EXPECT_EQ(info.uptime, 864000);
}

TEST(SimHostInfo, FqdnTooLongForTheBufferFails)
{
    SimHost host(defaultHost());
    char name[8] = "x";
    EXPECT_NE(OrvHost_GetFqdn(name, sizeof name), 0);
    EXPECT_STREQ(name, "");
}

TEST(SimHostInfo, HostWithoutFqdnOrUptimeCannotTell)
{
    Json fixture = defaultHost();
    fixture["host"].erase("fqdn");
    fixture["host"].erase("uptimeSeconds");
    SimHost host(fixture);
    char name[64];
    EXPECT_NE(OrvHost_GetFqdn(name, sizeof name), 0);
    struct sysinfo info;
    errno = 0;
    EXPECT_EQ(OrvHost_Sysinfo(&info), -1);
    EXPECT_EQ(errno, ENOSYS);
}

} // namespace
} // namespace orv::platform::test
