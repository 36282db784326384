// The NICs of this machine found the way a kernel before 5.16 needs it: told
// that the kernel names no parent devices, the substitute takes each link's bus
// device from its driver info. The NICs (the interfaces sysfs shows on a
// device, which does not depend on the kernel's version) are found on the bus
// device `ethtool -i` names; the loopback and veth pairs (one end named like
// this machine's NIC, in a namespace of the test's own) are no NICs. Told the
// kernel names them, the listing is the links that rtnetlink puts on a bus.
#include "bus_device.hpp"
#include "linux_backend.hpp"
#include "join_namespace.hpp"
#include "tool_output.hpp"

#include "tmkctl/util/AutoVector.h"

#include <gtest/gtest.h>
#include <memory>
#include <thread>
#include <unistd.h>

using namespace orv::linuxhost;
using orv::linuxtest::fieldAfter;
using orv::linuxtest::joinNamedNamespace;
using orv::linuxtest::runTool;
using orv::linuxtest::toolOutput;
namespace NN = NodeMgr::Network;

namespace {

constexpr bool kOlderKernel = false;  // the kernel names no parent devices
constexpr bool kNewerKernel = true;

std::vector<std::string> listedNames(LinuxNetwork& network)
{
    TmkCtl::Util::AutoVector<NN::Pnic> pnics(network.getPnics());
    std::vector<std::string> names;
    for (auto* pnic : pnics) names.push_back(pnic->GetName());
    return names;
}

bool isNicByName(LinuxNetwork& network, const std::string& name)
{
    return std::unique_ptr<NN::Pnic>(network.getPnicByName(name)) != nullptr;
}

// The links this kernel's own answers put on a bus device (none before 5.16).
std::vector<std::string> linksOnBus()
{
    std::vector<std::string> names;
    for (const auto& link : RouteLinks().all()) {
        if (link.onBus()) names.push_back(link.name);
    }
    return names;
}

// The links of this namespace that sysfs shows on a device (a `device` link
// under /sys/class/net, whatever the kernel's version), in interface-index order.
std::vector<LinkRecord> nicsInSysfs()
{
    std::vector<LinkRecord> nics;
    for (auto& link : RouteLinks().all()) {
        if (::access(("/sys/class/net/" + link.name + "/device").c_str(), F_OK) == 0) nics.push_back(std::move(link));
    }
    if (nics.empty()) ADD_FAILURE() << "sysfs shows no network interface on a device on this machine";
    return nics;
}

std::vector<std::string> namesOf(const std::vector<LinkRecord>& links)
{
    std::vector<std::string> names;
    for (const auto& link : links) names.push_back(link.name);
    return names;
}

LinuxNetwork networkFor(bool kernelNamesParents)
{
    return LinuxNetwork("/sys", std::make_shared<IoctlEthtoolChannel>(), nullptr, kernelNamesParents);
}

}  // namespace

TEST(ParentDeviceFallback, ThisMachinesNicsAreFoundOnTheBusDeviceEthtoolNames)
{
    IoctlEthtoolChannel channel;
    for (auto link : nicsInSysfs()) {
        ASSERT_TRUE(recognizeNic(link, channel, kOlderKernel)) << link.name;
        const auto busInfo = fieldAfter(toolOutput("ethtool -i " + link.name).value_or(""), "bus-info");
        ASSERT_FALSE(busInfo.empty()) << link.name;
        EXPECT_EQ(link.parentDevice, busInfo) << link.name;  // not the kernel's own name ("virtio2")
        EXPECT_EQ(link.parentBus, busDeviceFromDriverInfo(busInfo)->bus) << link.name;
    }
}

TEST(ParentDeviceFallback, ListingAndLookupFindTheNicsSysfsShows)
{
    auto older = networkFor(kOlderKernel);
    const auto nics = namesOf(nicsInSysfs());
    EXPECT_EQ(listedNames(older), nics);
    for (const auto& name : nics) EXPECT_TRUE(isNicByName(older, name)) << name;
}

TEST(ParentDeviceFallback, LoopbackIsNoNic)
{
    auto older = networkFor(kOlderKernel);
    EXPECT_FALSE(isNicByName(older, "lo"));
    auto listed = listedNames(older);
    EXPECT_EQ(std::find(listed.begin(), listed.end(), "lo"), listed.end());
}

TEST(ParentDeviceFallback, KernelThatNamesParentsListsTheLinksOnABusAsBefore)
{
    auto newer = networkFor(kNewerKernel);
    const auto nics = linksOnBus();
    EXPECT_EQ(listedNames(newer), nics);
    for (const auto& name : nics) EXPECT_TRUE(isNicByName(newer, name)) << name;
    EXPECT_FALSE(isNicByName(newer, "lo"));
}

namespace {

// A namespace of the test's own holding a veth pair, one end named like this
// machine's first NIC; removed (with the pair) on every path.
class FallbackInNamespace : public ::testing::Test {
protected:
    void SetUp() override
    {
        ASSERT_EQ(::geteuid(), 0u) << "these tests create network namespaces and veth pairs: run them as root";
        const auto nics = nicsInSysfs();
        ASSERT_FALSE(nics.empty());
        nicName_ = nics.front().name;
        const std::string id = std::to_string(::getpid() % 100000);
        ns_ = "i21c-old" + id;
        peer_ = "i21cp" + id;
        ASSERT_TRUE(runTool("ip netns add " + ns_)) << "`ip netns add` failed: network namespaces are unavailable";
        created_ = true;
        ASSERT_TRUE(runTool("ip -n " + ns_ + " link add " + nicName_ + " type veth peer name " + peer_));
        ASSERT_TRUE(runTool("ip -n " + ns_ + " link set lo up"));
        ASSERT_TRUE(runTool("ip -n " + ns_ + " link set " + nicName_ + " up"));
    }

    void TearDown() override
    {
        if (created_) runTool("ip netns del " + ns_);  // takes the veth pair with it
    }

    // Runs body on a thread joined to the namespace; false when it could not join.
    template <typename Body>
    bool inside(Body&& body)
    {
        bool joined = false;
        std::thread thread([&] {
            joined = joinNamedNamespace(ns_);
            if (joined) body();
        });
        thread.join();
        return joined;
    }

    std::string nicName_, ns_, peer_;
    bool created_ = false;
};

}  // namespace

TEST_F(FallbackInNamespace, LoopbackAndVethPairAreNoNics)
{
    std::vector<std::string> listed{"not read"};
    bool loopback = true, veth = true, peer = true;
    ASSERT_TRUE(inside([&] {
        auto older = networkFor(kOlderKernel);
        listed = listedNames(older);
        loopback = isNicByName(older, "lo");
        veth = isNicByName(older, nicName_);
        peer = isNicByName(older, peer_);
    }));
    EXPECT_TRUE(listed.empty()) << listed.front();
    EXPECT_FALSE(loopback);
    EXPECT_FALSE(veth) << "a veth named " << nicName_ << " was taken for a NIC";
    EXPECT_FALSE(peer);
}
