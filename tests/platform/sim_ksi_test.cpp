// Kernel system-information nodes answered by the sim substitute.
#include <gtest/gtest.h>

#include <arpa/inet.h>

#include <cstring>

#include "KsiHelpers.h"
#include "SimHost.h"

namespace orv::platform::test {
namespace {

TEST(SimKsi, CheckSigAcceptsTheInterfaceSignatureOnly)
{
    SimHost host(defaultHost());
    EXPECT_EQ(checkSignature(), KSI_OK);
    char wrong[KSI_SIGNATURE_LENGTH] = "not the signature!!";
    uint32_t word = 0;
    EXPECT_EQ(KSI_CheckSig(wrong, KSI_SIGNATURE_LENGTH, &word), KSI_ERR_SIGNATURE);
    EXPECT_EQ(KSI_CheckSig(KSI_SIGNATURE, KSI_SIGNATURE_LENGTH - 1, &word), KSI_ERR_SIGNATURE);
}

TEST(SimKsi, VnicListIsTheStacksVnicsWithEmptySlots)
{
    Json fixture = defaultHost();
    fixture["tcpipStacks"]["defaultTcpipStack"]["vnics"].push_back(nullptr);
    SimHost host(fixture);
    ListPtr stack = stringParams({"defaultTcpipStack"});
    KSI_ParamList* raw = nullptr;
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics, stack.get(), &raw), KSI_OK);
    ListPtr vnics(raw);
    ASSERT_EQ(KSI_ParamListUsedCount(vnics.get()), 3u);
    EXPECT_EQ(instanceNames(vnics.get()), (std::vector<std::string>{"vif0", "vif1", ""}));
    EXPECT_EQ(KSI_ParamListGetParam(vnics.get(), 2), nullptr);
}

TEST(SimKsi, UnknownStackIsNotFound)
{
    SimHost host(defaultHost());
    ListPtr stack = stringParams({"otherStack"});
    KSI_ParamList* raw = nullptr;
    EXPECT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics, stack.get(), &raw), KSI_ERR_NOT_FOUND);
    EXPECT_EQ(raw, nullptr);
}

TEST(SimKsi, Ipv4AddressAndNetmaskInNetworkByteOrder)
{
    Json fixture = defaultHost();
    fixture["tcpipStacks"]["defaultTcpipStack"]["vnics"][1]["ipv4"] = {{"address", "0.0.0.0"}, {"netmask", "255.255.0.0"}};
    SimHost host(fixture);
    ListPtr params = stringParams({"defaultTcpipStack", "vif0"});
    uint32_t address = 0;
    uint32_t netmask = 0;
    ASSERT_EQ(KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, params.get(), &address, 4), KSI_OK);
    ASSERT_EQ(KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, params.get(), &netmask, 4), KSI_OK);
    EXPECT_STREQ(inet_ntoa(in_addr{address}), "10.0.0.10");
    EXPECT_STREQ(inet_ntoa(in_addr{netmask}), "255.255.255.0");
    ListPtr second = stringParams({"defaultTcpipStack", "vif1"});
    ASSERT_EQ(KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, second.get(), &address, 4), KSI_OK);
    EXPECT_EQ(address, 0u);
}

TEST(SimKsi, VnicWithoutIpv4FailsTheAddressRead)
{
    Json fixture = defaultHost();
    fixture["tcpipStacks"]["defaultTcpipStack"]["vnics"][0].erase("ipv4");
    SimHost host(fixture);
    ListPtr params = stringParams({"defaultTcpipStack", "vif0"});
    uint32_t address = 0;
    EXPECT_EQ(KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, params.get(), &address, 4), KSI_ERR_NOT_FOUND);
}

TEST(SimKsi, Ipv6AddressesAndTheirSummaries)
{
    SimHost host(defaultHost());
    ListPtr params = stringParams({"defaultTcpipStack", "vif1"});
    KSI_ParamList* raw = nullptr;
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, params.get(), &raw), KSI_OK);
    ListPtr addresses(raw);
    const std::vector<std::string> names = instanceNames(addresses.get());
    ASSERT_EQ(names, (std::vector<std::string>{"fe80::250:56ff:fe01:1", "fd00:1::1"}));
    KSI_ParamListAddString(params.get(), names[1].c_str());
    TcpipKsi_VnicIPv6AddrSummary summary;
    std::memset(&summary, 0x55, sizeof summary);
    ASSERT_EQ(KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary, params.get(), &summary, 68), KSI_OK);
    EXPECT_STREQ(summary.address, "fd00:1::1");
    EXPECT_EQ(summary.prefixLength, 64u);
}

