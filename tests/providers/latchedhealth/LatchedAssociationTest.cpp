// "Orvane_LatchedHealthAssociation": from a latched state to its element.
#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using orv::providertest::classNameOf;
using orv::providertest::propertiesOf;

using LatchedAssociationTest = LatchedHealthTest;

TEST_F(LatchedAssociationTest, LatchedStateLeadsToItsElement) {
    serve({device("Orvane_Battery", "bat0", 15)});
    start();
    CMPIObjectPath* path = latchedPath("0");
    const orv::host::Reply reply = references(path);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(classNameOf(reply.instances()[0]), kAssociationClass);
    EXPECT_EQ(propertiesOf(reply.instances()[0]),
              (std::vector<NamedValue>{
                  {"Antecedent", CMPI_ref, "root/cimv2:Orvane_LatchedHealthState.EventId=0"},
                  {"Dependent", CMPI_ref,
                   "root/cimv2:Orvane_Battery.SystemCreationClassName=OMC_UnitaryComputerSystem,"
                   "SystemName=simhost.providers.test,CreationClassName=Orvane_Battery,DeviceID=bat0"}}));
}

TEST_F(LatchedAssociationTest, AssociatorNamesReachTheElement) {
    serve({device("Orvane_DiskDrive", "disk0", 20)});
    start();
    const orv::host::Reply reply =
        provider().core().associatorNames(latchedPath("0"), nullptr, nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.objectPaths().size(), 1U);
    EXPECT_EQ(classNameOf(reply.objectPaths()[0]), "Orvane_DiskDrive");
}

TEST_F(LatchedAssociationTest, RequestFromTheElementYieldsNoResultAndNoError) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    const orv::host::Reply reply = provider().core().references(
        provider().path("Orvane_LatchedHealthState", {}), nullptr, nullptr);
    (void)reply;
    const orv::host::Reply fromSensor =
        references(provider().path("CIM_Sensor", {{"CreationClassName", "CIM_Sensor"}, {"DeviceID", "fan0"}}));
    EXPECT_EQ(fromSensor.rc(), CMPI_RC_OK) << fromSensor.message();
    EXPECT_EQ(fromSensor.items().size(), 0U);
}

TEST_F(LatchedAssociationTest, EventNumberReplacedByEscalationIsNotFound) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    serve({device("CIM_Sensor", "fan0", 25)});
    runPass();
    const orv::host::Reply reply = references(latchedPath("0"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "Requested event id not found");
    EXPECT_EQ(references(latchedPath("1")).instances().size(), 1U);
}

TEST_F(LatchedAssociationTest, AtMostOneAssociationPerRequest) {
    serve({device("CIM_Sensor", "fan0", 10), device("CIM_Sensor", "fan1", 10), device("CIM_Sensor", "fan2", 10)});
    start();
    const orv::host::Reply reply = references(latchedPath("1"));
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(LatchedAssociationTest, LatchedStateWithoutEventIdFails) {
    start();
    const orv::host::Reply reply = references(provider().path(kLatchedClass, {{"Other", "1"}}));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "Invalid event id");
}

}  // namespace
}  // namespace latched
