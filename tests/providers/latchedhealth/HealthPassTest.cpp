// The health pass: latching, escalation, the roll-up, and what a pass does
// with classes and elements it cannot handle.
#include <syslog.h>

#include <orv/testsupport/SyslogCapture.h>

#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

using HealthPassTest = LatchedHealthTest;

TEST_F(HealthPassTest, UnknownStateLatchesEscalatesAndNeverGoesBack) {
    serve({device("Orvane_DiskDrive", "disk0", 0)});
    start();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "Orvane_DiskDrive", "0"}}));

    serve({device("Orvane_DiskDrive", "disk0", 10)});
    runPass();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"1", "Orvane_DiskDrive", "10"}}));

    serve({device("Orvane_DiskDrive", "disk0", 5)});
    runPass();
    serve({device("Orvane_DiskDrive", "disk0", 0)});
    runPass();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"1", "Orvane_DiskDrive", "10"}}));
}

TEST_F(HealthPassTest, EventNumbersGrowByOnePerLatchOrEscalationAcrossRecords) {
    serve({device("CIM_Sensor", "fan0", 10), device("Orvane_Battery", "bat0", 15)});
    start();
    serve({device("CIM_Sensor", "fan0", 20), device("Orvane_Battery", "bat0", 15),
           device("Orvane_StoragePool", "pool0", 25)});
    runPass();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"2", "CIM_Sensor", "20"},
                                               {"1", "Orvane_Battery", "15"},
                                               {"3", "Orvane_StoragePool", "25"}}));
}

TEST_F(HealthPassTest, InstanceWithoutHealthStateNeitherLatchesNorCountsInTheRollup) {
    serve({device("CIM_Sensor", "fan0", std::nullopt), nullState(device("CIM_PowerSupply", "psu0", std::nullopt))});
    start();
    EXPECT_EQ(latched(), std::vector<Latched>{});
    EXPECT_EQ(rollup(), "0");
}

TEST_F(HealthPassTest, RollupCountsOkInstancesToo) {
    serve({device("CIM_Sensor", "fan0", 5)});
    start();
    EXPECT_EQ(latched(), std::vector<Latched>{});
    EXPECT_EQ(rollup(), "5");
}

TEST_F(HealthPassTest, RollupBecomesZeroWithNoInstancesAtAll) {
    serve({device("CIM_Sensor", "fan0", 20)});
    start();
    EXPECT_EQ(rollup(), "20");
    serve({});
    runPass();
    EXPECT_EQ(rollup(), "0");
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "CIM_Sensor", "20"}}));
}

TEST_F(HealthPassTest, RollupReflectsOnlyTheLastPassWhileTheRecordStays) {
    serve({device("Orvane_StorageVolume", "vol0", 20), device("CIM_Processor", "cpu0", 5)});
    start();
    EXPECT_EQ(rollup(), "20");
    serve({device("Orvane_StorageVolume", "vol0", 5), device("CIM_Processor", "cpu0", 10)});
    runPass();
    EXPECT_EQ(rollup(), "10");
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "Orvane_StorageVolume", "20"}, {"1", "CIM_Processor", "10"}}));
}

TEST_F(HealthPassTest, ClassThatCannotBeEnumeratedLogsOneLinePerPassAndThePassGoesOn) {
    SyslogCapture log;
    serve({device("Orvane_Battery", "bat0", 10), device("Orvane_StoragePool", "pool0", 10)},
          Json::array({{{"call", "OrvHealth_Elements"}, {"param", "Orvane_Battery"}}}));
    start();
    runPass();
    const SyslogLine line{LOG_ERR, "Failed to check health status of class Orvane_Battery\n"};
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{line, line}));
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "Orvane_StoragePool", "10"}}));
}

TEST_F(HealthPassTest, ElementWithNonStringKeyLogsTwoLinesEveryPassAndIsNeverLatched) {
    SyslogCapture log;
    Json sensor = element("CIM_Sensor", {{"CreationClassName", "Orvane_NumberedSensor"}, {"DeviceID", "sensor3"},
                                         {"SensorNumber", 3}, {"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
                                         {"SystemName", "simhost"}}, 15);
    sensor["class"] = "Orvane_NumberedSensor";
    serve({sensor});
    start();
    runPass();
    const std::vector<SyslogLine> onePass{
        {LOG_ERR, "Orvane_NumberedSensor has a non string key, this in not supported\n"},
        {LOG_ERR, "Failed to copy object, dropping health state 15 for Orvane_NumberedSensor\n"}};
    std::vector<SyslogLine> twoPasses = onePass;
    twoPasses.insert(twoPasses.end(), onePass.begin(), onePass.end());
    EXPECT_EQ(log.lines(), twoPasses);
    EXPECT_EQ(latched(), std::vector<Latched>{});
    EXPECT_EQ(rollup(), "15");
}

// A storage pool: the serving library completes the keys of system-scoped
// classes only, so its path stays without keys.
TEST_F(HealthPassTest, ElementWithoutKeysIsDroppedWithOneLine) {
    SyslogCapture log;
    serve({element("Orvane_StoragePool", Json::object(), 20)});
    start();
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "Failed to copy object, dropping health state 20 for Orvane_StoragePool\n"}}));
    EXPECT_EQ(latched(), std::vector<Latched>{});
}

TEST_F(HealthPassTest, EveryWatchedClassIsRead) {
    const std::vector<std::string> classes{
        "CIM_Sensor",         "CIM_PhysicalMemory",   "CIM_Processor",      "CIM_PowerSupply",
        "Orvane_PortController", "Orvane_Controller", "Orvane_Battery",     "Orvane_StorageVolume",
        "Orvane_StorageExtent",  "Orvane_DiskDrive",  "Orvane_SASSATAPort", "Orvane_StoragePool"};
    std::vector<Json> elements;
    std::vector<Latched> expected;
    // Listed backwards: the records follow the table's order, not the host's.
    for (auto it = classes.rbegin(); it != classes.rend(); ++it) {
        elements.push_back(device(*it, *it + ":1", 10));
    }
    for (std::size_t i = 0; i < classes.size(); ++i) {
        expected.push_back({std::to_string(i), classes[i], "10"});
    }
    serve(elements);
    start();
    EXPECT_EQ(latched(), expected);
}

// Elements whose paths are equal but whose class names differ in letter case
// are told apart by the case-sensitive class name comparison: each gets its
// own record, and later passes find each its own.
TEST_F(HealthPassTest, ClassNamesDifferingInCaseLatchTwoRecords) {
    Json lower = element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10);
    lower["class"] = "cim_sensor";
    serve({element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10), lower});
    start();
    Json lowerWorse = lower;
    lowerWorse["healthState"] = 20;
    serve({element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10), lowerWorse});
    runPass();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "CIM_Sensor", "10"}, {"2", "cim_sensor", "20"}}));
}

TEST_F(HealthPassTest, FailingThreadMemoryReleaseIsIgnored) {
    SyslogCapture log;
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    serve({device("CIM_Sensor", "fan0", 20)});
    FailingReleaseContext context;
    runPassWith(context.get());
    EXPECT_EQ(latched(), (std::vector<Latched>{{"1", "CIM_Sensor", "20"}}));
    EXPECT_EQ(log.lines(), std::vector<SyslogLine>{});
}

}  // namespace
}  // namespace latched