TEST(SimKsi, NullAndMissingIpv6ListsDiffer)
{
    Json fixture = defaultHost();
    fixture["tcpipStacks"]["defaultTcpipStack"]["vnics"][0]["ipv6"] = nullptr;
    fixture["tcpipStacks"]["defaultTcpipStack"]["vnics"][1].erase("ipv6");
    SimHost host(fixture);
    KSI_ParamList* raw = reinterpret_cast<KSI_ParamList*>(1);
    ListPtr first = stringParams({"defaultTcpipStack", "vif0"});
    EXPECT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, first.get(), &raw), KSI_OK);
    EXPECT_EQ(raw, nullptr);
    ListPtr second = stringParams({"defaultTcpipStack", "vif1"});
    EXPECT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, second.get(), &raw),
              KSI_ERR_NOT_FOUND);
}

TEST(SimKsi, WrongBufferSizeIsRefused)
{
    SimHost host(defaultHost());
    PowerKsi_Policy policy;
    EXPECT_EQ(KSI_Get(KSI_NODE_power_currentPolicy, nullptr, &policy, sizeof policy - 4), KSI_ERR_BUFFER_SIZE);
}

TEST(SimKsi, CpuGlobalNodesAreTheFixtures)
{
    Json fixture = defaultHost();
    fixture["cpu"]["powerPolicy"]["shortName"] = "OFF";
    fixture["cpu"]["htState"] = "HTTMKDisabled";
    Json bytes = Json::array();
    for (int i = 0; i < 48; ++i) {
        bytes.push_back(i == 3 ? 0x09 : 0x41 + (i % 26));
    }
    bytes[47] = 0xC3;
    fixture["cpu"]["modelName"] = bytes;
    SimHost host(fixture);
    PowerKsi_Policy policy;
    ASSERT_EQ(KSI_Get(KSI_NODE_power_currentPolicy, nullptr, &policy, sizeof policy), KSI_OK);
    EXPECT_STREQ(policy.shortName, "OFF");
    EXPECT_EQ(policy.id, 2u);
    Hardware_CPUGlobalInfoStruct global;
    ASSERT_EQ(KSI_Get(KSI_NODE_hardware_cpu_cpuInfo, nullptr, &global, sizeof global), KSI_OK);
    EXPECT_EQ(global.htState, HTTMKDisabled);
    EXPECT_EQ(global.numPackages, 2u);
    KSI_HardwareCharArray48 model;
    ASSERT_EQ(KSI_Get(KSI_NODE_hardware_cpu_cpuModelName, nullptr, model, sizeof model), KSI_OK);
    EXPECT_EQ(model[3], '\t');
    EXPECT_EQ(static_cast<unsigned char>(model[47]), 0xC3);
    EXPECT_EQ(model[0], 'A');
}

