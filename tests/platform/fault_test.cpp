// Injected failures fire exactly where the fixture asks and nowhere else.
#include <gtest/gtest.h>

#include <cerrno>

#include "KsiHelpers.h"
#include "SimHost.h"
#include "orv/platform/HostInfo.h"
#include "tmkctl/network/NetworkInfoImpl.h"
#include "tmkctl/util/AutoVector.h"
#include "tmkuser/Version.h"

namespace orv::platform::test {
namespace {

using namespace NodeMgr::Network;
using NodeMgr::Lib::NodeMgrException;
using TmkCtl::Network::NetworkInfoImpl;
using TmkCtl::Util::AutoVector;

TEST(PnicFault, NamedOperationThrowsForTheNamedNicOnly)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetPnicStats"}, {"nic", "vmnic1"}, {"message", "stats unavailable"}});
    SimHost host(fixture);
    AutoVector<Pnic> pnics = NetworkInfoImpl().GetPnics();
    PnicStats stats;
    EXPECT_NO_THROW(pnics[0]->GetPnicStats(stats));
    try {
        pnics[1]->GetPnicStats(stats);
        FAIL() << "no exception";
    } catch (const NodeMgrException& error) {
        EXPECT_STREQ(error.what(), "stats unavailable");
    }
    PnicInfo info;
    EXPECT_NO_THROW(pnics[1]->GetPnicInfo(info));
}

TEST(PnicFault, PciDeviceReadCanFail)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetVendorId"}, {"nic", "vmnic0"}});
    SimHost host(fixture);
    std::unique_ptr<Pnic> pnic(NetworkInfoImpl().GetPnicByName("vmnic0"));
    PciDevice* pci = pnic->GetPciDevice();
    EXPECT_NO_THROW(pci->GetBus());
    EXPECT_THROW(pci->GetVendorId(), NodeMgrException);
}

TEST(PnicFault, NthInvocationOnlyFires)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetName"}, {"nth", 2}});
    SimHost host(fixture);
    AutoVector<Pnic> pnics = NetworkInfoImpl().GetPnics();
    EXPECT_NO_THROW(pnics[0]->GetName());
    EXPECT_THROW(pnics[1]->GetName(), NodeMgrException);
    EXPECT_NO_THROW(pnics[2]->GetName());
    EXPECT_NO_THROW(pnics[1]->GetName());
}

TEST(NetworkFault, GetPnicsThrows)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetPnics"}});
    SimHost host(fixture);
    NetworkInfoImpl network;
    EXPECT_THROW(network.GetPnics(), NodeMgrException);
    std::unique_ptr<Pnic> pnic(network.GetPnicByName("vmnic0"));
    EXPECT_NE(pnic, nullptr);
}

TEST(NetworkFault, GetPnicByNameThrowsForTheNamedNic)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetPnicByName"}, {"param", "vmnic2"}});
    SimHost host(fixture);
    NetworkInfoImpl network;
    EXPECT_THROW(network.GetPnicByName("vmnic2"), NodeMgrException);
    std::unique_ptr<Pnic> other(network.GetPnicByName("vmnic1"));
    EXPECT_NE(other, nullptr);
}

TEST(KsiFault, SignatureCheckFails)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_CheckSig"}, {"status", 9}});
    SimHost host(fixture);
    EXPECT_EQ(checkSignature(), 9);
}

TEST(KsiFault, NamedNodeFailsOthersAnswer)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_Get"}, {"node", "KSI_NODE_hardware_cpu_cpuInfo"}});
    SimHost host(fixture);
    Hardware_CPUGlobalInfoStruct global;
    EXPECT_EQ(KSI_Get(KSI_NODE_hardware_cpu_cpuInfo, nullptr, &global, sizeof global), KSI_ERR_FAILURE);
    PowerKsi_Policy policy;
    EXPECT_EQ(KSI_Get(KSI_NODE_power_currentPolicy, nullptr, &policy, sizeof policy), KSI_OK);
}

