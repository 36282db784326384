// The three operations of the hypervisor software identity provider: names,
// instances, lookup by InstanceID, property lists, refused classes and their
// log lines, and the release date as the provider renders it.
#include <syslog.h>

#include <orv/testsupport/StderrCapture.h>
#include <orv/testsupport/SyslogCapture.h>

#include "SwidFixture.h"
#include "orv/providertest/RegistrationFile.h"

namespace swid {
namespace {

using orv::providertest::classNameOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyNamesOf;
using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

class SoftwareIdentityTest : public SwidTest {
protected:
    void serveWithAlternate() {
        serve(hostWith(versionSection()));
        writeBootCfg("build=6.0.0-3.58.4192238\n");
    }

    std::string releaseDateOf(const std::string& buildDate) {
        serve(hostWith(versionSection({.buildDate = buildDate})));
        const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", kPrimaryId}});
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        return reply.instances().size() == 1 ? textOf(propertiesOf(reply.instances()[0]), "ReleaseDate") : "<none>";
    }

    // A core where requests for CIM_SoftwareIdentity reach this provider.
    void routeParentClassToTheProvider() {
        const std::filesystem::path file = scratchFile("orv-swid-parent.reg");
        orv::providertest::writeRegistrationFile(file, {{"CIM_SoftwareIdentity", "HypervisorSoftwareIdentity"}});
        restartCore({.projectRegistrations = false, .registrations = {file}});
        std::filesystem::remove(file);
    }
};

TEST_F(SoftwareIdentityTest, NamesArePrimaryThenAlternateInTheRequestNamespace) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().enumerateInstanceNames(kSoftwareClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(instanceIdsOf(reply), (std::vector<std::string>{kPrimaryId, kAlternateId}));
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        EXPECT_EQ(classNameOf(path), kSoftwareClass);
        EXPECT_EQ(orv::providertest::nameSpaceOf(path), "root/cimv2");
    }
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(SoftwareIdentityTest, InstancesArePrimaryThenAlternate) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(withoutLastStartTime(reply.instances()[0]), primaryProperties());
    EXPECT_TRUE(lastStartSeconds(reply.instances()[0]).has_value());
    EXPECT_EQ(propertiesOf(reply.instances()[1]), alternateProperties());
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(SoftwareIdentityTest, PropertyListKeepsTheKey) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass, std::vector<std::string>{"Name"});
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]), (std::vector<std::string>{"InstanceID", "Name"}));
    const orv::host::Reply one =
        provider().getInstance(kSoftwareClass, {{"InstanceID", kPrimaryId}}, std::vector<std::string>{"LastStartTime"});
    ASSERT_EQ(one.instances().size(), 1U);
    EXPECT_EQ(propertyNamesOf(one.instances()[0]), (std::vector<std::string>{"InstanceID", "LastStartTime"}));
}

TEST_F(SoftwareIdentityTest, GetInstanceFindsThePrimary) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", kPrimaryId}});
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(withoutLastStartTime(reply.instances()[0]), primaryProperties());
    EXPECT_EQ(classNameOf(reply.instances()[0]), kSoftwareClass);
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(SoftwareIdentityTest, GetInstanceFindsTheAlternate) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", kAlternateId}});
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), alternateProperties());
}

TEST_F(SoftwareIdentityTest, UnknownInstanceIdIsLoggedAndNotFound) {
    serveWithAlternate();
    SyslogCapture log;
    const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", "Orvane Zolti 5.5.0 build-1"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "Orvane_HypervisorSoftwareIdentityProvider::getInstance: Software instance "
                                         "not found with InstanceID = Orvane Zolti 5.5.0 build-1"}}));
}

TEST_F(SoftwareIdentityTest, UnknownInstanceIdWithoutAnAlternateIsLoggedAndNotFound) {
    serve(hostWith(versionSection(), false));
    SyslogCapture log;
    const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", kAlternateId}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, std::string("Orvane_HypervisorSoftwareIdentityProvider::getInstance: "
                                                     "Software instance not found with InstanceID = ") +
                                             kAlternateId}}));
}

TEST_F(SoftwareIdentityTest, OtherClassIsRefusedByEnumInstanceNames) {
    routeParentClassToTheProvider();
    serve(hostWith(versionSection()));
    SyslogCapture log;
    const orv::host::Reply reply = provider().enumerateInstanceNames("CIM_SoftwareIdentity");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_TRUE(reply.objectPaths().empty());
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "Orvane_HypervisorSoftwareIdentityProvider::enumInstanceNames was for "
                                         "CIM_SoftwareIdentity, not the One True Class, "
                                         "Orvane_HypervisorSoftwareIdentity."}}));
}