TEST(SimKsi, PackagesAndCpusByInstanceNumber)
{
    Json fixture = defaultHost();
    fixture["cpu"]["packages"] = {{{"instance", 7}, {"cores", 3}}, {{"instance", -2}, {"cores", 0}}};
    fixture["cpu"]["cpus"][4]["stepping"] = 11;
    fixture["cpu"]["cpus"][4]["cpuid"]["id1"][2] = "0x80000000";
    fixture["cpu"]["cpus"][4]["halted"] = true;
    fixture["cpu"]["cpus"][4]["activeLoad"] = 77;
    SimHost host(fixture);
    KSI_ParamList* raw = nullptr;
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_hardware_cpu_packageList, nullptr, &raw), KSI_OK);
    ListPtr packages(raw);
    ASSERT_EQ(KSI_ParamListUsedCount(packages.get()), 2u);
    int32_t instance = 0;
    ASSERT_EQ(KSI_ParamListGetInt32(packages.get(), 1, &instance), KSI_OK);
    EXPECT_EQ(instance, -2);
    Hardware_CPUPackageInfoStruct package;
    ListPtr first = intParams(7);
    ASSERT_EQ(KSI_Get(KSI_NODE_hardware_cpu_packageList, first.get(), &package, sizeof package), KSI_OK);
    EXPECT_EQ(package.numCores, 3u);
    ListPtr cpu = intParams(4);
    Hardware_PCPUInfoStruct info;
    ASSERT_EQ(KSI_Get(KSI_NODE_hardware_cpu_cpuList, cpu.get(), &info, sizeof info), KSI_OK);
    EXPECT_EQ(info.family, 6);
    EXPECT_EQ(info.stepping, 11);
    EXPECT_EQ(info.cpuid.id0.ebx, 0x756E6547u);
    EXPECT_EQ(info.cpuid.id1.ecx, 0x80000000u);
    SchedKsi_PcpuInfo stats;
    ASSERT_EQ(KSI_Get(KSI_NODE_sched_pcpus_stats, cpu.get(), &stats, sizeof stats), KSI_OK);
    EXPECT_EQ(stats.halted, 1);
    SchedKsi_PcpuLoad load;
    ASSERT_EQ(KSI_Get(KSI_NODE_sched_pcpus_load, cpu.get(), &load, sizeof load), KSI_OK);
    EXPECT_EQ(load.activeLoad, 77u);
    ListPtr missing = intParams(999);
    EXPECT_EQ(KSI_Get(KSI_NODE_sched_pcpus_load, missing.get(), &load, sizeof load), KSI_ERR_NOT_FOUND);
}

TEST(SimKsi, NullPackageListAndEmptyPackageList)
{
    Json fixture = defaultHost();
    fixture["cpu"]["packages"] = nullptr;
    SimHost host(fixture);
    KSI_ParamList* raw = reinterpret_cast<KSI_ParamList*>(1);
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_hardware_cpu_packageList, nullptr, &raw), KSI_OK);
    EXPECT_EQ(raw, nullptr);
    fixture["cpu"]["packages"] = Json::array();
    host.rewrite(fixture);
    ASSERT_EQ(checkSignature(), KSI_OK);  // starts a new batch: the change is seen
    ASSERT_EQ(KSI_GetInstanceListAlloc(KSI_NODE_hardware_cpu_packageList, nullptr, &raw), KSI_OK);
    ListPtr packages(raw);
    ASSERT_NE(raw, nullptr);
    EXPECT_EQ(KSI_ParamListUsedCount(raw), 0u);
}

TEST(SimKsiParamList, AddRemoveAndReadBack)
{
    SimHost host(defaultHost());
    ListPtr list(KSI_ParamListCreate(1, 1));
    ASSERT_NE(list, nullptr);
    EXPECT_EQ(KSI_ParamListAddString(list.get(), "a"), KSI_OK);
    EXPECT_EQ(KSI_ParamListAddInt(list.get(), -5), KSI_OK);
    EXPECT_EQ(KSI_ParamListUsedCount(list.get()), 2u);
    int32_t value = 0;
    EXPECT_EQ(KSI_ParamListGetInt32(list.get(), 1, &value), KSI_OK);
    EXPECT_EQ(value, -5);
    EXPECT_EQ(KSI_ParamListGetInt32(list.get(), 0, &value), KSI_ERR_BAD_PARAM);
    EXPECT_EQ(KSI_ParamGetString(KSI_ParamListGetParam(list.get(), 1)), nullptr);
    EXPECT_STREQ(KSI_ParamGetString(KSI_ParamListGetParam(list.get(), 0)), "a");
    EXPECT_EQ(KSI_ParamListRemoveLastParam(list.get()), KSI_OK);
    EXPECT_EQ(KSI_ParamListRemoveLastParam(list.get()), KSI_OK);
    EXPECT_EQ(KSI_ParamListRemoveLastParam(list.get()), KSI_ERR_BAD_PARAM);
    EXPECT_EQ(KSI_ParamListUsedCount(nullptr), 0u);
}

} // namespace
} // namespace orv::platform::test
