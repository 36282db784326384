// Where the two version records come from: the version service for the
// running image, the alternate boot bank's boot.cfg for the other, and what
// happens when either is missing or odd.
#include <syslog.h>

#include <ctime>

#include <orv/testsupport/SyslogCapture.h>

#include "SwidFixture.h"

namespace swid {
namespace {

using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;
using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

constexpr const char* kServiceFailureLine = "Got error from TmkuserVersion_GetSystemVersion (16): Device busy\n";

class VersionInfoTest : public SwidTest {
protected:
    std::vector<std::string> enumeratedIds() { return instanceIdsOf(provider().enumerateInstanceNames(kSoftwareClass)); }

    // The alternate bank's instance after serving the default host with boot.cfg content.
    std::vector<NamedValue> alternateFrom(const std::string& bootCfg) {
        serve(hostWith(versionSection()));
        writeBootCfg(bootCfg);
        const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        if (reply.instances().size() != 2) {
            ADD_FAILURE() << "expected two instances, got " << reply.instances().size();
            return {};
        }
        return propertiesOf(reply.instances()[1]);
    }
};

TEST_F(VersionInfoTest, RunningImageIsDescribedByTheVersionService) {
    serve(hostWith(versionSection()));
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(withoutLastStartTime(reply.instances()[0]), primaryProperties());
}

TEST_F(VersionInfoTest, AlternateBankIsReadFromTheFirstBuildLineOfBootCfg) {
    EXPECT_EQ(alternateFrom("bootstate=0\ntitle=Loading\nbuild=6.0.0-3.58.4192238\nbuild=7.0.0-1\n"),
              alternateProperties());
}

TEST_F(VersionInfoTest, BuildTextOfOneNumberIsTheBuildNumber) {
    EXPECT_EQ(alternateFrom("build=6.0.0-4192238\n"), alternateProperties());
}

TEST_F(VersionInfoTest, TrailingBlanksAndCarriageReturnAfterTheBuildTextAreIgnored) {
    EXPECT_EQ(alternateFrom("build=6.0.0-3.58.4192238 \t \r\n"), alternateProperties());
}

TEST_F(VersionInfoTest, LastLineWithoutLineEndIsRead) {
    EXPECT_EQ(alternateFrom("kernel=b.b00\nbuild=6.0.0-3.58.4192238"), alternateProperties());
}

TEST_F(VersionInfoTest, LeadingZeroInABuildNumberGivesMinusOne) {
    const std::vector<NamedValue> alternate = alternateFrom("build=6.0.0-3.58.04192238\n");
    EXPECT_EQ(textOf(alternate, "InstanceID"), "Alt Boot Bank: Orvane Zolti 6.0.0 build-4294967295");
    EXPECT_EQ(textOf(alternate, "VersionString"), "6.0.0 build-4294967295");
    EXPECT_EQ(textOf(alternate, "LargeBuildNumber"), "4294967295");
}

TEST_F(VersionInfoTest, BuildTextNotOfNumbersGivesMinusOne) {
    for (const char* build : {"12x", "3.58", "3.58.4192238.1", "+5", " 5", "3.58.4192238x", ""}) {
        const std::vector<NamedValue> alternate = alternateFrom(std::string("build=6.0.0-") + build + "\n");
        EXPECT_EQ(textOf(alternate, "LargeBuildNumber"), "4294967295") << build;
    }
}

TEST_F(VersionInfoTest, BuildKeyLaterInALineIsNotUsed) {
    const std::vector<NamedValue> alternate = alternateFrom("kernelopt=no build=6.0.0-3.58.4192238\n");
    EXPECT_EQ(textOf(alternate, "InstanceID"), "Alt Boot Bank:   build-0");
}

TEST_F(VersionInfoTest, BootCfgWithoutBuildLineGivesAnAllZeroAlternate) {
    const std::vector<NamedValue> alternate = alternateFrom("bootstate=0\ntitle=Loading\n");
    EXPECT_EQ(alternate, (std::vector<NamedValue>{
                             {"InstanceID", CMPI_string, "Alt Boot Bank:   build-0"},
                             {"Name", CMPI_string, " Alternate Boot Bank"},
                             {"Caption", CMPI_string, " Alternate Boot Bank"},
                             {"Description", CMPI_string, " Alternate Boot Bank"},
                             {"ElementName", CMPI_string, "Alt Boot Bank:   build-0"},
                             {"LargeBuildNumber", CMPI_uint64, "0"},
                             {"VersionString", CMPI_string, " build-0"},
                             {"Manufacturer", CMPI_string, "Orvane, Inc."},
                             {"IsEntity", CMPI_boolean, "true"},
                         }));
}

TEST_F(VersionInfoTest, EmptyBootCfgGivesAnAllZeroAlternate) {
    EXPECT_EQ(textOf(alternateFrom(""), "InstanceID"), "Alt Boot Bank:   build-0");
}

TEST_F(VersionInfoTest, BuildLineWithoutDashGivesAnAllZeroAlternate) {
    EXPECT_EQ(textOf(alternateFrom("build=6.0.0\n"), "InstanceID"), "Alt Boot Bank:   build-0");
}

TEST_F(VersionInfoTest, VersionBeforeTheDashIsKeptAsItStands) {
    const std::vector<NamedValue> alternate = alternateFrom("build=6.5 U1-9\n");
    EXPECT_EQ(textOf(alternate, "InstanceID"), "Alt Boot Bank: Orvane Zolti 6.5 U1 build-9");
    EXPECT_EQ(textOf(alternate, "MajorVersion"), "<absent>");
}

TEST_F(VersionInfoTest, VeryLongBuildLineKeeps31CharactersOfTheVersion) {
    const std::string version(5000, '7');
    const std::vector<NamedValue> alternate = alternateFrom("build=" + version + "-12\n");
    EXPECT_EQ(textOf(alternate, "VersionString"), std::string(31, '7') + " build-12");
}

TEST_F(VersionInfoTest, WithoutBootCfgThereIsNoAlternate) {
    serve(hostWith(versionSection()));
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{kPrimaryId});
}

TEST_F(VersionInfoTest, AlternateIsRereadOnEveryRequest) {
    serve(hostWith(versionSection()));
    writeBootCfg("build=6.0.0-1\n");
    EXPECT_EQ(enumeratedIds(), (std::vector<std::string>{kPrimaryId, "Alt Boot Bank: Orvane Zolti 6.0.0 build-1"}));
    writeBootCfg("build=6.5.0-2\n");
    EXPECT_EQ(enumeratedIds(), (std::vector<std::string>{kPrimaryId, "Alt Boot Bank: Orvane Zolti 6.5.0 build-2"}));
}

TEST_F(VersionInfoTest, UnreadableBootCfgKeepsTheEarlierAlternate) {
    serve(hostWith(versionSection()));
    writeBootCfg("build=6.0.0-1\n");
    EXPECT_EQ(enumeratedIds().size(), 2U);
    removeBootCfg();
    EXPECT_EQ(enumeratedIds(), (std::vector<std::string>{kPrimaryId, "Alt Boot Bank: Orvane Zolti 6.0.0 build-1"}));
}

TEST_F(VersionInfoTest, OffTheHypervisorKernelBootCfgIsNotRead) {
    serve(hostWith(versionSection(), false));
    writeBootCfg("build=6.0.0-1\n");
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{kPrimaryId});
}

