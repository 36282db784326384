// Soak: orv-cimhost with the Linux substitute, 8 clients enumerating the
// kernel IPv4 endpoints, the Ethernet ports and the processors over and over
// while veth pairs with addresses are created and deleted in the host's
// network namespace. No answer may fail, be empty, or disagree with the
// machine: the ports are always exactly the NICs, every endpoint of an
// interface that stays is always there with its address, a passing veth's
// endpoint carries the veth's own address, and the processor count never
// changes. ORV_SOAK_SECONDS sets the duration (default 3 s; the `soak` label
// runs it for a minute). Prints the counts.
#include "host_process.hpp"
#include "tool_output.hpp"

#include <gtest/gtest.h>
#include <httplib.h>
#include <nlohmann/json.hpp>
#include <signal.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <regex>
#include <set>
#include <thread>

using orv::e2e::HostProcess;
using orv::linuxtest::runTool;
using orv::linuxtest::toolOutput;
using Instance = std::map<std::string, std::string>;

namespace {

constexpr int kClients = 8;
constexpr int kChurnSlots = 4;
const char* const kClasses[] = {"Orvane_KernelIPv4ProtocolEndpoint", "Orvane_EthernetPort", "Orvane_Processor"};

int soakSeconds()
{
    const char* text = std::getenv("ORV_SOAK_SECONDS");
    const int seconds = text ? std::atoi(text) : 3;
    return seconds > 0 ? seconds : 3;
}

std::string enumerateBody(const std::string& className)
{
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" "
           "PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstances\"><LOCALNAMESPACEPATH>"
           "<NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH><IPARAMVALUE NAME=\"ClassName\">"
           "<CLASSNAME NAME=\"" + className + "\"/></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

// The single-valued string and number properties of every INSTANCE element.
std::vector<Instance> parseInstances(const std::string& xml)
{
    static const std::regex kProperty(R"re(<PROPERTY NAME="([A-Za-z0-9_]+)"[^>]*>\s*<VALUE>([^<]*)</VALUE>)re");
    std::vector<Instance> instances;
    for (std::size_t at = xml.find("<INSTANCE "); at != std::string::npos; at = xml.find("<INSTANCE ", at + 1)) {
        const std::size_t end = xml.find("</INSTANCE>", at);
        if (end == std::string::npos) break;
        const std::string body = xml.substr(at, end - at);
        Instance instance;
        for (std::sregex_iterator it(body.begin(), body.end(), kProperty), stop; it != stop; ++it) {
            instance[(*it)[1]] = (*it)[2];
        }
        instances.push_back(instance);
    }
    return instances;
}

// The machine when the soak starts: the NICs and the first IPv4 address of
// every interface (loopback left out).
struct Machine {
    std::set<std::string> nics;
    std::map<std::string, std::string> ipv4;
};

Machine machineNow()
{
    Machine machine;
    for (const auto& link : nlohmann::json::parse(toolOutput("ip -d -j link show").value_or("[]"))) {
        if (link.contains("parentbus")) machine.nics.insert(link["ifname"].get<std::string>());
    }
    for (const auto& link : nlohmann::json::parse(toolOutput("ip -j addr").value_or("[]"))) {
        if (link["ifname"] == "lo") continue;
        for (const auto& address : link["addr_info"]) {
            if (address["family"] != "inet") continue;
            machine.ipv4.emplace(link["ifname"], address["local"]);
            break;
        }
    }
    return machine;
}

struct Counts {
    std::atomic<unsigned> answers{0}, failed{0}, empty{0}, inconsistent{0};
};

class SoakWhileInterfacesComeAndGo : public ::testing::Test {
protected:
    void SetUp() override
    {
        ASSERT_EQ(::geteuid(), 0u) << "the soak creates veth pairs: run it as root";
        prefix_ = "i21b" + std::to_string(::getpid() % 1000);
        machine_ = machineNow();
        ASSERT_FALSE(machine_.nics.empty()) << "this machine should have a NIC on a bus";
        unsetenv("ORV_PLATFORM");
        unsetenv("ORV_SIM_FIXTURE");
        const std::string source = orv::e2e::sourceDir();
        host_ = std::make_unique<HostProcess>(std::vector<std::string>{
            "--provider-dir", orv::e2e::buildDir() + "/lib", "--registration", source + "/cim/mof/orvprovider.reg",
            "--mof", source + "/cim/mof/orvprovider.mof"});
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }

    void TearDown() override
    {
        stopChurn();
        for (int slot = 0; slot < kChurnSlots; ++slot) runTool("ip link del " + comeName(slot));
        if (host_) {
            EXPECT_EQ(host_->stop(SIGTERM), 0);
        }
    }

    std::string comeName(int slot) const { return prefix_ + "c" + std::to_string(slot); }
    std::string goName(int slot) const { return prefix_ + "g" + std::to_string(slot); }
    static std::string churnAddress(int slot) { return "10.213." + std::to_string(slot + 1) + ".1"; }

    void startChurn()
    {
        churn_ = std::thread([this] {
            for (unsigned round = 0; !stop_; ++round) {
                const int slot = static_cast<int>(round % kChurnSlots);
                runTool("ip link add " + comeName(slot) + " type veth peer name " + goName(slot));
                runTool("ip addr add " + churnAddress(slot) + "/24 dev " + comeName(slot));
                runTool("ip link set " + comeName(slot) + " up");
                runTool("ip link set " + goName(slot) + " up");
                runTool("ip link del " + comeName(slot));
                ++rounds_;
            }
        });
    }
    void stopChurn()
    {
        stop_ = true;
        if (churn_.joinable()) churn_.join();
    }

    // Why an answer of `className` disagrees with the machine; empty when it agrees.
    std::string disagreement(const std::string& className, const std::vector<Instance>& instances)
    {
        if (className == "Orvane_EthernetPort") {
            std::set<std::string> ports;
            for (const auto& instance : instances) {
                if (instance.count("PermanentAddress") == 0) return "a port without its PermanentAddress";
                ports.insert(instance.count("DeviceID") ? instance.at("DeviceID") : "");
            }
            return ports == machine_.nics ? "" : "ports other than the NICs";
        }
        if (className == "Orvane_Processor") {
            unsigned expected = processors_.load();
            if (expected == 0) processors_.compare_exchange_strong(expected, static_cast<unsigned>(instances.size()));
            return instances.size() == processors_.load() ? "" : "the processor count changed";
        }
        std::map<std::string, std::string> endpoints;
        for (const auto& instance : instances) {
            if (instance.count("Name") == 0 || instance.count("IPv4Address") == 0) return "an endpoint without name or address";
            endpoints[instance.at("Name")] = instance.at("IPv4Address");
        }
        for (const auto& [name, address] : machine_.ipv4) {
            auto found = endpoints.find(name);
            if (found == endpoints.end()) return "the endpoint of " + name + " is missing";
            if (found->second != address) return "the endpoint of " + name + " has another address";
        }
        for (int slot = 0; slot < kChurnSlots; ++slot) {
            auto found = endpoints.find(comeName(slot));
            if (found == endpoints.end()) continue;
            ++passingSeen_;
            if (found->second != churnAddress(slot)) return comeName(slot) + " has another address";
        }
        return "";
    }

    void runClient(int index, std::chrono::steady_clock::time_point until, std::map<std::string, Counts>& counts)
    {
        httplib::Client client("127.0.0.1", host_->port());
        client.set_keep_alive(true);
        client.set_read_timeout(30);
        for (unsigned request = static_cast<unsigned>(index); std::chrono::steady_clock::now() < until; ++request) {
            const std::string className = kClasses[request % 3];
            const httplib::Headers headers{{"CIMOperation", "MethodCall"}, {"CIMMethod", "EnumerateInstances"},
                                           {"CIMObject", "root%2Fcimv2"}};
            auto response = client.Post("/cimom", headers, enumerateBody(className), "application/xml; charset=\"utf-8\"");
            Counts& count = counts.at(className);
            ++count.answers;
            if (!response || response->status != 200 || response->body.find("<ERROR") != std::string::npos) {
                ++count.failed;
                continue;
            }
            const auto instances = parseInstances(response->body);
            if (instances.empty()) {
                ++count.empty;
                continue;
            }
            const std::string why = disagreement(className, instances);
            if (!why.empty()) {
                ++count.inconsistent;
                std::lock_guard<std::mutex> lock(reasonsMutex_);
                reasons_.insert(className + ": " + why);
            }
        }
    }

    std::string prefix_;
    Machine machine_;
    std::unique_ptr<HostProcess> host_;
    std::thread churn_;
    std::atomic<bool> stop_{false};
    std::atomic<unsigned> rounds_{0};
    std::atomic<unsigned> processors_{0};
    std::atomic<unsigned> passingSeen_{0};  // endpoints of a passing veth in the answers
    std::mutex reasonsMutex_;
    std::set<std::string> reasons_;
};

}  // namespace

TEST_F(SoakWhileInterfacesComeAndGo, EightClientsGetNoEmptyOrInconsistentAnswer)
{
    std::map<std::string, Counts> counts;
    for (const char* className : kClasses) counts[className];
    startChurn();
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(soakSeconds());
    std::vector<std::thread> clients;
    for (int index = 0; index < kClients; ++index) clients.emplace_back([&, index] { runClient(index, until, counts); });
    for (auto& client : clients) client.join();
    stopChurn();

    std::printf("soak: %d clients, %d s, %u veth pairs created and deleted, %u endpoints of a passing veth served\n",
                kClients, soakSeconds(), rounds_.load(), passingSeen_.load());
    for (const auto& [className, count] : counts) {
        std::printf("soak: %-34s answers %6u  failed %u  empty %u  inconsistent %u\n", className.c_str(),
                    count.answers.load(), count.failed.load(), count.empty.load(), count.inconsistent.load());
        EXPECT_GT(count.answers.load(), 0u) << className;
        EXPECT_EQ(count.failed.load(), 0u) << className;
        EXPECT_EQ(count.empty.load(), 0u) << className;
        EXPECT_EQ(count.inconsistent.load(), 0u) << className;
    }
    for (const auto& reason : reasons_) ADD_FAILURE() << reason;
    EXPECT_GT(rounds_.load(), 0u) << "no interface came and went during the soak";
}
