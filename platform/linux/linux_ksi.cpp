#include "linux_ksi.hpp"

#include "cpuid_reader.hpp"
#include "ksi_records.hpp"
#include "linux_call_error.hpp"

#include <algorithm>
#include <atomic>
#include <cstring>
#include <unistd.h>

namespace orv::linuxhost {

using orv::platform::KsiParams;

namespace {

bool isString(const KsiParams& params, std::size_t index)
{
    return index < params.size() && params[index].kind == KSI_Param::Kind::String;
}

std::optional<unsigned> intAt(const KsiParams& params, std::size_t index)
{
    if (index >= params.size() || params[index].kind != KSI_Param::Kind::Int || params[index].intValue < 0) return std::nullopt;
    return static_cast<unsigned>(params[index].intValue);
}

template <typename Record>
KSI_Status answer(const Record& record, void* out, uint32_t outSize)
{
    if (outSize != sizeof(Record)) return KSI_ERR_BUFFER_SIZE;
    std::memcpy(out, &record, sizeof(Record));
    return KSI_OK;
}

// Runs a reader; a kernel refusal is the node's failure.
template <typename Body>
KSI_Status guardedRead(Body&& body)
{
    try {
        return body();
    } catch (const LinuxCallError& error) {
        return error.vanished() ? KSI_ERR_NOT_FOUND : KSI_ERR_FAILURE;
    }
}

bool onlyStack(const KsiParams& params, std::size_t count)
{
    return params.size() == count && isString(params, 0);
}

}  // namespace

struct LinuxKsi::Snapshot {
    std::uint64_t owner = 0;
    std::shared_ptr<const Interfaces> interfaces;
    std::shared_ptr<const CpuTopology> topology;
    std::shared_ptr<const Activity> activity;
};

namespace {

std::uint64_t nextInstanceId()
{
    static std::atomic<std::uint64_t> counter{0};
    return ++counter;
}

}  // namespace

LinuxKsi::LinuxKsi(LinuxRoots roots)
    : roots_(std::move(roots)), id_(nextInstanceId()), sampler_(roots_.loadWindow, roots_.proc)
{
}

// A request runs on one thread, so the thread's own slot holds its snapshot;
// a slot left by another instance is taken over.
LinuxKsi::Snapshot& LinuxKsi::snapshot()
{
    thread_local Snapshot slot;
    if (slot.owner != id_) slot = Snapshot{id_, nullptr, nullptr, nullptr};
    return slot;
}

void LinuxKsi::invalidate() { snapshot() = Snapshot{id_, nullptr, nullptr, nullptr}; }

std::shared_ptr<const LinuxKsi::Interfaces> LinuxKsi::interfaces()
{
    auto& slot = snapshot().interfaces;
    if (!slot) slot = std::make_shared<const Interfaces>(readInterfaceAddresses());
    return slot;
}

std::shared_ptr<const CpuTopology> LinuxKsi::topology()
{
    auto& slot = snapshot().topology;
    if (!slot) slot = std::make_shared<const CpuTopology>(readCpuTopology(roots_.sys));
    return slot;
}

std::shared_ptr<const LinuxKsi::Activity> LinuxKsi::activity()
{
    auto& slot = snapshot().activity;
    if (!slot) slot = std::make_shared<const Activity>(sampler_.sample());
    return slot;
}

KSI_Status LinuxKsi::checkSig(const void* signature, uint32_t length, uint32_t* result)
{
    if (!signature || length != KSI_SIGNATURE_LENGTH || std::memcmp(signature, KSI_SIGNATURE, KSI_SIGNATURE_LENGTH) != 0) {
        return KSI_ERR_SIGNATURE;
    }
    invalidate();  // every request begins with the signature check
    if (result) *result = KSI_INTERFACE_VERSION;
    return KSI_OK;
}

const InterfaceAddresses* LinuxKsi::vnic(const Interfaces& all, const KsiParams& params) const
{
    if (params[0].text != kDefaultStack || !isString(params, 1)) return nullptr;
    for (const auto& entry : all) {
        if (entry.name == params[1].text) return &entry;
    }
    return nullptr;
}

KSI_Status LinuxKsi::getInstanceList(KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list)
{
    return guardedRead([&]() -> KSI_Status {
        switch (node) {
        case KSI_NODE_net_tcpip_instances_vNics: {
            if (!onlyStack(params, 1)) return KSI_ERR_BAD_PARAM;
            if (params[0].text != kDefaultStack) return KSI_ERR_NOT_FOUND;
            auto all = interfaces();  // held for the loop: another request may replace the snapshot meanwhile
            list.emplace();
            for (const auto& entry : *all) list->push_back(KSI_Param::ofString(entry.name));
            return KSI_OK;
        }
        case KSI_NODE_net_tcpip_instances_vNics_v6_addresses: {
            if (!onlyStack(params, 2)) return KSI_ERR_BAD_PARAM;
            auto all = interfaces();
            const InterfaceAddresses* entry = vnic(*all, params);
            if (!entry) return KSI_ERR_NOT_FOUND;
            list.emplace();
            for (const auto& address : entry->ipv6) list->push_back(KSI_Param::ofString(address.address));
            return KSI_OK;
        }
        case KSI_NODE_hardware_cpu_packageList: {
            if (!params.empty()) return KSI_ERR_BAD_PARAM;
            auto topo = topology();
            list.emplace();
            for (const auto& pkg : topo->packages) list->push_back(KSI_Param::ofInt(pkg.packageId));
            return KSI_OK;
        }
        case KSI_NODE_hardware_cpu_cpuList:
            if (!params.empty()) return KSI_ERR_BAD_PARAM;
            list.emplace();
            for (unsigned cpu : topology()->cpuOrder()) list->push_back(KSI_Param::ofInt(cpu));
            return KSI_OK;
        default:
            return KSI_ERR_NOT_FOUND;
        }
    });
}

KSI_Status LinuxKsi::get(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    if (!out) return KSI_ERR_BAD_PARAM;
    return guardedRead([&]() -> KSI_Status {
        switch (node) {
        case KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr:
        case KSI_NODE_net_tcpip_instances_vNics_v4_netmask:
        case KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary:
            return getNetwork(node, params, out, outSize);
        case KSI_NODE_sched_pcpus_stats:
        case KSI_NODE_sched_pcpus_load:
            return getScheduler(node, params, out, outSize);
        default:
            return getCpu(node, params, out, outSize);
        }
    });
}

KSI_Status LinuxKsi::getNetwork(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    const bool summary = node == KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary;
    if (!onlyStack(params, summary ? 3 : 2)) return KSI_ERR_BAD_PARAM;
    auto all = interfaces();
    const InterfaceAddresses* entry = vnic(*all, params);
    if (!entry) return KSI_ERR_NOT_FOUND;
    if (summary) {
        if (!isString(params, 2)) return KSI_ERR_BAD_PARAM;
        for (const auto& address : entry->ipv6) {
            if (address.address == params[2].text) return answer(toIpv6Summary(address), out, outSize);
        }
        return KSI_ERR_NOT_FOUND;
    }
    if (!entry->ipv4) return KSI_ERR_NOT_FOUND;
    const bool mask = node == KSI_NODE_net_tcpip_instances_vNics_v4_netmask;
    return answer(mask ? entry->ipv4->netmask : entry->ipv4->address, out, outSize);
}

KSI_Status LinuxKsi::getCpu(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    switch (node) {
    case KSI_NODE_power_currentPolicy:
        return params.empty() ? answer(toPolicyRecord(readPowerPolicy(roots_.sys)), out, outSize) : KSI_ERR_BAD_PARAM;
    case KSI_NODE_hardware_cpu_cpuInfo:
        return params.empty() ? answer(toGlobalInfo(readHtState(roots_.sys), *topology()), out, outSize)
                              : KSI_ERR_BAD_PARAM;
    case KSI_NODE_hardware_cpu_cpuModelName: {
        if (!params.empty()) return KSI_ERR_BAD_PARAM;
        struct ModelName { KSI_HardwareCharArray48 text; } name;
        toModelName(readModelName(roots_.proc), name.text);
        return answer(name, out, outSize);
    }
    case KSI_NODE_hardware_cpu_packageList: {
        auto packageId = intAt(params, 0);
        if (!packageId || params.size() != 1) return KSI_ERR_BAD_PARAM;
        auto pkg = topology()->package(*packageId);
        if (!pkg) return KSI_ERR_NOT_FOUND;
        return answer(Hardware_CPUPackageInfoStruct{static_cast<uint32_t>(pkg->cores.size())}, out, outSize);
    }
    case KSI_NODE_hardware_cpu_cpuList: {
        auto cpu = intAt(params, 0);
        if (!cpu || params.size() != 1) return KSI_ERR_BAD_PARAM;
        auto topo = topology();
        const auto& online = topo->onlineCpus;
        if (std::find(online.begin(), online.end(), *cpu) == online.end()) return KSI_ERR_NOT_FOUND;
        return answer(toPcpuInfo(*cpu, *topo, readCpuidLeaves(*cpu, roots_.dev)), out, outSize);
    }
    default:
        return KSI_ERR_NOT_FOUND;
    }
}

KSI_Status LinuxKsi::getScheduler(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    auto cpu = intAt(params, 0);
    if (!cpu || params.size() != 1) return KSI_ERR_BAD_PARAM;
    auto samples = activity();
    auto it = samples->find(*cpu);
    if (it == samples->end()) return KSI_ERR_NOT_FOUND;
    if (node == KSI_NODE_sched_pcpus_load) return answer(toSchedLoad(it->second), out, outSize);
    return answer(toSchedInfo(it->second, ::sysconf(_SC_CLK_TCK)), out, outSize);
}

}  // namespace orv::linuxhost