TEST_F(VersionInfoTest, OffTheHypervisorKernelAnEarlierAlternateIsKept) {
    serve(hostWith(versionSection()));
    writeBootCfg("build=6.0.0-1\n");
    EXPECT_EQ(enumeratedIds().size(), 2U);
    serve(hostWith(versionSection(), false));
    writeBootCfg("build=6.5.0-2\n");
    EXPECT_EQ(enumeratedIds(), (std::vector<std::string>{kPrimaryId, "Alt Boot Bank: Orvane Zolti 6.0.0 build-1"}));
}

TEST_F(VersionInfoTest, FailingServiceOnTheKernelOfAFreshProviderMakesThePrimaryLookAlternate) {
    serve(hostWith(failingVersionSection()));
    SyslogCapture log;
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    const std::vector<NamedValue> primary = propertiesOf(reply.instances()[0]);
    EXPECT_EQ(textOf(primary, "InstanceID"), "Alt Boot Bank: Orvane Zolti 6.0.0 build-0");
    EXPECT_EQ(textOf(primary, "Name"), "Orvane Zolti Alternate Boot Bank");
    EXPECT_EQ(textOf(primary, "LargeBuildNumber"), "0");
    EXPECT_EQ(textOf(primary, "LastStartTime"), "<absent>");
    EXPECT_EQ(textOf(primary, "ReleaseDate"), "<absent>");
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{{LOG_ERR, kServiceFailureLine}}));
}

