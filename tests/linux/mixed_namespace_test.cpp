// A backend made by a thread that joined another network namespace the way
// `nsenter --net` does: sysfs still shows this namespace's devices, while
// every socket the backend opens belongs to the joined one. The joined
// namespace holds a veth end named like this machine's NIC; every value the
// substitute answers must describe that veth, as `ip` and `ethtool` see it
// inside the namespace, and never this machine's NIC behind the same name.
#include "linux_backend.hpp"
#include "linux_pnic.hpp"
#include "mac_text.hpp"
#include "join_namespace.hpp"
#include "tool_output.hpp"

#include "tmkctl/util/AutoVector.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <thread>
#include <unistd.h>

using namespace orv::linuxhost;
using orv::linuxtest::fieldAfter;
using orv::linuxtest::macText;
using orv::linuxtest::runTool;
using orv::linuxtest::toolOutput;
namespace NN = NodeMgr::Network;

namespace {

// What a thread joined to the namespace read through the substitute.
struct Seen {
    bool joined = false;
    std::vector<std::string> listed;
    bool byNameIsNic = true;
    std::uint32_t mtu = 0;
    std::string address, driver, busInfo;
    bool pci = true;
    bool operationalUp = false;
    NN::LinkSpeed speed = NN::CONNECTION_AUTO;
};

class MixedNamespace : public ::testing::Test {
protected:
    void SetUp() override
    {
        ASSERT_EQ(::geteuid(), 0u) << "these tests create network namespaces and veth pairs: run them as root";
        for (const auto& link : RouteLinks().all()) {
            if (link.onBus()) nic_ = link.name;
        }
        ASSERT_FALSE(nic_.empty()) << "this machine should have a NIC on a bus";
        const std::string id = std::to_string(::getpid() % 100000);
        ns_ = "i21b-mix" + id;
        peer_ = "i21bp" + id;
        ASSERT_TRUE(runTool("ip netns add " + ns_)) << "`ip netns add` failed: network namespaces are unavailable";
        created_ = true;
        ASSERT_TRUE(ip("link add " + nic_ + " mtu 1280 address 02:21:0b:00:00:01 type veth peer name " + peer_));
        ASSERT_TRUE(ip("link set " + peer_ + " up"));
        ASSERT_TRUE(ip("link set " + nic_ + " up"));
    }

    void TearDown() override
    {
        if (created_) runTool("ip netns del " + ns_);  // takes the veth pair with it
    }

    bool ip(const std::string& arguments) { return runTool("ip -n " + ns_ + " " + arguments); }
    std::string insideOutput(const std::string& command)
    {
        return toolOutput("ip netns exec " + ns_ + " " + command).value_or("");
    }

    // A thread joins the namespace (sysfs stays this namespace's), makes a
    // backend there and reads the NIC-named veth through it.
    Seen readInside()
    {
        Seen seen;
        std::thread reader([&] {
            seen.joined = orv::linuxtest::joinNamedNamespace(ns_);
            if (!seen.joined) return;
            auto channel = std::make_shared<IoctlEthtoolChannel>();
            LinuxNetwork network("/sys", channel);
            TmkCtl::Util::AutoVector<NN::Pnic> pnics(network.getPnics());
            for (auto* pnic : pnics) seen.listed.push_back(pnic->GetName());
            std::unique_ptr<NN::Pnic> byName(network.getPnicByName(nic_));
            seen.byNameIsNic = byName != nullptr;
            LinuxPnic pnic(nic_, NicKernel{channel});
            seen.mtu = pnic.GetMTU();
            seen.address = macText(pnic.GetVirtualMacAddress());
            seen.operationalUp = pnic.IsOperationalLinkUp();
            seen.speed = pnic.GetLinkSpeed();
            NN::PnicDriverInfo driver;
            pnic.GetPnicDriverInfo(driver);
            seen.driver = driver.name;
            seen.busInfo = driver.busInfo;
            seen.pci = pnic.GetPciDevice() != nullptr;
        });
        reader.join();
        return seen;
    }

    std::string nic_, ns_, peer_;
    bool created_ = false;
};

}  // namespace

TEST_F(MixedNamespace, LinkDataIsTheJoinedNamespacesInterfaceAsIpShowsIt)
{
    const Seen seen = readInside();
    ASSERT_TRUE(seen.joined);
    auto link = nlohmann::json::parse(insideOutput("ip -d -j link show dev " + nic_)).at(0);
    EXPECT_EQ(seen.mtu, link["mtu"].get<unsigned>());
    EXPECT_EQ(seen.mtu, 1280u);
    EXPECT_EQ(seen.address, link["address"].get<std::string>());
    EXPECT_EQ(seen.operationalUp, link["operstate"] == "UP");
    EXPECT_FALSE(link.contains("parentbus"));  // a veth sits on no bus
    auto settings = insideOutput("ethtool " + nic_);
    EXPECT_EQ(std::to_string(seen.speed) + "Mb/s", fieldAfter(settings, "Speed"));
}

TEST_F(MixedNamespace, DriverIsTheJoinedNamespacesAndNoPciIdentityOfThisMachinesNic)
{
    const Seen seen = readInside();
    ASSERT_TRUE(seen.joined);
    auto drvinfo = insideOutput("ethtool -i " + nic_);
    EXPECT_EQ(seen.driver, fieldAfter(drvinfo, "driver"));
    EXPECT_EQ(seen.driver, "veth");
    EXPECT_EQ(seen.busInfo, fieldAfter(drvinfo, "bus-info"));
    EXPECT_FALSE(seen.pci) << "the veth got the PCI identity of this machine's " << nic_;
    // sysfs, seen from the joined thread, still shows this machine's NIC on its bus
    EXPECT_TRUE(toolOutput("readlink /sys/class/net/" + nic_ + "/device"));
}

TEST_F(MixedNamespace, ListingHasOnlyTheJoinedNamespacesNics)
{
    const Seen seen = readInside();
    ASSERT_TRUE(seen.joined);
    EXPECT_TRUE(seen.listed.empty()) << "listed " << seen.listed.front() << " of this machine's namespace";
    EXPECT_FALSE(seen.byNameIsNic) << nic_ << " inside the namespace is a veth, no NIC";
}
