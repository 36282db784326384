// The detector on the Linux substitute, inside a network namespace the test
// creates and removes itself, with a veth pair whose addresses it changes
// between two testAndSend calls.
//
// getifaddrs answers for the network namespace of the calling thread, so every
// detector call runs on a short-lived thread that has joined the test
// namespace; the test's own thread never leaves its namespace.
#include <fcntl.h>
#include <sched.h>
#include <unistd.h>

#include <atomic>
#include <cstdlib>
#include <functional>
#include <thread>

#include <orv/platform/HostInfo.h>

#include "IpIndicationFixture.h"
#include "tool_output.hpp"

namespace ipindication {
namespace {

using orv::linuxtest::runTool;

// Interface names inside the namespace (it is the test's own).
const std::string kInner = "i15a";
const std::string kPeer = "i15b";
const std::string kExtra = "i15c";

class DetectorNamespaceTest : public ::testing::Test {
protected:
    void SetUp() override {
        static std::atomic<unsigned> counter{0};
        ns_ = "i15-" + std::to_string(::getpid()) + "-" + std::to_string(counter++);
        if (::geteuid() != 0) {
            GTEST_SKIP() << "creating network namespaces needs root; skipped";
        }
        if (!runTool("ip netns add " + ns_)) {
            GTEST_SKIP() << "network namespaces are not allowed here (`ip netns add " << ns_ << "` failed); skipped";
        }
        created_ = true;
        ASSERT_TRUE(inside("ip link add " + kInner + " type veth peer name " + kPeer))
            << "cannot create a veth pair (is the veth driver available?)";
        // No link-local address of its own: only the test's addresses come and go.
        ASSERT_TRUE(inside("ip link set " + kInner + " addrgenmode none"));
        ASSERT_TRUE(inside("ip link set " + kPeer + " addrgenmode none"));
        ASSERT_TRUE(inside("ip link set " + kInner + " up"));
        ASSERT_TRUE(inside("ip link set " + kPeer + " up"));
        ::setenv("ORV_PLATFORM", "linux", 1);
        harness_ = std::make_unique<DetectorHarness>();
        systemName_ = inNamespace([] {
            char name[256] = "";
            OrvHost_GetFqdn(name, sizeof name);
            return std::string(name);
        });
    }

    void TearDown() override {
        harness_.reset();
        if (created_) {
            runTool("ip netns del " + ns_);
        }
    }

    bool inside(const std::string& command) { return runTool("ip netns exec " + ns_ + " " + command); }

    // Runs `work` on a thread that joined the test namespace.
    template <typename Work>
    auto inNamespace(Work work) -> decltype(work()) {
        decltype(work()) result{};
        bool joined = false;
        std::thread worker([&] {
            const int fd = ::open(("/var/run/netns/" + ns_).c_str(), O_RDONLY | O_CLOEXEC);
            joined = fd >= 0 && ::setns(fd, CLONE_NEWNET) == 0;
            if (fd >= 0) {
                ::close(fd);
            }
            if (joined) {
                result = work();
            }
        });
        worker.join();
        EXPECT_TRUE(joined) << "the worker could not join " << ns_;
        return result;
    }

    void enable() {
        inNamespace([this] {
            harness_->detector().enableIndication();
            return true;
        });
    }

    // One testAndSend in the namespace; what it delivered, with the time window.
    std::vector<Delivered> testAndSend() {
        harness_->recorder().clear();
        from_ = std::time(nullptr);
        inNamespace([this] {
            harness_->testAndSend();
            return true;
        });
        to_ = std::time(nullptr);
        return harness_->recorder().delivered();
    }

    std::vector<NamedValue> ipv4(const std::string& address, const std::string& netmask) {
        return ipv4Endpoint(kInner, address, netmask, systemName_);
    }
    std::vector<NamedValue> ipv6(const std::string& address, unsigned prefix) {
        return ipv6Endpoint(kInner, address, prefix, systemName_);
    }

    std::string ns_;
    bool created_ = false;
    std::unique_ptr<DetectorHarness> harness_;
    std::string systemName_;
    std::time_t from_ = 0;
    std::time_t to_ = 0;
};

TEST_F(DetectorNamespaceTest, ReplacedIpv4AddressIsReported) {
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/24 dev " + kInner));
    enable();
    ASSERT_TRUE(inside("ip addr del 10.151.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip addr add 10.151.0.3/24 dev " + kInner));
    const std::vector<Delivered> delivered = testAndSend();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], kInner, ipv4("10.151.0.2", "255.255.255.0"), ipv4("10.151.0.3", "255.255.255.0"),
                     from_, to_);
    EXPECT_EQ(testAndSend().size(), 0U);
}

TEST_F(DetectorNamespaceTest, ReplacedIpv6AddressIsReported) {
    ASSERT_TRUE(inside("ip -6 addr add fd15::2/64 dev " + kInner + " nodad"));
    enable();
    ASSERT_TRUE(inside("ip -6 addr del fd15::2/64 dev " + kInner));
    ASSERT_TRUE(inside("ip -6 addr add fd15::3/64 dev " + kInner + " nodad"));
    const std::vector<Delivered> delivered = testAndSend();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], kInner, ipv6("fd15::2", 64), ipv6("fd15::3", 64), from_, to_);
}

TEST_F(DetectorNamespaceTest, AddingASecondAddressGivesNoIndication) {
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip -6 addr add fd15::2/64 dev " + kInner + " nodad"));
    enable();
    ASSERT_TRUE(inside("ip addr add 10.151.0.9/24 dev " + kInner));
    ASSERT_TRUE(inside("ip -6 addr add fd15::9/64 dev " + kInner + " nodad"));
    EXPECT_EQ(testAndSend().size(), 0U);
}

TEST_F(DetectorNamespaceTest, RemovingAnAddressGivesNoIndication) {
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip addr add 10.152.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip -6 addr add fd15::2/64 dev " + kInner + " nodad"));
    enable();
    ASSERT_TRUE(inside("ip addr del 10.152.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip -6 addr del fd15::2/64 dev " + kInner));
    EXPECT_EQ(testAndSend().size(), 0U);
}

TEST_F(DetectorNamespaceTest, NetmaskChangeAloneIsReported) {
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/24 dev " + kInner));
    enable();
    ASSERT_TRUE(inside("ip addr del 10.151.0.2/24 dev " + kInner));
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/16 dev " + kInner));
    const std::vector<Delivered> delivered = testAndSend();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], kInner, ipv4("10.151.0.2", "255.255.255.0"), ipv4("10.151.0.2", "255.255.0.0"),
                     from_, to_);
}

TEST_F(DetectorNamespaceTest, BringingUpANewInterfaceGivesNoIndication) {
    ASSERT_TRUE(inside("ip addr add 10.151.0.2/24 dev " + kInner));
    enable();
    ASSERT_TRUE(inside("ip link add " + kExtra + " type veth peer name " + kExtra + "p"));
    ASSERT_TRUE(inside("ip addr add 10.153.0.2/24 dev " + kExtra));
    ASSERT_TRUE(inside("ip -6 addr add fd16::2/64 dev " + kExtra + " nodad"));
    ASSERT_TRUE(inside("ip link set " + kExtra + " up"));
    ASSERT_TRUE(inside("ip link set lo up"));
    EXPECT_EQ(testAndSend().size(), 0U);
}

}  // namespace
}  // namespace ipindication
