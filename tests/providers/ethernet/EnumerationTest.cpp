// Enumeration of the fifteen classes: instances and names, NIC order, class
// names in any letter case, the property list, and the failures.
#include "EthernetFixture.h"

#include <algorithm>

#include "orv/platform/simgen/HostGenerator.h"

namespace ethernet {
namespace {

using orv::providertest::classNamesOf;
using orv::providertest::keysOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyNamesOf;

class EnumerationTest : public EthernetTest {
protected:
    void serveTwoNics() { serve(hostWith({nic("vmnic0"), nic("vmnic1")})); }
};

TEST_F(EnumerationTest, EveryClassGivesOneItemPerNicInNicOrderThenDone) {
    serveTwoNics();
    for (const std::string& cls : servedClasses()) {
        Reply reply = provider().enumerateInstances(cls);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << cls;
        EXPECT_EQ(reply.doneCount(), 1u) << cls;
        EXPECT_EQ(reply.items().size(), 2u) << cls;
        EXPECT_EQ(classNamesOf(reply), (std::vector<std::string>{cls, cls})) << cls;
    }
}

TEST_F(EnumerationTest, PortNamesCarryTheFourKeysDeviceIdFirst) {
    serveTwoNics();
    Reply reply = provider().enumerateInstanceNames(kPort);
    ASSERT_EQ(reply.objectPaths().size(), 2u);
    EXPECT_EQ(keysOf(reply.objectPaths()[1]),
              (std::vector<NamedValue>{{"DeviceID", CMPI_string, "vmnic1"},
                                       {"SystemCreationClassName", CMPI_string, kSystemClass},
                                       {"SystemName", CMPI_string, orv::providertest::SimHost::kFqdn},
                                       {"CreationClassName", CMPI_string, kPort}}));
}

TEST_F(EnumerationTest, FarEndNamesCarryTheirInstanceIdOnly) {
    serveTwoNics();
    for (const FarEnd& row : farEnds()) {
        Reply reply = provider().enumerateInstanceNames(row.className);
        ASSERT_EQ(reply.objectPaths().size(), 2u) << row.className;
        EXPECT_EQ(keysOf(reply.objectPaths()[0]),
                  (std::vector<NamedValue>{{"InstanceID", CMPI_string, instanceId(row.className, "vmnic0")}}));
    }
}

TEST_F(EnumerationTest, AssociationNamesCarryThePortReferenceThenTheFarEnd) {
    serveTwoNics();
    for (const FarEnd& row : farEnds()) {
        Reply reply = provider().enumerateInstanceNames(row.assocClass);
        ASSERT_EQ(reply.objectPaths().size(), 2u) << row.assocClass;
        EXPECT_EQ(keysOf(reply.objectPaths()[1]),
                  (std::vector<NamedValue>{{row.portRole, CMPI_ref, portRefText("vmnic1")},
                                           {row.farRole, CMPI_ref, farEndRefText(row.className, "vmnic1")}}))
            << row.assocClass;
    }
}

TEST_F(EnumerationTest, SoftwareIdentityAssociationInstancesCarryTheirStatus) {
    serveTwoNics();
    for (const char* cls : {"Orvane_EPDriverElementSoftwareIdentity", "Orvane_EPFirmwareElementSoftwareIdentity"}) {
        Reply reply = provider().enumerateInstances(cls);
        ASSERT_EQ(reply.instances().size(), 2u);
        const std::string identity = std::string(cls) == "Orvane_EPDriverElementSoftwareIdentity"
                                         ? "Orvane_EPDriverSoftwareIdentity"
                                         : "Orvane_EPFirmwareSoftwareIdentity";
        EXPECT_EQ(propertiesOf(reply.instances()[0]),
                  (std::vector<NamedValue>{{"Dependent", CMPI_ref, portRefText("vmnic0")},
                                           {"Antecedent", CMPI_ref, farEndRefText(identity, "vmnic0")},
                                           {"ElementSoftwareStatus", CMPI_uint16A, "[2]"}}));
    }
}

TEST_F(EnumerationTest, StatisticsAssociationInstancesCarryTheTwoReferencesOnly) {
    serveTwoNics();
    Reply reply = provider().enumerateInstances("Orvane_EPStatistics");
    ASSERT_EQ(reply.instances().size(), 2u);
    EXPECT_EQ(propertiesOf(reply.instances()[1]),
              (std::vector<NamedValue>{{"Element", CMPI_ref, portRefText("vmnic1")},
                                       {"Stats", CMPI_ref, farEndRefText("Orvane_EPStatisticalInformation", "vmnic1")}}));
}

// The provider hands the setting-data associations over as paths even when
// instances are asked for; the binding delivers instances made from them.
TEST_F(EnumerationTest, SettingDataAssociationInstancesCarryTheTwoReferences) {
    serveTwoNics();
    for (const FarEnd& row : farEnds()) {
        if (std::string(row.portRole) != "ManagedElement") continue;
        Reply reply = provider().enumerateInstances(row.assocClass);
        EXPECT_EQ(reply.objectPaths().size(), 0u) << row.assocClass;
        ASSERT_EQ(reply.instances().size(), 2u) << row.assocClass;
        EXPECT_EQ(propertiesOf(reply.instances()[1]),
                  (std::vector<NamedValue>{{"ManagedElement", CMPI_ref, portRefText("vmnic1")},
                                           {"SettingData", CMPI_ref, farEndRefText(row.className, "vmnic1")}}));
        EXPECT_EQ(keysOf(reply.instances()[0]->ft->getObjectPath(reply.instances()[0], nullptr)),
                  (std::vector<NamedValue>{{"ManagedElement", CMPI_ref, portRefText("vmnic0")},
                                           {"SettingData", CMPI_ref, farEndRefText(row.className, "vmnic0")}}));
    }
}

TEST_F(EnumerationTest, PropertyListFiltersThePortButNotTheStatistics) {
    serveTwoNics();
    Reply port = provider().enumerateInstances(kPort, std::vector<std::string>{"Speed", "DeviceID"});
    ASSERT_EQ(port.instances().size(), 2u);
    // The broker keeps the class's keys whatever the list says.
    EXPECT_EQ(propertyNamesOf(port.instances()[0]),
              (std::vector<std::string>{"DeviceID", "SystemCreationClassName", "SystemName", "CreationClassName",
                                        "Speed"}));
    Reply stats = provider().enumerateInstances("Orvane_EPStatisticalInformation", std::vector<std::string>{"Name"});
    ASSERT_EQ(stats.instances().size(), 2u);
    EXPECT_EQ(propertyNamesOf(stats.instances()[0]).size(), 24u);
}

TEST_F(EnumerationTest, ClassNamesAreMatchedWithoutRegardToCase) {
    serveTwoNics();
    Reply reply = provider().enumerateInstances("orvane_ethernetport");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 2u);
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "Name")->text, "vmnic0");
}

