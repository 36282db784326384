// The substitute in a network namespace the test creates and removes itself,
// joined to this namespace by a veth pair. The inner end lives in the test
// namespace (seen through getifaddrs after the test thread joins it); the outer
// end stays in this namespace, where sysfs shows it. A veth has no bus device,
// so it is a kernel interface for the address nodes but never a NIC.
#include "linux_backend.hpp"
#include "linux_pnic.hpp"
#include "stack_params.hpp"
#include "tool_output.hpp"

#include "nodemgr/lib/NodeMgrException.h"
#include "tmkctl/util/AutoVector.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <unistd.h>

using namespace orv::linuxhost;
using orv::linuxtest::runTool;
using orv::linuxtest::stackParams;
using orv::linuxtest::toolOutput;
namespace NN = NodeMgr::Network;
using Params = orv::platform::KsiParams;

namespace {

class VethNamespace : public ::testing::Test {
protected:
    void SetUp() override
    {
        const std::string id = std::to_string(::getpid() % 100000);
        ns_ = "orvns" + id;
        outer_ = "orvo" + id;
        inner_ = "orvi" + id;
        ASSERT_EQ(::geteuid(), 0u) << "these tests create network namespaces and veth pairs: run them as root";
        ASSERT_TRUE(runTool("ip netns add " + ns_)) << "`ip netns add` failed: network namespaces are unavailable";
        created_ = true;
        ASSERT_TRUE(runTool("ip link add " + outer_ + " type veth peer name " + inner_ + " netns " + ns_))
            << "cannot create a veth pair (is the veth driver available?)";
        ASSERT_TRUE(inside("ip link set " + inner_ + " up"));
        ASSERT_TRUE(runTool("ip link set " + outer_ + " up"));
        home_ = ::open("/proc/self/ns/net", O_RDONLY | O_CLOEXEC);
        ASSERT_GE(home_, 0);
        channel_ = std::make_shared<IoctlEthtoolChannel>();
    }

    void TearDown() override
    {
        leave();
        if (home_ >= 0) ::close(home_);
        runTool("ip link del " + outer_);
        if (created_) runTool("ip netns del " + ns_);
    }

    bool inside(const std::string& command) { return runTool("ip netns exec " + ns_ + " " + command); }

    // The test thread joins the test namespace (sockets made afterwards live there).
    void enter()
    {
        int fd = ::open(("/var/run/netns/" + ns_).c_str(), O_RDONLY | O_CLOEXEC);
        ASSERT_GE(fd, 0);
        ASSERT_EQ(::setns(fd, CLONE_NEWNET), 0);
        ::close(fd);
        entered_ = true;
    }
    void leave()
    {
        if (entered_) ::setns(home_, CLONE_NEWNET);
        entered_ = false;
    }

    std::vector<std::string> vnics(LinuxKsi& ksi)
    {
        std::optional<Params> list;
        EXPECT_EQ(ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics, stackParams({}), list), KSI_OK);
        std::vector<std::string> names;
        for (const auto& param : list.value_or(Params{})) names.push_back(param.text);
        return names;
    }

    std::vector<std::string> ipv6Of(LinuxKsi& ksi, const std::string& name)
    {
        std::optional<Params> list;
        if (ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, stackParams({name}), list) != KSI_OK) return {};
        std::vector<std::string> texts;
        for (const auto& param : *list) texts.push_back(param.text);
        return texts;
    }

    LinuxPnic outerPnic() { return LinuxPnic(outer_, NicKernel{channel_}); }

    std::string ns_, outer_, inner_;
    int home_ = -1;
    bool created_ = false;
    bool entered_ = false;
    std::shared_ptr<EthtoolChannel> channel_;
};

}  // namespace

