// Malformed fixtures are rejected with the file, the JSON path and the
// problem, and the platform calls then fail as the real libraries fail.
#include <gtest/gtest.h>

#include "FixtureRejection.h"
#include "KsiHelpers.h"
#include "SimHost.h"
#include "tmkctl/network/NetworkInfoImpl.h"
#include "tmkuser/Version.h"

namespace orv::platform::test {
namespace {

TEST(FixtureErrors, NotJsonNamesTheFile)
{
    sim::FixtureResult result = sim::parseFixture("{\"host\": ", "broken.json");
    EXPECT_EQ(result.host, nullptr);
    EXPECT_EQ(result.error.rfind("broken.json: $: not JSON: ", 0), 0u) << result.error;
}

TEST(FixtureErrors, WrongTypeNamesThePath)
{
    Json fixture = defaultHost();
    fixture["nics"][2]["mtu"] = "1500";
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[2].mtu: expected an unsigned integer, got string \"1500\"");
}

TEST(FixtureErrors, UnknownKeyIsRejected)
{
    Json fixture = defaultHost();
    fixture["cpu"]["cpus"][1]["hyperthreads"] = 2;
    EXPECT_EQ(rejection(fixture), "host.json: $.cpu.cpus[1]: unknown key \"hyperthreads\"");
}

TEST(FixtureErrors, MissingRequiredFieldIsRejected)
{
    Json fixture = defaultHost();
    fixture["nics"][0]["stats"].erase("RxCRCErrors");
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[0].stats: missing required key \"RxCRCErrors\"");
}

TEST(FixtureErrors, OutOfRangeValueIsRejected)
{
    Json fixture = defaultHost();
    fixture["nics"][1]["pci"]["bus"] = 256;
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[1].pci.bus: value 256 out of range [0, 255]");
    fixture = defaultHost();
    fixture["cpu"]["cpus"][0]["cpuid"]["id1"][3] = "0x1FFFFFFFF";
    EXPECT_NE(rejection(fixture).find("$.cpu.cpus[0].cpuid.id1[3]: expected a 32-bit register"), std::string::npos);
    fixture = defaultHost();
    fixture["nics"][0]["rings"]["current"]["rx"] = -1;
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[0].rings.current.rx: value -1 out of range [0, 4294967295]");
}

TEST(FixtureErrors, BadEnumeratorNameListsTheKnownOnes)
{
    Json fixture = defaultHost();
    fixture["nics"][0]["duplex"] = "FULL";
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[0].duplex: unknown name \"FULL\" (expected an integer or one of "
                                  "DUPLEX_MODE_AUTO, DUPLEX_MODE_FULL, DUPLEX_MODE_HALF)");
}

TEST(FixtureErrors, FaultRulesAreChecked)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_Frobnicate"}});
    EXPECT_EQ(rejection(fixture), "host.json: $.faults[0].call: unknown call \"KSI_Frobnicate\"");
    fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_Get"}, {"node", "KSI_NODE_nope"}});
    EXPECT_EQ(rejection(fixture), "host.json: $.faults[0].node: unknown node \"KSI_NODE_nope\"");
    fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_Get"}, {"nth", 0}});
    EXPECT_EQ(rejection(fixture), "host.json: $.faults[0].nth: nth counts from 1");
}

TEST(FixtureErrors, TextLongerThanItsFieldIsRejected)
{
    Json fixture = defaultHost();
    fixture["version"]["productVersion"] = std::string(32, '9');
    EXPECT_EQ(rejection(fixture), "host.json: $.version.productVersion: string of 32 bytes is longer than 31");
}

TEST(FixtureErrors, DuplicateNicNameIsRejected)
{
    Json fixture = defaultHost();
    fixture["nics"][3]["name"] = "vmnic0";
    EXPECT_EQ(rejection(fixture), "host.json: $.nics[3]: duplicate NIC name \"vmnic0\"");
}

TEST(FixtureErrors, MalformedHostFailsEveryCallAndSaysSoOnStderr)
{
    testing::internal::CaptureStderr();
    SimHost host(std::string("[1, 2"));
    const std::string stderrText = testing::internal::GetCapturedStderr();
    EXPECT_NE(stderrText.find("ORV_SIM_FIXTURE"), std::string::npos) << stderrText;
    EXPECT_NE(stderrText.find(host.path() + ": $: not JSON"), std::string::npos) << stderrText;
    TmkCtl::Network::NetworkInfoImpl network;
    EXPECT_THROW(network.GetPnics(), NodeMgr::Lib::NodeMgrException);
    EXPECT_NE(checkSignature(), KSI_OK);
    TmkuserVersion_SystemVersionInfo info;
    EXPECT_NE(TmkuserVersion_GetSystemVersion(&info), TMKUSER_STATUS_OK);
}

TEST(FixtureErrors, MissingFileIsReportedWithTheVariable)
{
    sim::FixtureResult result = sim::readFixtureFile("/nonexistent/host.json");
    EXPECT_EQ(result.host, nullptr);
    EXPECT_EQ(result.error, "/nonexistent/host.json: cannot open: No such file or directory");
}

} // namespace
} // namespace orv::platform::test
