// The companion library (liborvhwhealth.so) in orv-cimhost beside the
// project's library, queried by wbemcli: on this machine through the Linux
// substitute (every class answers, empty where the machine lacks the
// hardware; the computer system is there and the installed hypervisor image
// leads to it), and on a simulated host whose failing disk and overheated
// sensor the latched health state latches.
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <regex>
#include <thread>

#include "host_process.hpp"

namespace orv::e2e {
namespace {

using Json = nlohmann::ordered_json;

std::string companionFile(const char* name) { return sourceDir() + "/companion/mof/" + name; }

std::vector<std::string> companionClasses() { return registeredClasses(companionFile("orvhwhealth.reg")); }

// Both libraries with their registrations and classes, and `more` arguments.
std::vector<std::string> hostArgs(std::vector<std::string> more) {
    std::vector<std::string> args{"--provider-dir", buildDir() + "/lib",
                                  "--registration", sourceDir() + "/cim/mof/orvprovider.reg",
                                  "--registration", companionFile("orvhwhealth.reg"),
                                  "--mof",          sourceDir() + "/cim/mof/orvprovider.mof",
                                  "--mof",          companionFile("orvhwhealth.mof")};
    args.insert(args.end(), more.begin(), more.end());
    return args;
}

std::string wbemcli(int port, const std::string& operation, const std::string& object) {
    return runCommand("timeout 30 wbemcli " + operation + " 'http://localhost:" + std::to_string(port) +
                      "/root/cimv2:" + object + "'");
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        if (!line.empty()) {
            lines.push_back(line);
        }
    }
    return lines;
}

// The object of an instance name wbemcli printed ("host:port/ns:Class.keys"), for a next request.
std::string objectOf(const std::string& nameLine) {
    const std::size_t at = nameLine.find("root/cimv2:");
    return at == std::string::npos ? "" : nameLine.substr(at + 11);
}

// wbemcli marks a failed operation with a line starting with "*".
void expectClean(const std::string& output, const std::string& what) {
    EXPECT_EQ(output.find("*"), std::string::npos) << what << ": " << output;
}

class CompanionOnLinux : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        unsetenv("ORV_PLATFORM");
        unsetenv("ORV_SIM_FIXTURE");
        host_ = new HostProcess(hostArgs({}));
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0) << host_->output();
        delete host_;
        host_ = nullptr;
    }
    static HostProcess* host_;
};

HostProcess* CompanionOnLinux::host_ = nullptr;

TEST_F(CompanionOnLinux, EveryClassAnswersWithoutAnError) {
    const std::vector<std::string> classes = companionClasses();
    ASSERT_EQ(classes.size(), 16U);
    for (const std::string& className : classes) {
        expectClean(wbemcli(host_->port(), "ein", className), "ein " + className);
        expectClean(wbemcli(host_->port(), "ei", className), "ei " + className);
    }
}

TEST_F(CompanionOnLinux, ComputerSystemIsTheOneInstanceWithThisMachinesNames) {
    const std::vector<std::string> names = linesOf(wbemcli(host_->port(), "ein", "OMC_UnitaryComputerSystem"));
    ASSERT_EQ(names.size(), 1U);
    const std::string instance = wbemcli(host_->port(), "ei", "OMC_UnitaryComputerSystem");
    char hostName[256] = {};
    ASSERT_EQ(gethostname(hostName, sizeof hostName - 1), 0);
    EXPECT_NE(instance.find(std::string("ElementName=\"") + hostName + "\""), std::string::npos) << instance;
    EXPECT_NE(instance.find("CreationClassName=\"OMC_UnitaryComputerSystem\""), std::string::npos) << instance;
    EXPECT_TRUE(std::regex_search(instance, std::regex("HealthState=(0|5|10|15|20|25|30)"))) << instance;
    // The firmware's vendor, where this machine lets it be read.
    std::ifstream vendorFile("/sys/class/dmi/id/sys_vendor");
    std::string vendor;
    if (std::getline(vendorFile, vendor) && !vendor.empty()) {
        EXPECT_NE(instance.find(vendor), std::string::npos) << instance;
    }
}

TEST_F(CompanionOnLinux, HypervisorIdentityLeadsToTheComputerSystem) {
    const std::vector<std::string> identities =
        linesOf(wbemcli(host_->port(), "ein", "Orvane_HypervisorSoftwareIdentity"));
    ASSERT_FALSE(identities.empty());
    const std::string system = linesOf(wbemcli(host_->port(), "ein", "OMC_UnitaryComputerSystem")).at(0);
    const std::string associated =
        wbemcli(host_->port(), "ain -ac Orvane_InstalledSoftwareIdentity", objectOf(identities[0]));
    expectClean(associated, "ain");
    EXPECT_EQ(linesOf(associated).size(), 1U) << associated;
    EXPECT_NE(associated.find("OMC_UnitaryComputerSystem"), std::string::npos) << associated;
    const std::string instances =
        wbemcli(host_->port(), "ai -ac Orvane_InstalledSoftwareIdentity", objectOf(identities[0]));
    EXPECT_NE(instances.find("ElementName="), std::string::npos) << instances;
}