TEST_F(VethNamespace, AddressesAddedAndRemovedAreSeenOnTheNextRequest)
{
    ASSERT_TRUE(inside("ip addr add 10.77.1.2/24 dev " + inner_));
    ASSERT_TRUE(inside("ip -6 addr add fd77::2/64 dev " + inner_ + " nodad"));
    enter();
    LinuxKsi ksi(LinuxRoots{});
    EXPECT_EQ(vnics(ksi), std::vector<std::string>{inner_});  // loopback left out
    std::uint32_t address = 0, mask = 0;
    ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 4), KSI_OK);
    ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, stackParams({inner_}), &mask, 4), KSI_OK);
    EXPECT_EQ(address, inet_addr("10.77.1.2"));
    EXPECT_EQ(mask, inet_addr("255.255.255.0"));
    auto v6 = ipv6Of(ksi, inner_);
    ASSERT_NE(std::find(v6.begin(), v6.end(), "fd77::2"), v6.end());
    TcpipKsi_VnicIPv6AddrSummary summary{};
    ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary, stackParams({inner_, "fd77::2"}), &summary,
                      sizeof summary), KSI_OK);
    EXPECT_EQ(summary.prefixLength, 64u);

    ASSERT_TRUE(inside("ip addr del 10.77.1.2/24 dev " + inner_));
    ASSERT_TRUE(inside("ip -6 addr del fd77::2/64 dev " + inner_));
    ksi.invalidate();  // the next request
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 4), KSI_ERR_NOT_FOUND);
    v6 = ipv6Of(ksi, inner_);
    EXPECT_EQ(std::find(v6.begin(), v6.end(), "fd77::2"), v6.end());
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary, stackParams({inner_, "fd77::2"}), &summary,
                      sizeof summary), KSI_ERR_NOT_FOUND);
}

TEST_F(VethNamespace, FirstIpv4AddressIsThePrimaryOne)
{
    ASSERT_TRUE(inside("ip addr add 10.77.2.1/16 dev " + inner_));
    ASSERT_TRUE(inside("ip addr add 10.78.2.1/24 dev " + inner_));
    enter();
    LinuxKsi ksi(LinuxRoots{});
    std::uint32_t address = 0, mask = 0;
    ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 4), KSI_OK);
    ASSERT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, stackParams({inner_}), &mask, 4), KSI_OK);
    EXPECT_EQ(address, inet_addr("10.77.2.1"));
    EXPECT_EQ(mask, inet_addr("255.255.0.0"));
}

TEST_F(VethNamespace, UnknownStackAndWrongParametersAreRefused)
{
    enter();
    LinuxKsi ksi(LinuxRoots{});
    std::optional<Params> list;
    EXPECT_EQ(ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics, {KSI_Param::ofString("otherStack")}, list),
              KSI_ERR_NOT_FOUND);
    std::uint32_t address = 0;
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({}), &address, 4), KSI_ERR_BAD_PARAM);
    ASSERT_TRUE(inside("ip addr add 10.77.3.1/24 dev " + inner_));
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 8), KSI_ERR_BUFFER_SIZE);
}

TEST_F(VethNamespace, InterfaceDeletedDuringARequestIsGoneOnTheNext)
{
    ASSERT_TRUE(inside("ip addr add 10.77.4.1/24 dev " + inner_));
    enter();
    LinuxKsi ksi(LinuxRoots{});
    ASSERT_EQ(vnics(ksi), std::vector<std::string>{inner_});
    ASSERT_TRUE(inside("ip link del " + inner_));  // takes the outer end with it
    // The request that listed it reads it as its listing saw it.
    std::uint32_t address = 0, mask = 0;
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 4), KSI_OK);
    EXPECT_EQ(address, inet_addr("10.77.4.1"));
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, stackParams({inner_}), &mask, 4), KSI_OK);
    // The next request no longer finds it.
    ksi.invalidate();
    EXPECT_TRUE(vnics(ksi).empty());
    EXPECT_EQ(ksi.get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, stackParams({inner_}), &address, 4), KSI_ERR_NOT_FOUND);
    std::optional<Params> list;
    EXPECT_EQ(ksi.getInstanceList(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, stackParams({inner_}), list),
              KSI_ERR_NOT_FOUND);
    leave();
    // the outer end, read as a pnic, fails its calls alone
    auto pnic = outerPnic();
    EXPECT_THROW(pnic.GetMTU(), NodeMgr::Lib::NodeMgrException);
    NN::PnicDriverInfo driver;
    EXPECT_THROW(pnic.GetPnicDriverInfo(driver), NodeMgr::Lib::NodeMgrException);
    NN::PnicStats stats;
    EXPECT_THROW(pnic.GetPnicStats(stats), NodeMgr::Lib::NodeMgrException);
}

