// Simulated hosts for the processor tests: packages, their physical CPUs with
// chosen CPUID register values and scheduler state, the power policy, the
// hyperthreading state and the model name, and injected kernel-call faults.
#pragma once

#include <nlohmann/json.hpp>

#include <cstdint>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

namespace processortest {

using Json = nlohmann::ordered_json;

inline constexpr const char* kPackageListNode = "KSI_NODE_hardware_cpu_packageList";
inline constexpr const char* kCpuListNode = "KSI_NODE_hardware_cpu_cpuList";
inline constexpr const char* kPolicyNode = "KSI_NODE_power_currentPolicy";
inline constexpr const char* kCpuInfoNode = "KSI_NODE_hardware_cpu_cpuInfo";
inline constexpr const char* kModelNameNode = "KSI_NODE_hardware_cpu_cpuModelName";
inline constexpr const char* kStatsNode = "KSI_NODE_sched_pcpus_stats";
inline constexpr const char* kLoadNode = "KSI_NODE_sched_pcpus_load";

// The CPUID leaves a physical CPU reports; all registers start at 0.
struct Leaves {
    uint32_t id0[4] = {};  // eax, ebx, ecx, edx
    uint32_t id1[4] = {};
    uint32_t id81[4] = {};
};

// Leaf 0 of a GenuineIntel CPU with leaf 1 ebx / ecx and leaf 0x80000001 edx.
Leaves intelLeaves(uint32_t id1Ebx, uint32_t id1Ecx, uint32_t id81Edx);
// Leaf 0 of an AuthenticAMD CPU with leaf 1 ebx and leaf 0x80000001 ecx / edx.
Leaves amdLeaves(uint32_t id1Ebx, uint32_t id81Ecx, uint32_t id81Edx);
// Leaf 0 with the given vendor registers ebx, edx, ecx; every other register
// fully set, so that a flag would read 1 if its entry existed.
Leaves vendorLeaves(uint32_t ebx, uint32_t edx, uint32_t ecx);

struct Pcpu {
    int32_t instance = 0;
    uint8_t family = 6;
    uint8_t stepping = 4;
    Leaves cpuid = intelLeaves(0x00400800, 0x7FFEFBFF, 0x2C100800);
    bool halted = false;
    uint32_t activeLoad = 0;
};

struct Package {
    int32_t instance = 0;
    uint32_t cores = 0;
};

struct CpuHost {
    std::string policyShortName = "dynamic";
    std::string htState = "HTEnabled";
    Json modelName = "Test CPU @ 2.00GHz";
    // std::nullopt: the kernel answers a null package list.
    std::optional<std::vector<Package>> packages = std::vector<Package>{};
    std::vector<Pcpu> cpus;
    Json faults = Json::array();
};

// `packages` packages of `cores` cores each, with one idle physical CPU per
// core. Package instance numbers start at 10 and CPU instance numbers at 100,
// so that neither matches a position.
CpuHost uniformHost(unsigned packages, unsigned cores);

// The fixture of the host (with the "host" section of SimHost::withHost).
Json fixtureOf(const CpuHost& host);

// A fault rule: `call` fails, optionally only on `node`, for invocations whose
// parameters include `param`, and only its `nth` matching invocation.
Json fault(const std::string& call, const std::string& node = {}, const std::string& param = {},
           unsigned nth = 0);

}  // namespace processortest

namespace processortest {

// A kernel call of the collection made to fail.
struct CollectionFault {
    std::string name;  // test name
    Json rule;
};

// Two packages (instances 10, 11) of three cores (CPU instances 100..105),
// every core halted without load, so that each core's statistics and load
// are both read and every call of the collection is made.
CpuHost faultTargetHost();

// The fault's name and rule, for test messages.
std::ostream& operator<<(std::ostream& os, const CollectionFault& fault);

// Every call of the collection on faultTargetHost() that fails it: the
// signature check, each node, each parameter-list creation, the instance
// number reads and appends, and the scheduler reads of a middle core.
std::vector<CollectionFault> collectionFaults();

// Names parameterised tests after their fault.
struct FaultName {
    template <typename ParamInfo>
    std::string operator()(const ParamInfo& param) const {
        return param.param.name;
    }
};

}  // namespace processortest
