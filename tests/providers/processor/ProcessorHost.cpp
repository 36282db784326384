#include "ProcessorHost.h"

#include <cstdio>

#include "orv/providertest/SimHost.h"

namespace processortest {
namespace {

constexpr uint32_t kIntelEbx = 0x756E6547;
constexpr uint32_t kIntelEdx = 0x49656E69;
constexpr uint32_t kIntelEcx = 0x6C65746E;
constexpr uint32_t kAmdEbx = 0x68747541;
constexpr uint32_t kAmdEdx = 0x69746E65;
constexpr uint32_t kAmdEcx = 0x444D4163;

std::string hex(uint32_t value) {
    char text[11];
    std::snprintf(text, sizeof text, "0x%08X", value);
    return text;
}

Json leafJson(const uint32_t (&registers)[4]) {
    return Json::array({hex(registers[0]), hex(registers[1]), hex(registers[2]), hex(registers[3])});
}

// Leaf 0 naming a vendor; every other register 0.
Leaves vendorOnly(uint32_t ebx, uint32_t edx, uint32_t ecx) {
    Leaves leaves;
    leaves.id0[1] = ebx;
    leaves.id0[2] = ecx;
    leaves.id0[3] = edx;
    return leaves;
}

Json zeroLeaf() { return Json::array({0, 0, 0, 0}); }

Json cpuidJson(const Leaves& leaves) {
    return {{"id0", leafJson(leaves.id0)}, {"id1", leafJson(leaves.id1)}, {"id80", zeroLeaf()},
            {"id81", leafJson(leaves.id81)}, {"id88", zeroLeaf()},          {"id8a", zeroLeaf()}};
}

Json pcpuJson(const Pcpu& cpu) {
    return {{"instance", cpu.instance}, {"family", cpu.family},          {"model", 85},
            {"type", 0},                {"stepping", cpu.stepping},      {"cpuid", cpuidJson(cpu.cpuid)},
            {"halted", cpu.halted},     {"activeLoad", cpu.activeLoad}};
}

Json packagesJson(const std::optional<std::vector<Package>>& packages) {
    if (!packages) {
        return nullptr;
    }
    Json list = Json::array();
    for (const Package& package : *packages) {
        list.push_back({{"instance", package.instance}, {"cores", package.cores}});
    }
    return list;
}

}  // namespace

Leaves intelLeaves(uint32_t id1Ebx, uint32_t id1Ecx, uint32_t id81Edx) {
    Leaves leaves = vendorOnly(kIntelEbx, kIntelEdx, kIntelEcx);
    leaves.id1[1] = id1Ebx;
    leaves.id1[2] = id1Ecx;
    leaves.id81[3] = id81Edx;
    return leaves;
}

Leaves amdLeaves(uint32_t id1Ebx, uint32_t id81Ecx, uint32_t id81Edx) {
    Leaves leaves = vendorOnly(kAmdEbx, kAmdEdx, kAmdEcx);
    leaves.id1[1] = id1Ebx;
    leaves.id81[2] = id81Ecx;
    leaves.id81[3] = id81Edx;
    return leaves;
}

Leaves vendorLeaves(uint32_t ebx, uint32_t edx, uint32_t ecx) {
    Leaves leaves = vendorOnly(ebx, edx, ecx);
    for (uint32_t& reg : leaves.id1) {
        reg = 0xFFFFFFFF;
    }
    for (uint32_t& reg : leaves.id81) {
        reg = 0xFFFFFFFF;
    }
    return leaves;
}

CpuHost uniformHost(unsigned packages, unsigned cores) {
    CpuHost host;
    host.packages.emplace();
    for (unsigned p = 0; p < packages; ++p) {
        host.packages->push_back({static_cast<int32_t>(10 + p), cores});
        for (unsigned c = 0; c < cores; ++c) {
            Pcpu cpu;
            cpu.instance = static_cast<int32_t>(100 + p * cores + c);
            host.cpus.push_back(cpu);
        }
    }
    return host;
}

Json fixtureOf(const CpuHost& host) {
    Json cpus = Json::array();
    for (const Pcpu& cpu : host.cpus) {
        cpus.push_back(pcpuJson(cpu));
    }
    const Json cpu = {
        {"powerPolicy", {{"id", 1}, {"shortName", host.policyShortName}, {"name", "Policy"}, {"description", "Test policy"}}},
        {"htState", host.htState},
        {"modelName", host.modelName},
        {"packages", packagesJson(host.packages)},
        {"cpus", cpus},
    };
    return orv::providertest::SimHost::withHost({{"cpu", cpu}, {"faults", host.faults}});
}

Json fault(const std::string& call, const std::string& node, const std::string& param, unsigned nth) {
    Json rule = {{"call", call}};
    if (!node.empty()) {
        rule["node"] = node;
    }
    if (!param.empty()) {
        rule["param"] = param;
    }
    if (nth != 0) {
        rule["nth"] = nth;
    }
    return rule;
}

}  // namespace processortest

namespace processortest {

CpuHost faultTargetHost() {
    CpuHost host = uniformHost(2, 3);
    for (Pcpu& cpu : host.cpus) {
        cpu.halted = true;
    }
    return host;
}

std::ostream& operator<<(std::ostream& os, const CollectionFault& fault) {
    return os << fault.name << ' ' << fault.rule.dump();
}

std::vector<CollectionFault> collectionFaults() {
    return {
        {"SignatureCheck", fault("KSI_CheckSig")},
        {"PowerPolicyRead", fault("KSI_Get", kPolicyNode)},
        {"CpuInfoRead", fault("KSI_Get", kCpuInfoNode)},
        {"ModelNameRead", fault("KSI_Get", kModelNameNode)},
        {"PackageListFetch", fault("KSI_GetInstanceListAlloc", kPackageListNode)},
        {"PackageParameterListCreation", fault("KSI_ParamListCreate", "", "", 1)},
        {"PackageInstanceNumberRead", fault("KSI_ParamListGetInt32", "", "11")},
        {"PackageInstanceAppend", fault("KSI_ParamListAddInt", "", "11")},
        {"SecondPackageRead", fault("KSI_Get", kPackageListNode, "11")},
        {"CpuListFetch", fault("KSI_GetInstanceListAlloc", kCpuListNode)},
        {"CpuParameterListCreation", fault("KSI_ParamListCreate", "", "", 2)},
        {"FirstCpuOfSecondPackageRead", fault("KSI_Get", kCpuListNode, "103")},
        {"MiddleCoreInstanceNumberRead", fault("KSI_ParamListGetInt32", "", "104")},
        {"MiddleCoreInstanceAppend", fault("KSI_ParamListAddInt", "", "104")},
        {"MiddleCoreStatisticsRead", fault("KSI_Get", kStatsNode, "104")},
        {"MiddleCoreLoadRead", fault("KSI_Get", kLoadNode, "104")},
    };
}

}  // namespace processortest
