// Concurrent requests to the kernel system-information nodes, each on a thread
// of its own in a network namespace the test creates, while other interfaces
// of that namespace come and go. Every request must see one consistent picture:
// the interface that stays is always listed, and a walk over the listed
// interfaces never fails half way because another request started or an
// interface vanished.
#include "linux_backend.hpp"
#include "stack_params.hpp"
#include "join_namespace.hpp"
#include "tool_output.hpp"

#include <atomic>
#include <chrono>
#include <functional>
#include <gtest/gtest.h>
#include <thread>
#include <unistd.h>

using namespace orv::linuxhost;
using orv::linuxtest::runTool;
using orv::linuxtest::stackParams;
using Params = orv::platform::KsiParams;

namespace {

// The walk the kernel IP endpoint provider makes in one request: the listing,
// then per interface its IPv4 address and netmask and its IPv6 summaries. An
// address read that succeeds followed by a failing netmask or summary read
// fails the whole walk (nothing is returned to the client).
struct Walk {
    bool failed = false;
    std::vector<std::string> names;
    std::size_t records = 0;
};

Walk walkEndpoints(LinuxKsi& ksi)
{
    Walk walk;
    ksi.invalidate();  // as the platform library does when a request begins
    std::uint32_t version = 0;
    if (ksi.checkSig(KSI_SIGNATURE, KSI_SIGNATURE_LENGTH, &version) != KSI_OK) return {true, {}, 0};
    std::optional<Params> list;
    if (ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics, stackParams({}), list) != KSI_OK) return {true, {}, 0};
    for (const auto& vnic : list.value_or(Params{})) {
        walk.names.push_back(vnic.text);
        std::uint32_t address = 0, mask = 0;
        if (ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({vnic.text}), &address, 4) == KSI_OK) {
            if (ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, stackParams({vnic.text}), &mask, 4) != KSI_OK) {
                walk.failed = true;
                return walk;
            }
            ++walk.records;
        }
        std::optional<Params> v6;
        if (ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, stackParams({vnic.text}), v6) != KSI_OK) continue;
        for (const auto& v6address : v6.value_or(Params{})) {
            TcpipKsi_VnicIPv6AddrSummary summary{};
            if (ksi.get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary, stackParams({vnic.text, v6address.text}),
                        &summary, sizeof summary) != KSI_OK) {
                walk.failed = true;
                return walk;
            }
            ++walk.records;
        }
    }
    return walk;
}

class ChurningNamespace : public ::testing::Test {
protected:
    void SetUp() override
    {
        ASSERT_EQ(::geteuid(), 0u) << "these tests create network namespaces and veth pairs: run them as root";
        ns_ = "i21-snap" + std::to_string(::getpid() % 100000);
        ASSERT_TRUE(runTool("ip netns add " + ns_)) << "`ip netns add` failed: network namespaces are unavailable";
        created_ = true;
        ASSERT_TRUE(ip("link add stay0 type veth peer name stay1"));
        ASSERT_TRUE(ip("addr add 10.79.0.1/24 dev stay0"));
        ASSERT_TRUE(ip("link set stay0 up"));
        ASSERT_TRUE(ip("link set stay1 up"));
        ASSERT_TRUE(ip("-6 addr add fd79::1/64 dev stay0 nodad"));
    }

    void TearDown() override
    {
        stopChurn();
        if (created_) runTool("ip netns del " + ns_);
    }

    bool ip(const std::string& arguments) { return runTool("ip -n " + ns_ + " " + arguments); }

    // Joins the calling thread to the test namespace.
    bool enter() { return orv::linuxtest::joinNamedNamespace(ns_); }

    // Runs body on `count` threads, each joined to the test namespace first;
    // answers how many threads could not join it.
    unsigned runClients(int count, const std::function<void()>& body)
    {
        std::atomic<unsigned> notEntered{0};
        std::vector<std::thread> clients;
        for (int client = 0; client < count; ++client) {
            clients.emplace_back([&] {
                if (!enter()) {
                    ++notEntered;
                    return;
                }
                body();
            });
        }
        for (auto& client : clients) client.join();
        return notEntered;
    }

