// The watched hardware classes of the companion library on a simulated host:
// which registration takes which element, the keys it completes, HealthState,
// typed properties, property lists, lookups and platform failures.
#include <cmpift.h>

#include "HwHealthFixture.h"

namespace hwhealth_test {
namespace {

using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

const std::string kSystemKeys =
    std::string("SystemCreationClassName=OMC_UnitaryComputerSystem,SystemName=") + orv::providertest::SimHost::kFqdn;

// Every class the library registers for the watched elements.
const std::vector<std::string> kRegisteredClasses = {
    "CIM_Sensor",         "Orvane_NumericSensor",  "CIM_PhysicalMemory", "Orvane_PhysicalMemory",
    "CIM_Processor",      "CIM_PowerSupply",       "Orvane_PowerSupply", "Orvane_PortController",
    "Orvane_Controller",  "Orvane_Battery",        "Orvane_StorageVolume", "Orvane_StorageExtent",
    "Orvane_DiskDrive",   "Orvane_SASSATAPort",    "Orvane_StoragePool"};

std::vector<Json> threeSensors() {
    return {element("CIM_Sensor", "Orvane_NumericSensor", {{"CreationClassName", "Orvane_NumericSensor"}, {"DeviceID", "temp1"}}, 5),
            element("CIM_Sensor", "CIM_Sensor", {{"CreationClassName", "CIM_Sensor"}, {"DeviceID", "fan0"}}, 10),
            element("CIM_Sensor", "Orvane_NumberedSensor",
                    {{"CreationClassName", "Orvane_NumberedSensor"}, {"DeviceID", "s3"}, {"SensorNumber", 3}}, 15)};
}

using HardwareElementsTest = HwHealthTest;

TEST_F(HardwareElementsTest, EveryClassAnswersAnEmptyEnumerationOnAHostWithoutHardware) {
    serve({});
    for (const std::string& className : kRegisteredClasses) {
        const orv::host::Reply names = provider().enumerateInstanceNames(className);
        EXPECT_EQ(names.rc(), CMPI_RC_OK) << className << ": " << names.message();
        EXPECT_TRUE(names.objectPaths().empty()) << className;
        const orv::host::Reply instances = provider().enumerateInstances(className);
        EXPECT_EQ(instances.rc(), CMPI_RC_OK) << className << ": " << instances.message();
        EXPECT_TRUE(instances.instances().empty()) << className;
    }
}

TEST_F(HardwareElementsTest, EnumerationOfTheWatchedClassReturnsEveryElementOnce) {
    serve(threeSensors());
    const orv::host::Reply reply = provider().enumerateInstanceNames("CIM_Sensor");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    // The watched class's registration first (its elements of other classes),
    // then the library's own subclass.
    EXPECT_EQ(pathsOf(reply), (std::vector<std::string>{
                                  "root/cimv2:CIM_Sensor.CreationClassName=CIM_Sensor,DeviceID=fan0," + kSystemKeys,
                                  "root/cimv2:Orvane_NumberedSensor.CreationClassName=Orvane_NumberedSensor,DeviceID=s3,"
                                  "SensorNumber=3," + kSystemKeys,
                                  "root/cimv2:Orvane_NumericSensor.CreationClassName=Orvane_NumericSensor,DeviceID=temp1," +
                                      kSystemKeys}));
}

TEST_F(HardwareElementsTest, OwnClassTakesItsElementsOnly) {
    serve(threeSensors());
    EXPECT_EQ(pathsOf(provider().enumerateInstanceNames("Orvane_NumericSensor")),
              (std::vector<std::string>{"root/cimv2:Orvane_NumericSensor.CreationClassName=Orvane_NumericSensor,"
                                        "DeviceID=temp1," + kSystemKeys}));
}

TEST_F(HardwareElementsTest, UnregisteredSubclassIsReachedThroughTheWatchedClass) {
    serve(threeSensors());
    EXPECT_EQ(pathsOf(provider().enumerateInstanceNames("Orvane_NumberedSensor")),
              (std::vector<std::string>{"root/cimv2:Orvane_NumberedSensor.CreationClassName=Orvane_NumberedSensor,"
                                        "DeviceID=s3,SensorNumber=3," + kSystemKeys}));
}

TEST_F(HardwareElementsTest, ComputerSystemKeysAreAddedOnlyWhereTheClassHasThemAndTheElementLacksThem) {
    serve({element("Orvane_DiskDrive", "Orvane_DiskDrive",
                   {{"CreationClassName", "Orvane_DiskDrive"}, {"DeviceID", "sda"}, {"SystemName", "elsewhere"}}),
           element("CIM_PhysicalMemory", "Orvane_PhysicalMemory",
                   {{"CreationClassName", "Orvane_PhysicalMemory"}, {"Tag", "DIMM_A1"}}),
           element("Orvane_StoragePool", "Orvane_StoragePool", {{"InstanceID", "md0"}})});
    EXPECT_EQ(pathsOf(provider().enumerateInstanceNames("Orvane_DiskDrive")),
              (std::vector<std::string>{"root/cimv2:Orvane_DiskDrive.CreationClassName=Orvane_DiskDrive,DeviceID=sda,"
                                        "SystemName=elsewhere,SystemCreationClassName=OMC_UnitaryComputerSystem"}));
    EXPECT_EQ(pathsOf(provider().enumerateInstanceNames("CIM_PhysicalMemory")),
              (std::vector<std::string>{"root/cimv2:Orvane_PhysicalMemory.CreationClassName=Orvane_PhysicalMemory,"
                                        "Tag=DIMM_A1"}));
    EXPECT_EQ(pathsOf(provider().enumerateInstanceNames("Orvane_StoragePool")),
              (std::vector<std::string>{"root/cimv2:Orvane_StoragePool.InstanceID=md0"}));
}

TEST_F(HardwareElementsTest, InstanceCarriesKeysHealthStateAndTypedProperties) {
    Json sensor = element("CIM_Sensor", "Orvane_NumericSensor", {{"CreationClassName", "Orvane_NumericSensor"}, {"DeviceID", "temp1"}}, 25);
    sensor["properties"] = Json::parse(R"({"CurrentReading": {"sint32": -12}, "ElementName": "CPU temperature",
        "IsLinear": true, "OperationalStatus": {"uint16[]": [2, 6]}, "PollingInterval": {"uint64": 5000000},
        "SensorType": {"uint16": 2}})");
    serve({sensor});
    const orv::host::Reply reply = provider().enumerateInstances("Orvane_NumericSensor");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]),
              (std::vector<NamedValue>{
                  {"CreationClassName", CMPI_string, "Orvane_NumericSensor"},
                  {"DeviceID", CMPI_string, "temp1"},
                  {"SystemCreationClassName", CMPI_string, "OMC_UnitaryComputerSystem"},
                  {"SystemName", CMPI_string, orv::providertest::SimHost::kFqdn},
                  {"HealthState", CMPI_uint16, "25"},
                  {"CurrentReading", CMPI_sint32, "-12"},
                  {"ElementName", CMPI_string, "CPU temperature"},
                  {"IsLinear", CMPI_boolean, "true"},
                  {"OperationalStatus", CMPI_uint16A, "[2, 6]"},
                  {"PollingInterval", CMPI_uint64, "5000000"},
                  {"SensorType", CMPI_uint16, "2"},
              }));
}