TEST_F(VersionInfoTest, FailingServiceAfterASuccessKeepsTheOtherFieldsOfTheEarlierRecord) {
    serve(hostWith(versionSection({.productVersion = "7.1.2", .buildDate = "Feb 29 2016", .talmekBuild = 99})));
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{"Orvane Zolti 7.1.2 build-99"});
    serve(hostWith(failingVersionSection()));
    SyslogCapture log;
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    const std::vector<NamedValue> primary = propertiesOf(reply.instances()[0]);
    EXPECT_EQ(textOf(primary, "InstanceID"), "Orvane Zolti 6.0.0 build-0");
    EXPECT_EQ(textOf(primary, "LargeBuildNumber"), "0");
    EXPECT_EQ(textOf(primary, "ReleaseDate"), "20160229000000.000000+000");
    EXPECT_NE(textOf(primary, "LastStartTime"), "<absent>");
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{{LOG_ERR, kServiceFailureLine}}));
}

TEST_F(VersionInfoTest, FailingServiceOffTheKernelNamesTheOtherProduct) {
    serve(hostWith(versionSection()));
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{kPrimaryId});
    serve(hostWith(failingVersionSection(), false));
    SyslogCapture log;
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{"Orvane Zolt 6.0.0 build-0"});
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{{LOG_ERR, kServiceFailureLine}}));
}

TEST_F(VersionInfoTest, InjectedServiceFaultIsLoggedWithItsOwnTexts) {
    Json fixture = hostWith(versionSection());
    fixture["faults"] = Json::array({{{"call", "TmkuserVersion_GetSystemVersion"}, {"status", 5}, {"errno", 5},
                                      {"message", "I/O error"}, {"nth", 2}}});
    serve(fixture);
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{kPrimaryId});
    SyslogCapture log;
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{"Orvane Zolti 6.0.0 build-0"});
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "Got error from TmkuserVersion_GetSystemVersion (5): I/O error\n"}}));
    EXPECT_EQ(enumeratedIds(), std::vector<std::string>{kPrimaryId});
}

TEST_F(VersionInfoTest, LastStartTimeIsNowLessTheUptimeTakenAtInitialize) {
    serve(hostWith(versionSection()));
    const long long before = std::time(nullptr);
    const orv::host::Reply first = provider().enumerateInstances(kSoftwareClass);
    const long long after = std::time(nullptr);
    ASSERT_EQ(first.instances().size(), 1U);
    const std::optional<long long> started = lastStartSeconds(first.instances()[0]);
    ASSERT_TRUE(started.has_value());
    EXPECT_GE(*started, before - kUptimeSeconds);
    EXPECT_LE(*started, after - kUptimeSeconds);

    Json longer = hostWith(versionSection());
    longer["host"]["uptimeSeconds"] = 5 * kUptimeSeconds;
    serve(longer);
    const orv::host::Reply second = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(second.instances().size(), 1U);
    EXPECT_EQ(lastStartSeconds(second.instances()[0]), started);
}

}  // namespace
}  // namespace swid