TEST_F(VethNamespace, VethIsNoNicButAnswersItsLinkCalls)
{
    LinuxNetwork network("/sys", channel_);
    TmkCtl::Util::AutoVector<NN::Pnic> pnics(network.getPnics());
    for (auto* pnic : pnics) EXPECT_NE(pnic->GetName(), outer_);
    EXPECT_EQ(network.getPnicByName(outer_), nullptr);
    auto pnic = outerPnic();
    NN::PnicDriverInfo driver;
    pnic.GetPnicDriverInfo(driver);
    EXPECT_EQ(driver.name, "veth");
    EXPECT_EQ(pnic.GetPciDevice(), nullptr);
}

TEST_F(VethNamespace, LinkDownAndUpSeenAfterRefresh)
{
    auto pnic = outerPnic();
    EXPECT_TRUE(pnic.IsEnabled());
    EXPECT_TRUE(pnic.IsLinkUp());
    ASSERT_TRUE(inside("ip link set " + inner_ + " down"));  // the peer going down drops the carrier
    EXPECT_TRUE(pnic.IsLinkUp());  // the pnic is its request's snapshot
    pnic.Refresh();
    EXPECT_TRUE(pnic.IsEnabled());
    EXPECT_FALSE(pnic.IsLinkUp());
    ASSERT_TRUE(runTool("ip link set " + outer_ + " down"));
    pnic.Refresh();
    EXPECT_FALSE(pnic.IsEnabled());
    EXPECT_FALSE(pnic.IsAdministrativeLinkUp());
    NN::PnicInfo info;
    pnic.GetPnicInfo(info);
    EXPECT_EQ(info.linkStatus, "Down");
    ASSERT_TRUE(runTool("ip link set " + outer_ + " up"));
    ASSERT_TRUE(inside("ip link set " + inner_ + " up"));
    pnic.Refresh();
    EXPECT_TRUE(pnic.IsEnabled());
    EXPECT_TRUE(pnic.IsLinkUp());
}

TEST_F(VethNamespace, MtuChangedSeenByTheNextPnic)
{
    EXPECT_EQ(outerPnic().GetMTU(), 1500u);
    ASSERT_TRUE(runTool("ip link set " + outer_ + " mtu 1280"));
    EXPECT_EQ(outerPnic().GetMTU(), 1280u);
    EXPECT_EQ(toolOutput("cat /sys/class/net/" + outer_ + "/mtu").value_or(""), "1280\n");
}

TEST_F(VethNamespace, PnicWhoseInterfaceVanishesKeepsItsLinkAnswerAndFailsEthtoolCalls)
{
    auto route = std::make_shared<RouteLinks>();
    LinuxPnic pnic(outer_, NicKernel{channel_, nullptr, route}, route->named(outer_));  // as a listing hands it over
    ASSERT_TRUE(runTool("ip link del " + outer_));
    EXPECT_EQ(pnic.GetMTU(), 1500u);  // the request's snapshot
    EXPECT_TRUE(pnic.IsEnabled());
    NN::PnicDriverInfo driver;
    EXPECT_THROW(pnic.GetPnicDriverInfo(driver), NodeMgr::Lib::NodeMgrException);
    pnic.Refresh();  // the next look finds it gone
    EXPECT_THROW(pnic.GetMTU(), NodeMgr::Lib::NodeMgrException);
}