TEST_F(HardwareElementsTest, HealthStateIsAbsentWhenTheHostGivesNoneAndNullWhenItGivesNull) {
    Json nullState = element("Orvane_Battery", "Orvane_Battery", {{"DeviceID", "bat1"}});
    nullState["healthState"] = nullptr;
    serve({element("Orvane_Battery", "Orvane_Battery", {{"DeviceID", "bat0"}}), nullState});
    const orv::host::Reply reply = provider().enumerateInstances("Orvane_Battery");
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(propertyOf(reply.instances()[0], "HealthState"), std::nullopt);
    const std::optional<NamedValue> state = propertyOf(reply.instances()[1], "HealthState");
    ASSERT_TRUE(state.has_value());
    EXPECT_EQ(state->text, "<null>");
    // A NULL of the property's type: sfcb fails to send a value of type CMPI_null.
    EXPECT_EQ(state->type, CMPI_uint16);
}

TEST_F(HardwareElementsTest, PropertyListKeepsTheKeysAndTheListedProperties) {
    Json drive = element("Orvane_DiskDrive", "Orvane_DiskDrive", {{"CreationClassName", "Orvane_DiskDrive"}, {"DeviceID", "sda"}}, 5);
    drive["properties"] = {{"ElementName", "sda"}, {"Caption", "Disk"}};
    serve({drive});
    const orv::host::Reply reply =
        provider().enumerateInstances("Orvane_DiskDrive", std::vector<std::string>{"HealthState"});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(orv::providertest::propertyNamesOf(reply.instances()[0]),
              (std::vector<std::string>{"CreationClassName", "DeviceID", "SystemCreationClassName", "SystemName",
                                        "HealthState"}));
}

TEST_F(HardwareElementsTest, GetInstanceFindsTheElementByItsCompletedPath) {
    serve(threeSensors());
    const orv::host::Reply found = provider().getInstance(
        "Orvane_NumericSensor", {{"CreationClassName", "Orvane_NumericSensor"},
                                 {"DeviceID", "temp1"},
                                 {"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
                                 {"SystemName", orv::providertest::SimHost::kFqdn}});
    ASSERT_EQ(found.rc(), CMPI_RC_OK) << found.message();
    ASSERT_EQ(found.instances().size(), 1U);
    EXPECT_EQ(propertyOf(found.instances()[0], "HealthState")->text, "5");

    const orv::host::Reply missing = provider().getInstance(
        "Orvane_NumericSensor", {{"CreationClassName", "Orvane_NumericSensor"}, {"DeviceID", "temp1"}});
    EXPECT_EQ(missing.rc(), CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(HardwareElementsTest, PlatformFailureFailsTheRequestWithItsMessage) {
    serve({}, Json::object(),
          Json::array({{{"call", "OrvHealth_Elements"}, {"param", "Orvane_DiskDrive"}, {"message", "no disks today"}}}));
    const orv::host::Reply reply = provider().enumerateInstances("Orvane_DiskDrive");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "no disks today");
    EXPECT_EQ(provider().enumerateInstances("Orvane_Battery").rc(), CMPI_RC_OK);
}

}  // namespace
}  // namespace hwhealth_test
