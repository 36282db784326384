#include "KsiNodeReads.h"

#include <cstring>
#include <numeric>

namespace orv::platform::sim {
namespace {

// Checks that params are exactly the given kinds.
bool paramsAre(const KsiParams& params, std::initializer_list<KSI_Param::Kind> kinds)
{
    if (params.size() != kinds.size()) {
        return false;
    }
    size_t i = 0;
    for (KSI_Param::Kind kind : kinds) {
        if (params[i++].kind != kind) {
            return false;
        }
    }
    return true;
}

constexpr auto kString = KSI_Param::Kind::String;
constexpr auto kInt = KSI_Param::Kind::Int;

template <typename Record>
KSI_Status copyOut(const Record& record, void* out, uint32_t outSize)
{
    if (out == nullptr || outSize != sizeof(Record)) {
        return KSI_ERR_BUFFER_SIZE;
    }
    std::memcpy(out, &record, sizeof(Record));
    return KSI_OK;
}

const VnicModel* findVnic(const HostModel& host, const KsiParams& params)
{
    if (!host.tcpipStacks) {
        return nullptr;
    }
    auto stack = host.tcpipStacks->find(params[0].text);
    if (stack == host.tcpipStacks->end()) {
        return nullptr;
    }
    for (const VnicModel& vnic : stack->second.vnics.items) {
        if (!vnic.emptySlot && vnic.name == params[1].text) {
            return &vnic;
        }
    }
    return nullptr;
}

template <typename Item>
const Item* findInstance(const InstanceList<Item>& list, int64_t instance)
{
    for (const Item& item : list.items) {
        if (item.instance == instance) {
            return &item;
        }
    }
    return nullptr;
}

template <typename Item, typename ToParam>
KSI_Status answerList(const InstanceList<Item>& source, std::optional<KsiParams>& list, ToParam toParam)
{
    if (source.state == ListState::Missing) {
        return KSI_ERR_NOT_FOUND;
    }
    if (source.state == ListState::Present) {
        list.emplace();
        for (const Item& item : source.items) {
            list->push_back(toParam(item));
        }
    }
    return KSI_OK;
}

KSI_Status readTcpip(const HostModel& host, KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    const bool summary = node == KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary;
    if (!(summary ? paramsAre(params, {kString, kString, kString}) : paramsAre(params, {kString, kString}))) {
        return KSI_ERR_BAD_PARAM;
    }
    const VnicModel* vnic = findVnic(host, params);
    if (vnic == nullptr) {
        return KSI_ERR_NOT_FOUND;
    }
    if (!summary) {
        if (!vnic->ipv4) {
            return KSI_ERR_NOT_FOUND;
        }
        const bool address = node == KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr;
        return copyOut(address ? vnic->ipv4->address : vnic->ipv4->netmask, out, outSize);
    }
    for (const Ipv6Model& ipv6 : vnic->ipv6.items) {
        if (ipv6.address == params[2].text) {
            TcpipKsi_VnicIPv6AddrSummary record{};
            std::memcpy(record.address, ipv6.address.data(), ipv6.address.size());
            record.prefixLength = ipv6.prefixLength;
            return copyOut(record, out, outSize);
        }
    }
    return KSI_ERR_NOT_FOUND;
}

Hardware_CPUGlobalInfoStruct globalInfo(const CpuModel& cpu)
{
    Hardware_CPUGlobalInfoStruct info{};
    info.htState = cpu.htState;
    info.numPackages = static_cast<uint32_t>(cpu.packages.items.size());
    info.numCores = std::accumulate(cpu.packages.items.begin(), cpu.packages.items.end(), 0u,
                                    [](uint32_t sum, const PackageModel& p) { return sum + p.cores; });
    info.numPCPUs = static_cast<uint32_t>(cpu.cpus.items.size());
    info.numNumaNodes = 1;
    return info;
}

KSI_Status readPerCpu(const CpuModel& cpu, KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    if (!paramsAre(params, {kInt})) {
        return KSI_ERR_BAD_PARAM;
    }
    if (node == KSI_NODE_hardware_cpu_packageList) {
        const PackageModel* package = findInstance(cpu.packages, params[0].intValue);
        return package == nullptr ? KSI_ERR_NOT_FOUND : copyOut(Hardware_CPUPackageInfoStruct{package->cores}, out, outSize);
    }
    const PcpuModel* pcpu = findInstance(cpu.cpus, params[0].intValue);
    if (pcpu == nullptr) {
        return KSI_ERR_NOT_FOUND;
    }
    if (node == KSI_NODE_hardware_cpu_cpuList) {
        Hardware_PCPUInfoStruct info{};
        info.family = pcpu->family;
        info.model = pcpu->model;
        info.type = pcpu->type;
        info.stepping = pcpu->stepping;
        info.pcpuId = static_cast<uint32_t>(pcpu->instance);
        info.cpuid = pcpu->cpuid;
        return copyOut(info, out, outSize);
    }
    if (node == KSI_NODE_sched_pcpus_stats) {
        SchedKsi_PcpuInfo info{};
        info.halted = pcpu->halted ? 1 : 0;
        return copyOut(info, out, outSize);
    }
    SchedKsi_PcpuLoad load{};
    load.nrActive = pcpu->activeLoad != 0 ? 1 : 0;
    load.nrAssociated = 1;
    load.activeLoad = pcpu->activeLoad;
    return copyOut(load, out, outSize);
}

KSI_Status readCpuNode(const HostModel& host, KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    if (!host.cpu) {
        return KSI_ERR_NOT_FOUND;
    }
    const CpuModel& cpu = *host.cpu;
    const bool global = node == KSI_NODE_power_currentPolicy || node == KSI_NODE_hardware_cpu_cpuInfo ||
                        node == KSI_NODE_hardware_cpu_cpuModelName;
    if (!global) {
        return readPerCpu(cpu, node, params, out, outSize);
    }
    if (!params.empty()) {
        return KSI_ERR_BAD_PARAM;
    }
    if (node == KSI_NODE_power_currentPolicy) {
        return copyOut(cpu.powerPolicy, out, outSize);
    }
    if (node == KSI_NODE_hardware_cpu_cpuInfo) {
        return copyOut(globalInfo(cpu), out, outSize);
    }
    return copyOut(cpu.modelName, out, outSize);
}

KSI_Status listTcpip(const HostModel& host, KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list)
{
    const bool vnics = node == KSI_NODE_net_tcpip_instances_vNics;
    if (vnics) {
        if (!paramsAre(params, {kString})) {
            return KSI_ERR_BAD_PARAM;
        }
        if (!host.tcpipStacks || host.tcpipStacks->count(params[0].text) == 0) {
            return KSI_ERR_NOT_FOUND;
        }
        return answerList(host.tcpipStacks->at(params[0].text).vnics, list, [](const VnicModel& vnic) {
            return vnic.emptySlot ? KSI_Param{} : KSI_Param::ofString(vnic.name);
        });
    }
    if (!paramsAre(params, {kString, kString})) {
        return KSI_ERR_BAD_PARAM;
    }
    const VnicModel* vnic = findVnic(host, params);
    if (vnic == nullptr) {
        return KSI_ERR_NOT_FOUND;
    }
    return answerList(vnic->ipv6, list, [](const Ipv6Model& ipv6) { return KSI_Param::ofString(ipv6.address); });
}

} // namespace

KSI_Status readNode(const HostModel& host, KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    switch (node) {
    case KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr:
    case KSI_NODE_net_tcpip_instances_vNics_v4_netmask:
    case KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary:
        return readTcpip(host, node, params, out, outSize);
    case KSI_NODE_power_currentPolicy:
    case KSI_NODE_hardware_cpu_cpuInfo:
    case KSI_NODE_hardware_cpu_cpuModelName:
    case KSI_NODE_hardware_cpu_packageList:
    case KSI_NODE_hardware_cpu_cpuList:
    case KSI_NODE_sched_pcpus_stats:
    case KSI_NODE_sched_pcpus_load:
        return readCpuNode(host, node, params, out, outSize);
    default:
        return KSI_ERR_NOT_FOUND;
    }
}

KSI_Status listNode(const HostModel& host, KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list)
{
    switch (node) {
    case KSI_NODE_net_tcpip_instances_vNics:
    case KSI_NODE_net_tcpip_instances_vNics_v6_addresses:
        return listTcpip(host, node, params, list);
    case KSI_NODE_hardware_cpu_packageList:
    case KSI_NODE_hardware_cpu_cpuList:
        if (!params.empty()) {
            return KSI_ERR_BAD_PARAM;
        }
        if (!host.cpu) {
            return KSI_ERR_NOT_FOUND;
        }
        if (node == KSI_NODE_hardware_cpu_packageList) {
            return answerList(host.cpu->packages, list, [](const PackageModel& p) { return KSI_Param::ofInt(p.instance); });
        }
        return answerList(host.cpu->cpus, list, [](const PcpuModel& c) { return KSI_Param::ofInt(c.instance); });
    default:
        return KSI_ERR_NOT_FOUND;
    }
}

} // namespace orv::platform::sim