// A simulated host with a failing disk and a sensor over its critical limit.
class CompanionOnSimulatedHost : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        folder_ = std::filesystem::temp_directory_path() / ("orv-hwhealth-e2e-" + std::to_string(getpid()));
        std::filesystem::create_directories(folder_);
        std::ifstream example(sourceDir() + "/platform/sim/examples/host.json");
        Json fixture = Json::parse(example);
        fixture["system"] = {{"vendor", "Orvane Labs"}, {"product", "OL-2000"}, {"serialNumber", "SN-0042"}};
        fixture["health"] = Json::parse(R"([
          {"watchedClass": "Orvane_DiskDrive", "keys": {"CreationClassName": "Orvane_DiskDrive", "DeviceID": "sda"},
           "healthState": 20, "properties": {"ElementName": "sda"}},
          {"watchedClass": "CIM_Sensor", "class": "Orvane_NumericSensor",
           "keys": {"CreationClassName": "Orvane_NumericSensor", "DeviceID": "hwmon0/temp1"}, "healthState": 25,
           "properties": {"ElementName": "Package id 0", "CurrentReading": {"sint32": 105},
                          "UpperThresholdCritical": {"sint32": 100}}},
          {"watchedClass": "CIM_PowerSupply", "class": "Orvane_PowerSupply",
           "keys": {"CreationClassName": "Orvane_PowerSupply", "DeviceID": "AC"}, "healthState": 5}
        ])");
        std::ofstream(folder_ / "host.json") << fixture.dump(2);
        host_ = new HostProcess(hostArgs({"--platform", "sim", "--fixture", (folder_ / "host.json").string()}));
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0) << host_->output();
        delete host_;
        host_ = nullptr;
        std::filesystem::remove_all(folder_);
    }

    // The latched records once the monitor's first pass has latched `count` of them.
    static std::string latchedRecords(std::size_t count) {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
        std::string records;
        do {
            records = wbemcli(host_->port(), "ei", "Orvane_LatchedHealthState");
            if (linesOf(records).size() >= count) {
                break;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        } while (std::chrono::steady_clock::now() < deadline);
        return records;
    }

    static std::filesystem::path folder_;
    static HostProcess* host_;
};

std::filesystem::path CompanionOnSimulatedHost::folder_;
HostProcess* CompanionOnSimulatedHost::host_ = nullptr;

TEST_F(CompanionOnSimulatedHost, EveryClassAnswersWithoutAnError) {
    for (const std::string& className : companionClasses()) {
        expectClean(wbemcli(host_->port(), "ei", className), "ei " + className);
    }
}

TEST_F(CompanionOnSimulatedHost, WatchedSchemaClassesReachTheHostsElements) {
    EXPECT_EQ(linesOf(wbemcli(host_->port(), "ein", "CIM_Sensor")).size(), 1U);
    EXPECT_EQ(linesOf(wbemcli(host_->port(), "ein", "CIM_PowerSupply")).size(), 1U);
    const std::string sensor = wbemcli(host_->port(), "ei", "Orvane_NumericSensor");
    EXPECT_NE(sensor.find("CurrentReading=105"), std::string::npos) << sensor;
    EXPECT_NE(sensor.find("UpperThresholdCritical=100"), std::string::npos) << sensor;
    EXPECT_NE(sensor.find("SystemName=\"orvhost01.lab.example.com\""), std::string::npos) << sensor;
}

TEST_F(CompanionOnSimulatedHost, LatchedHealthLatchesTheFailingDiskAndTheOverheatedSensor) {
    const std::string records = latchedRecords(2);
    const std::vector<std::string> lines = linesOf(records);
    ASSERT_EQ(lines.size(), 2U) << records;
    const std::string all = lines[0] + "\n" + lines[1];
    EXPECT_NE(all.find("LatchedClassName=\"Orvane_NumericSensor\""), std::string::npos) << records;
    EXPECT_NE(all.find("LatchedClassName=\"Orvane_DiskDrive\""), std::string::npos) << records;
    const std::string rollup = wbemcli(host_->port(), "ei", "Orvane_RollupHealthState");
    EXPECT_NE(rollup.find("HealthState=25"), std::string::npos) << rollup;
}

TEST_F(CompanionOnSimulatedHost, ComputerSystemRollsUpTheWorstHealthAndNamesTheMachine) {
    const std::string system = wbemcli(host_->port(), "ei", "OMC_UnitaryComputerSystem");
    EXPECT_EQ(linesOf(system).size(), 1U) << system;
    EXPECT_NE(system.find("HealthState=25"), std::string::npos) << system;
    EXPECT_NE(system.find("OperationalStatus=6"), std::string::npos) << system;
    EXPECT_NE(system.find("Name=\"orvhost01.lab.example.com\""), std::string::npos) << system;
    EXPECT_NE(system.find("OtherIdentifyingInfo=\"orvhost01\",\"Orvane Labs\",\"OL-2000\",\"SN-0042\""),
              std::string::npos)
        << system;
}

}  // namespace
}  // namespace orv::e2e
