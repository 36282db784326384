// orv-cimhost started with no fixture and no platform setting (the Linux
// substitute by default) serves this machine's real addresses, NICs and
// processors: wbemcli's answers equal what ip, ethtool, sysfs and /proc say.
#include "host_process.hpp"
#include "tool_output.hpp"

#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <signal.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <regex>
#include <set>
#include <tuple>

using orv::e2e::HostProcess;
using orv::linuxtest::toolOutput;
using json = nlohmann::json;

namespace {

using Instance = std::map<std::string, std::string>;

// `wbemcli ei` prints one instance a line: "<path> Prop=value,Prop=value,...";
// string values are quoted, arrays are lists of values joined by commas.
std::vector<Instance> parseInstances(const std::string& text)
{
    static const std::regex kProperty(R"re(([A-Za-z_][A-Za-z0-9_]*)=("(?:[^"\\]|\\.)*"|[^,]*))re");
    std::vector<Instance> instances;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        const auto space = line.find(' ');
        if (line.empty() || space == std::string::npos) continue;
        Instance instance;
        const std::string body = line.substr(space + 1);
        for (std::sregex_iterator it(body.begin(), body.end(), kProperty), end; it != end; ++it) {
            std::string value = (*it)[2];
            if (value.size() >= 2 && value.front() == '"') value = value.substr(1, value.size() - 2);
            instance[(*it)[1]] = value;
        }
        instances.push_back(instance);
    }
    return instances;
}

std::string dottedMask(int prefix)
{
    const std::uint32_t mask = prefix == 0 ? 0 : ~std::uint32_t{0} << (32 - prefix);
    in_addr address{htonl(mask)};
    return inet_ntoa(address);
}

class LinuxHostEndToEnd : public ::testing::Test {
protected:
    static void SetUpTestSuite()
    {
        unsetenv("ORV_PLATFORM");
        unsetenv("ORV_SIM_FIXTURE");
        const std::string source = orv::e2e::sourceDir();
        host_ = new HostProcess({"--provider-dir", orv::e2e::buildDir() + "/lib", "--registration",
                                 source + "/cim/mof/orvprovider.reg", "--mof", source + "/cim/mof/orvprovider.mof"});
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite()
    {
        EXPECT_EQ(host_->stop(SIGTERM), 0);
        delete host_;
        host_ = nullptr;
    }

    // Every instance of the class; `properties` ("A,B") limits the properties asked for.
    static std::vector<Instance> enumerate(const std::string& className, const std::string& properties = "")
    {
        const std::string url = "'http://localhost:" + std::to_string(host_->port()) + "/root/cimv2:" + className + "'";
        const std::string output = orv::e2e::runCommand("timeout 30 wbemcli ei " + url + " " + properties);
        EXPECT_EQ(output.find("*"), std::string::npos) << "wbemcli reported an error: " << output;
        return parseInstances(output);
    }

    static json addresses()
    {
        auto text = toolOutput("ip -j addr");
        if (!text) ADD_FAILURE() << "the test needs `ip` (iproute2)";
        return text ? json::parse(*text) : json::array();
    }

    static HostProcess* host_;
};

HostProcess* LinuxHostEndToEnd::host_ = nullptr;

}  // namespace

TEST_F(LinuxHostEndToEnd, KernelIPv4EndpointsAreTheFirstAddressOfEachInterface)
{
    std::set<std::tuple<std::string, std::string, std::string>> expected, served;
    for (const auto& link : addresses()) {
        if (link["ifname"] == "lo") continue;
        for (const auto& address : link["addr_info"]) {
            if (address["family"] != "inet") continue;
            expected.emplace(link["ifname"], address["local"], dottedMask(address["prefixlen"]));
            break;  // the primary address
        }
    }
    for (const auto& instance : enumerate("Orvane_KernelIPv4ProtocolEndpoint")) {
        served.emplace(instance.at("Name"), instance.at("IPv4Address"), instance.at("SubnetMask"));
    }
    EXPECT_FALSE(expected.empty()) << "this machine has no IPv4 address beside loopback";
    EXPECT_EQ(served, expected);
}

TEST_F(LinuxHostEndToEnd, KernelIPv6EndpointsAreEveryAddressWithItsPrefix)
{
    std::set<std::tuple<std::string, std::string, std::string>> expected, served;
    for (const auto& link : addresses()) {
        if (link["ifname"] == "lo") continue;
        for (const auto& address : link["addr_info"]) {
            if (address["family"] != "inet6") continue;
            expected.emplace(link["ifname"], address["local"], std::to_string(address["prefixlen"].get<int>()));
        }
    }
    for (const auto& instance : enumerate("Orvane_KernelIPv6ProtocolEndpoint")) {
        served.emplace(instance.at("Name"), instance.at("IPv6Address"), instance.at("PrefixLength"));
    }
    EXPECT_EQ(served, expected);
}

TEST_F(LinuxHostEndToEnd, EthernetPortsAreTheBusNicsWithTheirPermanentAddress)
{
    std::map<std::string, std::string> expected, served;
    for (const auto& entry : std::filesystem::directory_iterator("/sys/class/net")) {
        if (!std::filesystem::exists(entry.path() / "device")) continue;
        const std::string name = entry.path().filename();
        auto permanent = toolOutput("ethtool -P " + name);
        ASSERT_TRUE(permanent) << "the test needs `ethtool`";
        std::smatch match;
        std::string text = *permanent;
        ASSERT_TRUE(std::regex_search(text, match, std::regex("([0-9a-f:]{17})"))) << text;
        std::string mac = std::regex_replace(match[1].str(), std::regex(":"), "");
        for (auto& c : mac) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
        expected[name] = mac;
    }
    for (const auto& instance : enumerate("Orvane_EthernetPort")) served[instance.at("Name")] = instance.at("PermanentAddress");
    EXPECT_FALSE(expected.empty()) << "this machine has no NIC on a bus";
    EXPECT_EQ(served, expected);
}

TEST_F(LinuxHostEndToEnd, ProcessorsAreThePackagesWithTheModelName)
{
    std::ifstream cpuinfo("/proc/cpuinfo");
    std::set<std::string> packages;
    std::string model;
    for (std::string line; std::getline(cpuinfo, line);) {
        const auto colon = line.find(':');
        if (colon == std::string::npos) continue;
        std::string key = line.substr(0, line.find_last_not_of(" \t", colon - 1) + 1);
        std::string value = colon + 2 <= line.size() ? line.substr(colon + 2) : std::string();
        if (key == "physical id") packages.insert(value);
        if (key == "model name" && model.empty()) model = value;
    }
    const std::size_t packageCount = packages.empty() ? 1 : packages.size();
    auto processors = enumerate("Orvane_Processor", "DeviceID,ModelName");
    ASSERT_EQ(processors.size(), packageCount);
    for (std::size_t i = 0; i < processors.size(); ++i) {
        EXPECT_EQ(processors[i].at("ModelName"), model);
        EXPECT_EQ(processors[i].at("DeviceID"), "cpu-" + std::to_string(i));
    }
}
