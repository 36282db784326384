// The machine's firmware identity and the typed properties of health
// elements, answered by the sim substitute from its fixture.
#include <gtest/gtest.h>

#include <stdexcept>

#include "FixtureRejection.h"
#include "SimHost.h"
#include "orv/platform/HealthElements.h"
#include "orv/platform/SystemIdentity.h"

namespace orv::platform::test {
namespace {

TEST(SimSystemIdentity, SectionGivesEveryValue)
{
    Json fixture = defaultHost();
    fixture["system"] = {{"vendor", "Orvane Labs"}, {"product", "OL-2000"}, {"serialNumber", "SN-0042"},
                         {"uuid", "4c4c4544-0042-3610-8057-b7c04f563232"}};
    SimHost host(fixture);
    const SystemIdentity identity = systemIdentity();
    EXPECT_EQ(identity.vendor, "Orvane Labs");
    EXPECT_EQ(identity.product, "OL-2000");
    EXPECT_EQ(identity.serialNumber, "SN-0042");
    EXPECT_EQ(identity.uuid, "4c4c4544-0042-3610-8057-b7c04f563232");
}

TEST(SimSystemIdentity, AbsentOrNullValuesAreNotTold)
{
    Json fixture = defaultHost();
    fixture["system"] = {{"vendor", "Orvane Labs"}, {"serialNumber", nullptr}};
    SimHost host(fixture);
    SystemIdentity expected;
    expected.vendor = "Orvane Labs";
    EXPECT_EQ(systemIdentity(), expected);
}

TEST(SimSystemIdentity, AbsentSectionTellsNothing)
{
    SimHost host(defaultHost());
    EXPECT_EQ(systemIdentity(), SystemIdentity{});
}

TEST(SimSystemIdentity, BadSectionIsRejected)
{
    Json fixture = defaultHost();
    fixture["system"] = {{"vendor", "Orvane Labs"}, {"chassis", "tower"}};
    EXPECT_EQ(rejection(fixture), "host.json: $.system: unknown key \"chassis\"");
    fixture["system"] = {{"product", 2000}};
    EXPECT_EQ(rejection(fixture), "host.json: $.system.product: expected a string, got number 2000");
    fixture["system"] = {{"uuid", ""}};
    EXPECT_EQ(rejection(fixture), "host.json: $.system.uuid: must not be empty");
    fixture["system"] = {{"serialNumber", std::string(256, 'x')}};
    EXPECT_NE(rejection(fixture).find("$.system.serialNumber: "), std::string::npos);
}

TEST(SimSystemIdentity, InjectedFailureThrowsItsMessage)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "OrvHost_GetSystemIdentity"}, {"message", "no firmware tables"}});
    SimHost host(fixture);
    try {
        systemIdentity();
        FAIL() << "no failure";
    } catch (const std::runtime_error& error) {
        EXPECT_STREQ(error.what(), "no firmware tables");
    }
}

TEST(SimSystemIdentity, RejectedFixtureThrows)
{
    SimHost host(std::string("{"));
    EXPECT_THROW(systemIdentity(), std::runtime_error);
}

Json sensorWith(const Json& properties)
{
    Json fixture = defaultHost();
    fixture["health"] = Json::array({{{"watchedClass", "CIM_Sensor"},
                                      {"class", "Orvane_NumericSensor"},
                                      {"keys", {{"DeviceID", "temp1"}}},
                                      {"healthState", 5},
                                      {"properties", properties}}});
    return fixture;
}

TEST(SimHealthProperties, ValuesKeepTheirTypesInNameOrder)
{
    SimHost host(sensorWith(Json::parse(R"({"ElementName": "CPU temperature", "IsLinear": true,
        "SensorType": {"uint16": 2}, "PollingInterval": {"uint64": 18446744073709551615},
        "CurrentReading": {"sint32": -40}, "Accuracy": {"sint64": -9000000000},
        "MaxReadable": {"uint32": 4294967295}, "OperationalStatus": {"uint16[]": [2, 3]}})")));
    const std::vector<HealthElement> elements = healthElementsOf("CIM_Sensor");
    ASSERT_EQ(elements.size(), 1u);
    // In the JSON object's name order, as keys are read.
    const std::vector<HealthProperty> expected{
        {"Accuracy", int64_t{-9000000000}},
        {"CurrentReading", int32_t{-40}},
        {"ElementName", std::string("CPU temperature")},
        {"IsLinear", true},
        {"MaxReadable", uint32_t{4294967295u}},
        {"OperationalStatus", std::vector<uint16_t>{2, 3}},
        {"PollingInterval", uint64_t{18446744073709551615u}},
        {"SensorType", uint16_t{2}},
    };
    ASSERT_EQ(elements[0].properties.size(), expected.size());
    for (std::size_t i = 0; i < expected.size(); ++i) {
        EXPECT_EQ(elements[0].properties[i].name, expected[i].name);
        EXPECT_EQ(elements[0].properties[i].value, expected[i].value) << expected[i].name;
    }
}

TEST(SimHealthProperties, AbsentPropertiesAreNone)
{
    Json fixture = sensorWith(Json::object());
    fixture["health"][0].erase("properties");
    SimHost host(fixture);
    const std::vector<HealthElement> elements = healthElementsOf("CIM_Sensor");
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_TRUE(elements[0].properties.empty());
}

TEST(SimHealthProperties, BadValuesAreRejected)
{
    EXPECT_EQ(rejection(sensorWith({{"SensorType", {{"uint8", 2}}}})),
              "host.json: $.health[0].properties.SensorType: unknown property type \"uint8\"");
    EXPECT_EQ(rejection(sensorWith({{"SensorType", {{"uint16", 70000}}}})),
              "host.json: $.health[0].properties.SensorType.uint16: value 70000 out of range [0, 65535]");
    EXPECT_NE(rejection(sensorWith({{"SensorType", {{"uint16", 2}, {"uint32", 2}}}})).find(
                  "$.health[0].properties.SensorType: expected a string, a boolean or one of"),
              std::string::npos);
    EXPECT_NE(rejection(sensorWith({{"CurrentReading", 40}})).find("$.health[0].properties.CurrentReading: "),
              std::string::npos);
}

} // namespace
} // namespace orv::platform::test
