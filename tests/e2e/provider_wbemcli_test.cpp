// wbemcli against orv-cimhost serving the project's provider library (the registration
// and MOF of cim/mof) on the shipped simulated host platform/sim/examples/host.json,
// with the alternate boot bank of tests/e2e/data/root. Each output is compared exactly
// with its golden file under golden/provider (ORV_UPDATE_GOLDEN=1 rewrites them); the
// one value that follows the clock, the hypervisor's LastStartTime, is checked on its
// own and masked in the golden files.
#include <gtest/gtest.h>
#include <signal.h>

#include <chrono>
#include <ctime>
#include <regex>

#include "golden_file.hpp"
#include "host_process.hpp"

namespace orv::e2e {
namespace {

constexpr long kFixtureUptimeSeconds = 864000;  // host.uptimeSeconds of host.json

const std::string kPort =
    "Orvane_EthernetPort.DeviceID=\"vmnic0\",SystemCreationClassName=\"OMC_UnitaryComputerSystem\","
    "SystemName=\"orvhost01.lab.example.com\",CreationClassName=\"Orvane_EthernetPort\"";
const std::string kEndpoint =
    "Orvane_KernelIPv4ProtocolEndpoint.Name=\"vif0\",SystemCreationClassName=\"OMC_UnitaryComputerSystem\","
    "SystemName=\"orvhost01.lab.example.com\",CreationClassName=\"Orvane_KernelIPv4ProtocolEndpoint\"";
const std::string kInstalledIdentity =
    "Orvane_InstalledSoftwareIdentity.System=root/cimv2:OMC_UnitaryComputerSystem.Name=\"orvhost01.lab.example.com\","
    "CreationClassName=\"OMC_UnitaryComputerSystem\",InstalledSoftware=root/cimv2:Orvane_HypervisorSoftwareIdentity."
    "InstanceID=\"Orvane Zolti 6.0.0 build-4192238\"";
const std::string kProcessor =
    "Orvane_Processor.ElementName=\"cpu-1\",SystemCreationClassName=\"OMC_UnitaryComputerSystem\","
    "SystemName=\"orvhost01.lab.example.com\",CreationClassName=\"Orvane_Processor\",DeviceID=\"cpu-1\"";

struct ProviderCase {
    std::string name;     // golden file name
    std::string command;  // wbemcli operation and options
    std::string object;   // after "root/cimv2:"
};

class ProviderWbemcliTest : public ::testing::TestWithParam<ProviderCase> {
protected:
    static void SetUpTestSuite() {
        setenv("ORV_ROOT", (sourceDir() + "/tests/e2e/data/root").c_str(), 1);
        host_ = new HostProcess({"--provider-dir", buildDir() + "/lib", "--registration",
                                 sourceDir() + "/cim/mof/orvprovider.reg", "--mof",
                                 sourceDir() + "/cim/mof/orvprovider.mof", "--platform", "sim", "--fixture",
                                 sourceDir() + "/platform/sim/examples/host.json", "--host-name", "testhost"});
        unsetenv("ORV_ROOT");
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0) << host_->output();
        delete host_;
        host_ = nullptr;
    }
    static std::string wbemcli(const std::string& command, const std::string& object) {
        const std::string port = std::to_string(host_->port());
        const std::string output = runCommand("timeout 20 wbemcli " + command + " 'http://localhost:" + port +
                                              "/root/cimv2:" + object + "'");
        return std::regex_replace(output, std::regex("localhost:" + port), "localhost:PORT");
    }
    static HostProcess* host_;
};

HostProcess* ProviderWbemcliTest::host_ = nullptr;

const std::regex kLastStartTime("LastStartTime=([0-9]{14})\\.000000\\+000");

TEST_P(ProviderWbemcliTest, OutputMatchesGolden) {
    const ProviderCase& c = GetParam();
    const std::string output =
        std::regex_replace(wbemcli(c.command, c.object), kLastStartTime, "LastStartTime=BOOT-TIME");
    EXPECT_EQ(output, goldenText(sourceDir() + "/tests/e2e/golden/provider/" + c.name + ".txt", output)) << c.name;
}

// Seconds since the epoch of a "yyyymmddhhmmss" UTC text.
std::time_t utcSeconds(const std::string& text) {
    std::tm parts{};
    parts.tm_year = std::stoi(text.substr(0, 4)) - 1900;
    parts.tm_mon = std::stoi(text.substr(4, 2)) - 1;
    parts.tm_mday = std::stoi(text.substr(6, 2));
    parts.tm_hour = std::stoi(text.substr(8, 2));
    parts.tm_min = std::stoi(text.substr(10, 2));
    parts.tm_sec = std::stoi(text.substr(12, 2));
    return timegm(&parts);
}

TEST_F(ProviderWbemcliTest, HypervisorLastStartTimeIsTheFixtureUptimeBeforeNow) {
    const std::string output = wbemcli("ei", "Orvane_HypervisorSoftwareIdentity");
    std::smatch match;
    ASSERT_TRUE(std::regex_search(output, match, kLastStartTime)) << output;
    const long expected = static_cast<long>(std::time(nullptr)) - kFixtureUptimeSeconds;
    EXPECT_NEAR(static_cast<double>(utcSeconds(match[1].str())), static_cast<double>(expected), 60.0) << output;
}

std::vector<ProviderCase> providerCases() {
    return {
        {"ein_ipv4_endpoint", "ein", "Orvane_KernelIPv4ProtocolEndpoint"},
        {"ei_ipv4_endpoint", "ei", "Orvane_KernelIPv4ProtocolEndpoint"},
        {"gi_ipv4_endpoint", "gi", kEndpoint},
        {"ein_ethernet_port", "ein", "Orvane_EthernetPort"},
        {"ei_ethernet_port", "ei", "Orvane_EthernetPort"},
        {"gi_ethernet_port", "gi", kPort},
        {"gi_ethernet_port_unknown", "gi", std::regex_replace(kPort, std::regex("vmnic0"), "vmnic9")},
        {"ain_ethernet_port", "ain", kPort},
        {"ai_ethernet_port", "ai", kPort},
        {"rin_ethernet_port", "rin", kPort},
        {"ri_ethernet_port", "ri", kPort},
        {"ain_ethernet_port_statistics", "ain -ac Orvane_EPStatistics", kPort},
        {"rin_ethernet_port_setting_data", "rin -arc CIM_ElementSettingData", kPort},
        {"ein_processor", "ein", "Orvane_Processor"},
        {"ei_processor", "ei", "Orvane_Processor"},
        {"gi_processor", "gi", kProcessor},
        {"ein_hypervisor_identity", "ein", "Orvane_HypervisorSoftwareIdentity"},
        {"ei_hypervisor_identity", "ei", "Orvane_HypervisorSoftwareIdentity"},
        {"ein_installed_identity", "ein", "Orvane_InstalledSoftwareIdentity"},
        // The software reference comes back as the provider got it: without the host wbemcli named.
        {"gi_installed_identity", "gi", kInstalledIdentity},
    };
}

INSTANTIATE_TEST_SUITE_P(Provider, ProviderWbemcliTest, ::testing::ValuesIn(providerCases()),
                         [](const ::testing::TestParamInfo<ProviderCase>& param) { return param.param.name; });

}  // namespace
}  // namespace orv::e2e
