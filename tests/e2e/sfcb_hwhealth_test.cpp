// The companion library's hardware classes with elements, in both brokers:
// a private sfcbd and an orv-cimhost serving both libraries on one simulated
// host that has an element of every watched class (keys the platform left
// incomplete, HealthState absent, null or set, typed properties). Every class
// of the companion's registration, its subclasses and the computer system
// answer the same in both (ein, ei, and gi of each instance).
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <fstream>

#include "broker_answers.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;
using Json = nlohmann::ordered_json;

// One element of every watched class, under this library's class where it has one.
Json healthSection() {
    return Json::parse(R"([
      {"watchedClass": "CIM_Sensor", "class": "Orvane_NumericSensor",
       "keys": {"CreationClassName": "Orvane_NumericSensor", "DeviceID": "hwmon0/temp1"}, "healthState": 25,
       "properties": {"ElementName": "Package id 0", "SensorType": {"uint16": 2}, "BaseUnits": {"uint16": 2},
                      "CurrentReading": {"sint32": -5}, "UpperThresholdCritical": {"sint32": 100},
                      "PollingInterval": {"uint64": 5000000}, "IsLinear": true,
                      "OperationalStatus": {"uint16[]": [2, 6]}}},
      {"watchedClass": "CIM_Sensor", "keys": {"CreationClassName": "CIM_Sensor", "DeviceID": "intrusion"},
       "healthState": null},
      {"watchedClass": "CIM_PhysicalMemory", "class": "Orvane_PhysicalMemory",
       "keys": {"CreationClassName": "Orvane_PhysicalMemory", "Tag": "DIMM_A1"}, "healthState": 10,
       "properties": {"BankLabel": "A1", "Capacity": {"uint64": 17179869184}}},
      {"watchedClass": "CIM_PowerSupply", "class": "Orvane_PowerSupply",
       "keys": {"CreationClassName": "Orvane_PowerSupply", "DeviceID": "PSU1"}, "healthState": 5,
       "properties": {"TotalOutputPower": {"uint32": 750000}}},
      {"watchedClass": "Orvane_PortController", "keys": {"CreationClassName": "Orvane_PortController", "DeviceID": "0000:03:00.0"}, "healthState": 5},
      {"watchedClass": "Orvane_Controller", "keys": {"CreationClassName": "Orvane_Controller", "DeviceID": "0000:00:1f.2"}, "healthState": 5},
      {"watchedClass": "Orvane_Battery", "keys": {"CreationClassName": "Orvane_Battery", "DeviceID": "BAT0"}},
      {"watchedClass": "Orvane_StorageVolume", "keys": {"CreationClassName": "Orvane_StorageVolume", "DeviceID": "dm-0"}, "healthState": 5},
      {"watchedClass": "Orvane_StorageExtent", "keys": {"CreationClassName": "Orvane_StorageExtent", "DeviceID": "sda1"}, "healthState": 5},
      {"watchedClass": "Orvane_DiskDrive", "keys": {"CreationClassName": "Orvane_DiskDrive", "DeviceID": "sda"}, "healthState": 20,
       "properties": {"ElementName": "sda"}},
      {"watchedClass": "Orvane_SASSATAPort", "keys": {"CreationClassName": "Orvane_SASSATAPort", "DeviceID": "ata1"}, "healthState": 5},
      {"watchedClass": "Orvane_StoragePool", "keys": {"InstanceID": "md0"}, "healthState": 15}
    ])");
}

// The companion's registered classes with their subclasses, as both brokers know them.
std::vector<std::string> companionClasses(const orv::repository::ClassRepository& classes) {
    std::vector<std::string> out;
    auto add = [&out](const std::string& name) {
        if (std::find(out.begin(), out.end(), name) == out.end()) {
            out.push_back(name);
        }
    };
    for (const std::string& registered : registeredClasses(sourceDir() + "/companion/mof/orvhwhealth.reg")) {
        add(registered);
        for (const std::string& sub : classes.subclasses("root/cimv2", registered, true)) {
            add(sub);
        }
    }
    return out;
}

class SfcbHardwareHealthTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        base_ = fs::temp_directory_path() / ("orv-sfcb-hwhealth-" + std::to_string(getpid()));
        fs::create_directories(base_);
        std::ifstream example(sourceDir() + "/platform/sim/examples/host.json");
        Json fixture = Json::parse(example);
        fixture["system"] = {{"vendor", "Orvane Labs"}, {"product", "OL-2000"}, {"uuid", "00000000-0000-0000-0000-000000000042"}};
        fixture["health"] = healthSection();
        const std::string file = (base_ / "host.json").string();
        std::ofstream(file) << fixture.dump(2);
        classes_ = new orv::repository::ClassRepository();
        loadServedClasses(*classes_);
        sfcb_ = new SfcbBroker(SfcbBroker::start((base_ / "sfcb").string(), file));
        orv_ = startOrvCimhost(file).release();
        ASSERT_TRUE(orv_->waitReady()) << orv_->output();
    }
    static void TearDownTestSuite() {
        if (orv_ != nullptr) {
            EXPECT_EQ(orv_->stop(SIGTERM), 0) << orv_->output();
        }
        delete orv_;
        if (sfcb_ != nullptr && sfcb_->available()) {
            EXPECT_EQ(sfcb_->healthProblem(), "");
        }
        delete sfcb_;
        delete classes_;
        orv_ = nullptr;
        sfcb_ = nullptr;
        classes_ = nullptr;
        fs::remove_all(base_);
    }
    void SetUp() override {
        ASSERT_NE(orv_, nullptr);
        if (sfcbMissing(*sfcb_)) {
            GTEST_SKIP() << sfcb_->reason();
        }
    }

    static void expectSame(const std::string& command, const std::string& object) {
        const std::string orvAnswer = wbemcli(orv_->port(), command + " -nl", object);
        const std::string sfcbAnswer = wbemcli(sfcb_->port(), command + " -nl", object);
        EXPECT_EQ(compareAnswers(orvAnswer, sfcbAnswer, *classes_), "") << "wbemcli " << command << " " << object;
    }

    static fs::path base_;
    static orv::repository::ClassRepository* classes_;
    static SfcbBroker* sfcb_;
    static HostProcess* orv_;
};

fs::path SfcbHardwareHealthTest::base_;
orv::repository::ClassRepository* SfcbHardwareHealthTest::classes_ = nullptr;
SfcbBroker* SfcbHardwareHealthTest::sfcb_ = nullptr;
HostProcess* SfcbHardwareHealthTest::orv_ = nullptr;

TEST_F(SfcbHardwareHealthTest, EveryClassAndEveryInstanceAnswersTheSameInBothBrokers) {
    const std::vector<std::string> classes = companionClasses(*classes_);
    ASSERT_GE(classes.size(), 16U);
    std::size_t instances = 0;
    for (const std::string& className : classes) {
        expectSame("ein", className);
        expectSame("ei", className);
        const std::string names = wbemcli(orv_->port(), "ein", className);
        std::istringstream lines(names);
        for (std::string line; std::getline(lines, line);) {
            const std::size_t at = line.find("root/cimv2:");
            if (at != std::string::npos) {
                expectSame("gi", line.substr(at + 11));
                ++instances;
            }
        }
    }
    // Every element is reached at least through its own class and its watched class.
    EXPECT_GE(instances, 12U);
}

TEST_F(SfcbHardwareHealthTest, WatchedSchemaClassesReachEveryElementOnceInBothBrokers) {
    for (int port : {orv_->port(), sfcb_->port()}) {
        const std::vector<WbemcliObject> sensors = parseWbemcliAnswer(wbemcli(port, "ein -nl", "CIM_Sensor"));
        EXPECT_EQ(sensors.size(), 2U) << "port " << port;
        const std::vector<WbemcliObject> memory = parseWbemcliAnswer(wbemcli(port, "ein -nl", "CIM_PhysicalMemory"));
        EXPECT_EQ(memory.size(), 1U) << "port " << port;
    }
}

}  // namespace
}  // namespace orv::e2e