TEST_F(SoftwareIdentityTest, OtherClassIsRefusedByGetInstance) {
    routeParentClassToTheProvider();
    serve(hostWith(versionSection()));
    SyslogCapture log;
    const orv::host::Reply reply = provider().getInstance("CIM_SoftwareIdentity", {{"InstanceID", kPrimaryId}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "Orvane_HypervisorSoftwareIdentityProvider::getInstance was for "
                                         "CIM_SoftwareIdentity, not the One True Class, "
                                         "Orvane_HypervisorSoftwareIdentity."}}));
}

TEST_F(SoftwareIdentityTest, OtherClassIsRefusedByEnumInstances) {
    routeParentClassToTheProvider();
    serve(hostWith(versionSection()));
    SyslogCapture log;
    const orv::host::Reply reply = provider().enumerateInstances("CIM_SoftwareIdentity");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "ERR: Orvane_HypervisorSoftwareIdentityProvider::enumInstances::Throwing "
                                         "not supported error!!!!!"}}));
}

TEST_F(SoftwareIdentityTest, ReleaseDateIsLocalMidnightOfTheBuildDate) {
    EXPECT_EQ(releaseDateOf("Jul 5 2016"), "20160705000000.000000+000");
    EXPECT_EQ(releaseDateOf("Dec 31 1999"), "19991231000000.000000+000");
    EXPECT_EQ(releaseDateOf("Feb 29 2016"), "20160229000000.000000+000");
    EXPECT_EQ(releaseDateOf("Jan 1 1970"), "19700101000000.000000+000");
}

TEST_F(SoftwareIdentityTest, ReleaseDateIsStandardTimeMidnightWhereDaylightSavingApplies) {
    setTimeZone("CET-1CEST,M3.5.0,M10.5.0/3");
    EXPECT_EQ(releaseDateOf("Jul 5 2016"), "20160704230000.000000+000");
    EXPECT_EQ(releaseDateOf("Jan 5 2016"), "20160104230000.000000+000");
    setTimeZone("EST5EDT,M3.2.0,M11.1.0");
    EXPECT_EQ(releaseDateOf("Aug 15 2016"), "20160815050000.000000+000");
}

TEST_F(SoftwareIdentityTest, ReleaseDateYearBefore1901IsTakenAsYearsSince1900) {
    EXPECT_EQ(releaseDateOf("Jul 5 116"), "20160705000000.000000+000");
}

TEST_F(SoftwareIdentityTest, ReleaseDateMonthInLowerCaseIsJanuary) {
    EXPECT_EQ(releaseDateOf("jul 5 2016"), "20160105000000.000000+000");
    EXPECT_EQ(releaseDateOf("Sept 5 2016"), "20160905000000.000000+000");
}

TEST_F(SoftwareIdentityTest, ReleaseDateNeedsMonthDayAndYear) {
    EXPECT_EQ(releaseDateOf("Jul 2016"), "<absent>");
    EXPECT_EQ(releaseDateOf(""), "<absent>");
    EXPECT_EQ(releaseDateOf("Jul five 2016"), "<absent>");
}

TEST_F(SoftwareIdentityTest, AlternateNeverHasLastStartTimeOrReleaseDate) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().getInstance(kSoftwareClass, {{"InstanceID", kAlternateId}});
    ASSERT_EQ(reply.instances().size(), 1U);
    const std::vector<NamedValue> alternate = propertiesOf(reply.instances()[0]);
    EXPECT_EQ(textOf(alternate, "LastStartTime"), "<absent>");
    EXPECT_EQ(textOf(alternate, "ReleaseDate"), "<absent>");
}

TEST_F(SoftwareIdentityTest, VersionNumbersNeedThreeNumbers) {
    serve(hostWith(versionSection({.productVersion = "6.5"})));
    const orv::host::Reply reply = provider().enumerateInstances(kSoftwareClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    const std::vector<NamedValue> primary = propertiesOf(reply.instances()[0]);
    EXPECT_EQ(textOf(primary, "MajorVersion"), "<absent>");
    EXPECT_EQ(textOf(primary, "MinorVersion"), "<absent>");
    EXPECT_EQ(textOf(primary, "RevisionNumber"), "<absent>");
    EXPECT_EQ(textOf(primary, "VersionString"), "6.5 build-4192238");
}

TEST_F(SoftwareIdentityTest, InstanceFactoryWritesItsTraceLine) {
    serve(hostWith(versionSection()));
    orv::testsupport::StderrCapture capture;
    const orv::host::Reply reply = provider().enumerateInstanceNames(kSoftwareClass);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
}

}  // namespace
}  // namespace swid