    // A thread that creates and deletes veth pairs with addresses, one after another.
    void startChurn()
    {
        churn_ = std::thread([this] {
            for (unsigned round = 0; !stop_; ++round) {
                const std::string a = "come" + std::to_string(round % 4), b = "go" + std::to_string(round % 4);
                ip("link add " + a + " type veth peer name " + b);
                ip("addr add 10.79." + std::to_string(1 + round % 4) + ".1/24 dev " + a);
                ip("link set " + a + " up");
                ip("link set " + b + " up");
                ip("-6 addr add fd79:" + std::to_string(1 + round % 4) + "::1/64 dev " + a + " nodad");
                ip("link del " + a);
                ++rounds_;
            }
        });
    }
    void stopChurn()
    {
        stop_ = true;
        if (churn_.joinable()) churn_.join();
    }

    std::string ns_;
    bool created_ = false;
    std::atomic<bool> stop_{false};
    std::atomic<unsigned> rounds_{0};
    std::thread churn_;
};

}  // namespace

TEST_F(ChurningNamespace, ConcurrentEndpointWalksSeeTheStayingInterfaceAndNeverFailHalfWay)
{
    LinuxKsi ksi(LinuxRoots{});
    startChurn();
    std::atomic<unsigned> walks{0}, failures{0}, missing{0};
    const unsigned notEntered = runClients(4, [&] {
        const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(3);
        while (std::chrono::steady_clock::now() < until) {
            Walk walk = walkEndpoints(ksi);
            ++walks;
            if (walk.failed) ++failures;
            if (std::find(walk.names.begin(), walk.names.end(), "stay0") == walk.names.end() || walk.records < 2) ++missing;
        }
    });
    stopChurn();
    ASSERT_EQ(notEntered, 0u);
    EXPECT_GT(rounds_.load(), 0u) << "no interface was created and deleted during the walks";
    EXPECT_GT(walks.load(), 0u);
    EXPECT_EQ(failures.load(), 0u) << "of " << walks.load() << " walks";
    EXPECT_EQ(missing.load(), 0u) << "of " << walks.load() << " walks";
}

TEST_F(ChurningNamespace, ConcurrentProcessorAndInterfaceListingsAreNeverEmpty)
{
    LinuxKsi ksi(LinuxRoots{});
    std::atomic<unsigned> empty{0}, listings{0};
    const unsigned notEntered = runClients(4, [&] {
        for (int request = 0; request < 400; ++request) {
            ksi.invalidate();
            std::optional<Params> vnics, packages, cpus;
            ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics, stackParams({}), vnics);
            ksi.getInstanceList(KSI_NODE_hardware_cpu_packageList, {}, packages);
            ksi.getInstanceList(KSI_NODE_hardware_cpu_cpuList, {}, cpus);
            listings += 3;
            if (!vnics || vnics->empty()) ++empty;
            if (!packages || packages->empty()) ++empty;
            if (!cpus || cpus->empty()) ++empty;
        }
    });
    ASSERT_EQ(notEntered, 0u);
    EXPECT_EQ(empty.load(), 0u) << "of " << listings.load() << " listings";
}

TEST_F(ChurningNamespace, ProcessorLoadIsAnsweredWithoutWaitingASamplingWindow)
{
    LinuxRoots roots;
    roots.loadWindow = std::chrono::milliseconds(5000);
    LinuxKsi ksi(roots);
    const auto start = std::chrono::steady_clock::now();
    std::vector<std::thread> clients;
    std::atomic<unsigned> answered{0};
    for (int client = 0; client < 3; ++client) {
        clients.emplace_back([&] {
            for (int request = 0; request < 3; ++request) {
                ksi.invalidate();
                SchedKsi_PcpuInfo info{};
                SchedKsi_PcpuLoad load{};
                if (ksi.get(KSI_NODE_sched_pcpus_stats, {KSI_Param::ofInt(0)}, &info, sizeof info) == KSI_OK &&
                    ksi.get(KSI_NODE_sched_pcpus_load, {KSI_Param::ofInt(0)}, &load, sizeof load) == KSI_OK && load.activeLoad <= 100) {
                    ++answered;
                }
            }
        });
    }
    for (auto& client : clients) client.join();
    const auto elapsed = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(answered.load(), 9u);
    // Far below the single window of 5 s that a sampled request would wait.
    EXPECT_LT(elapsed, std::chrono::milliseconds(2500));
}