TEST(KsiFault, NodeFailsForANamedParameterOnItsNthRead)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_Get"}, {"node", "KSI_NODE_sched_pcpus_stats"}, {"param", "3"}, {"nth", 2}});
    SimHost host(fixture);
    SchedKsi_PcpuInfo stats;
    ListPtr cpu3 = intParams(3);
    ListPtr cpu4 = intParams(4);
    EXPECT_EQ(KSI_Get(KSI_NODE_sched_pcpus_stats, cpu3.get(), &stats, sizeof stats), KSI_OK);
    EXPECT_EQ(KSI_Get(KSI_NODE_sched_pcpus_stats, cpu4.get(), &stats, sizeof stats), KSI_OK);
    EXPECT_EQ(KSI_Get(KSI_NODE_sched_pcpus_stats, cpu3.get(), &stats, sizeof stats), KSI_ERR_FAILURE);
    EXPECT_EQ(KSI_Get(KSI_NODE_sched_pcpus_stats, cpu3.get(), &stats, sizeof stats), KSI_OK);
}

TEST(KsiFault, AppendingTheLastNicsNameFails)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_ParamListAddString"}, {"param", "vif1"}});
    SimHost host(fixture);
    ListPtr list(KSI_ParamListCreate(1, 1));
    EXPECT_EQ(KSI_ParamListAddString(list.get(), "defaultTcpipStack"), KSI_OK);
    EXPECT_EQ(KSI_ParamListAddString(list.get(), "vif0"), KSI_OK);
    EXPECT_EQ(KSI_ParamListRemoveLastParam(list.get()), KSI_OK);
    EXPECT_EQ(KSI_ParamListAddString(list.get(), "vif1"), KSI_ERR_FAILURE);
    EXPECT_EQ(KSI_ParamListUsedCount(list.get()), 1u);
}

TEST(KsiFault, InstanceListOfANamedVnicFails)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_GetInstanceListAlloc"}, {"node", "KSI_NODE_net_tcpip_instances_vNics_v6_addresses"},
                       {"param", "vif0"}, {"status", KSI_ERR_NOT_FOUND}});
    SimHost host(fixture);
    KSI_ParamList* raw = nullptr;
    ListPtr vif0 = stringParams({"defaultTcpipStack", "vif0"});
    EXPECT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, vif0.get(), &raw),
              KSI_ERR_NOT_FOUND);
    ListPtr vif1 = stringParams({"defaultTcpipStack", "vif1"});
    EXPECT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, vif1.get(), &raw), KSI_OK);
    ListPtr owned(raw);
}

TEST(KsiFault, ParamListCreateAnswersNull)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_ParamListCreate"}, {"nth", 2}});
    SimHost host(fixture);
    ListPtr first(KSI_ParamListCreate(1, 1));
    ListPtr second(KSI_ParamListCreate(1, 1));
    EXPECT_NE(first, nullptr);
    EXPECT_EQ(second, nullptr);
}

TEST(KsiFault, ListReadsCanFail)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_ParamListGetInt32"}, {"param", "1"}});
    addFault(fixture, {{"call", "KSI_ParamGetString"}, {"param", "vif0"}});
    SimHost host(fixture);
    KSI_ParamList* raw = nullptr;
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_hardware_cpu_packageList, nullptr, &raw), KSI_OK);
    ListPtr packages(raw);
    int32_t instance = -1;
    EXPECT_EQ(KSI_ParamListGetInt32(raw, 0, &instance), KSI_OK);
    EXPECT_EQ(KSI_ParamListGetInt32(raw, 1, &instance), KSI_ERR_FAILURE);
    EXPECT_EQ(instanceNames(stringParams({"vif0", "vif1"}).get()), (std::vector<std::string>{"", "vif1"}));
}

TEST(VersionFault, ServiceFailsWithTheGivenCodeAndText)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "TmkuserVersion_GetSystemVersion"}, {"status", 77}, {"errno", 5}, {"message", "busy"}});
    SimHost host(fixture);
    TmkuserVersion_SystemVersionInfo info;
    EXPECT_EQ(TmkuserVersion_GetSystemVersion(&info), 77u);
    EXPECT_EQ(TmkuserStatus_CodeToErrno(77), 5);
    char text[1024];
    EXPECT_STREQ(TmkuserStatus_CodeToString(77, text, sizeof text), "busy");
}

TEST(HostFault, SysinfoFailsWithTheGivenErrno)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "OrvHost_Sysinfo"}, {"status", EPERM}});
    SimHost host(fixture);
    struct sysinfo info;
    EXPECT_EQ(OrvHost_Sysinfo(&info), -1);
    EXPECT_EQ(errno, EPERM);
    char name[64];
    EXPECT_EQ(OrvHost_GetFqdn(name, sizeof name), 0);
}

} // namespace
} // namespace orv::platform::test
