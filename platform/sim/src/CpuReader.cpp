// The "cpu" section: power policy, hyperthreading, model name, packages and
// physical CPUs with their CPUID leaves and scheduler state.
#include "ListReader.h"
#include "ReaderParts.h"
#include "orv/platform/sim/RecordFields.h"

namespace orv::platform::sim {
namespace {

PowerKsi_Policy readPolicy(const JsonNode& node)
{
    JsonObject object = node.object();
    PowerKsi_Policy policy{};
    policy.id = object.required("id").unsignedInteger(UINT64_MAX);
    copyText(policy.shortName, object.required("shortName").text(sizeof policy.shortName - 1));
    copyText(policy.name, object.required("name").text(sizeof policy.name - 1));
    copyText(policy.description, object.required("description").text(sizeof policy.description - 1));
    object.finish();
    return policy;
}

// The model name as text (up to 48 bytes) or as up to 48 raw byte values.
std::array<char, 48> readModelName(const JsonNode& node)
{
    std::array<char, 48> name{};
    if (node.isString()) {
        const std::string text = node.text(name.size());
        std::copy(text.begin(), text.end(), name.begin());
        return name;
    }
    std::vector<JsonNode> bytes = node.array();
    if (bytes.size() > name.size()) {
        node.fail("at most 48 bytes, got " + std::to_string(bytes.size()));
    }
    for (size_t i = 0; i < bytes.size(); ++i) {
        name[i] = static_cast<char>(bytes[i].unsignedInteger(UINT8_MAX));
    }
    return name;
}

Hardware_PCPUCPUIDLeafStruct readLeaf(const JsonNode& node)
{
    std::vector<JsonNode> registers = node.array();
    if (registers.size() != 4) {
        node.fail("expected the four registers [eax, ebx, ecx, edx], got " + std::to_string(registers.size()) + " values");
    }
    return Hardware_PCPUCPUIDLeafStruct{registers[0].register32(), registers[1].register32(), registers[2].register32(),
                                        registers[3].register32()};
}

Hardware_PCPUCPUIDSummaryStruct readCpuid(const JsonNode& node)
{
    JsonObject object = node.object();
    Hardware_PCPUCPUIDSummaryStruct cpuid{};
    cpuid.id0 = readLeaf(object.required("id0"));
    cpuid.id1 = readLeaf(object.required("id1"));
    cpuid.id80 = readLeaf(object.required("id80"));
    cpuid.id81 = readLeaf(object.required("id81"));
    cpuid.id88 = readLeaf(object.required("id88"));
    cpuid.id8a = readLeaf(object.required("id8a"));
    object.finish();
    return cpuid;
}

int32_t readInstance(JsonObject& object)
{
    return static_cast<int32_t>(object.required("instance").integer(INT32_MIN, INT32_MAX));
}

uint8_t readByte(JsonObject& object, const char* key)
{
    return static_cast<uint8_t>(object.required(key).unsignedInteger(UINT8_MAX));
}

PackageModel readPackage(const JsonNode& node)
{
    JsonObject object = node.object();
    PackageModel package;
    package.instance = readInstance(object);
    package.cores = static_cast<uint32_t>(object.required("cores").unsignedInteger(UINT32_MAX));
    object.finish();
    return package;
}

PcpuModel readPcpu(const JsonNode& node)
{
    JsonObject object = node.object();
    PcpuModel cpu;
    cpu.instance = readInstance(object);
    cpu.family = readByte(object, "family");
    cpu.model = readByte(object, "model");
    cpu.type = readByte(object, "type");
    cpu.stepping = readByte(object, "stepping");
    cpu.cpuid = readCpuid(object.required("cpuid"));
    cpu.halted = object.required("halted").boolean();
    cpu.activeLoad = static_cast<uint32_t>(object.required("activeLoad").unsignedInteger(UINT32_MAX));
    object.finish();
    return cpu;
}

} // namespace

CpuModel readCpu(const JsonNode& node)
{
    JsonObject object = node.object();
    CpuModel cpu;
    cpu.powerPolicy = readPolicy(object.required("powerPolicy"));
    cpu.htState = static_cast<Hardware_HTStateEnum>(object.required("htState").enumerator(htStateNames(), INT32_MIN, INT32_MAX));
    cpu.modelName = readModelName(object.required("modelName"));
    cpu.packages = readInstanceList<PackageModel>(object, "packages", readPackage);
    cpu.cpus = readInstanceList<PcpuModel>(object, "cpus", readPcpu);
    object.finish();
    return cpu;
}

} // namespace orv::platform::sim