TEST_F(EnumerationTest, HostWithoutNicsGivesEmptySuccessForEveryClass) {
    serve(hostWith({}));
    for (const std::string& cls : servedClasses()) {
        for (bool names : {false, true}) {
            Reply reply = names ? provider().enumerateInstanceNames(cls) : provider().enumerateInstances(cls);
            EXPECT_EQ(reply.rc(), CMPI_RC_OK) << cls;
            EXPECT_TRUE(reply.items().empty()) << cls;
            EXPECT_EQ(reply.doneCount(), 1u) << cls;
        }
    }
}

// The size the benchmark measures: past 506 NICs a generated host needs a
// second PCI segment.
TEST_F(EnumerationTest, GeneratedHostOf1024NicsGivesEveryClassOneItemPerNic) {
    orv::platform::simgen::HostShape shape;
    shape.nics = 1024;
    serve(orv::platform::simgen::generateHost(shape));
    for (const std::string& cls : servedClasses()) {
        Reply reply = provider().enumerateInstances(cls);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << cls << ": " << reply.message();
        EXPECT_EQ(reply.items().size(), 1024u) << cls;
    }
    Reply last = provider().getInstance(kPort, {{"DeviceID", "vmnic1023"}});
    ASSERT_EQ(last.instances().size(), 1u);
    EXPECT_EQ(orv::providertest::propertyOf(last.instances()[0], "DeviceID")->text, "vmnic1023");
}

TEST_F(EnumerationTest, FailedNicListFailsWithoutDone) {
    serve(hostWith({nic("vmnic0")}, Json::array({fault("GetPnics")})));
    for (const std::string& cls : servedClasses()) {
        for (bool names : {false, true}) {
            Reply reply = names ? provider().enumerateInstanceNames(cls) : provider().enumerateInstances(cls);
            EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED) << cls;
            EXPECT_EQ(reply.message(), "Failed to get pnics information") << cls;
            EXPECT_EQ(reply.doneCount(), 0u) << cls;
            EXPECT_TRUE(reply.items().empty()) << cls;
        }
    }
}

// A NIC whose name cannot be read fails the request; what was delivered
// before stays delivered.
TEST_F(EnumerationTest, NameFailureOutsideTheFillsKeepsEarlierItemsAndFails) {
    serve(hostWith({nic("vmnic0"), nic("vmnic1")}, Json::array({fault("GetName", "vmnic1")})));
    for (const std::string& cls : servedClasses()) {
        Reply reply = provider().enumerateInstances(cls);
        EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED) << cls;
        EXPECT_EQ(reply.message(), "Failed to get pnics information") << cls;
        EXPECT_EQ(reply.doneCount(), 0u) << cls;
        EXPECT_EQ(reply.items().size(), 1u) << cls;
    }
}

TEST_F(EnumerationTest, ChangesAreRefusedWithoutMessage) {
    serveTwoNics();
    CMPIObjectPath* port = portPath("vmnic0");
    CMPIInstance* instance = provider().broker()->eft->newInstance(provider().broker(), port, nullptr);
    Reply created = core().createInstance(port, instance);
    EXPECT_EQ(created.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(created.message(), "");
    Reply modified = core().modifyInstance(port, instance);
    EXPECT_EQ(modified.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(modified.message(), "");
    Reply deleted = core().deleteInstance(port);
    EXPECT_EQ(deleted.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(deleted.message(), "");
    EXPECT_TRUE(deleted.items().empty());
}

}  // namespace
}  // namespace ethernet
