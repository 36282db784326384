#include "ksi_records.hpp"

#include "fixed_text.hpp"

#include <algorithm>
#include <cstring>

namespace orv::linuxhost {

namespace {

Hardware_PCPUCPUIDLeafStruct toLeaf(const CpuidRegisters& r) { return {r.eax, r.ebx, r.ecx, r.edx}; }

}  // namespace

PowerKsi_Policy toPolicyRecord(const PowerPolicy& policy)
{
    PowerKsi_Policy record{};
    record.id = policy.id;
    putFixedText(record.shortName, policy.shortName);
    putFixedText(record.name, policy.name);
    putFixedText(record.description, policy.description);
    return record;
}

Hardware_CPUGlobalInfoStruct toGlobalInfo(HtState htState, const CpuTopology& topology)
{
    Hardware_CPUGlobalInfoStruct record{};
    record.htState = static_cast<Hardware_HTStateEnum>(htState);
    record.numPackages = static_cast<uint32_t>(topology.packages.size());
    record.numCores = static_cast<uint32_t>(topology.coreCount());
    record.numPCPUs = static_cast<uint32_t>(topology.onlineCpus.size());
    return record;
}

void toModelName(const std::string& name, KSI_HardwareCharArray48& out)
{
    std::memset(out, 0, sizeof out);
    std::memcpy(out, name.data(), std::min(name.size(), sizeof out));
}

Hardware_PCPUInfoStruct toPcpuInfo(unsigned cpu, const CpuTopology& topology, const CpuidLeaves& leaves)
{
    Hardware_PCPUInfoStruct record{};
    const CpuSignature signature = decodeSignature(leaves.leaf(1).eax);
    record.family = static_cast<uint8_t>(signature.family);
    record.model = static_cast<uint8_t>(signature.model);
    record.type = static_cast<uint8_t>(signature.type);
    record.stepping = static_cast<uint8_t>(signature.stepping);
    record.pcpuId = cpu;
    record.apicId = leaves.leaf(1).ebx >> 24;
    for (const auto& pkg : topology.packages) {
        for (std::size_t core = 0; core < pkg.cores.size(); ++core) {
            const auto& cpus = pkg.cores[core].cpus;
            auto it = std::find(cpus.begin(), cpus.end(), cpu);
            if (it == cpus.end()) continue;
            record.packageId = pkg.packageId;
            record.coreId = static_cast<uint32_t>(core);
            record.threadId = static_cast<uint32_t>(it - cpus.begin());
        }
    }
    record.cpuid = Hardware_PCPUCPUIDSummaryStruct{toLeaf(leaves.leaf(0)),          toLeaf(leaves.leaf(1)),
                                                   toLeaf(leaves.leaf(0x80000000)), toLeaf(leaves.leaf(0x80000001)),
                                                   toLeaf(leaves.leaf(0x80000008)), toLeaf(leaves.leaf(0x8000000A))};
    return record;
}

SchedKsi_PcpuInfo toSchedInfo(const CpuActivity& activity, long ticksPerSecond)
{
    const std::uint64_t microsPerTick = ticksPerSecond > 0 ? 1000000u / static_cast<std::uint64_t>(ticksPerSecond) : 10000u;
    SchedKsi_PcpuInfo record{};
    record.usedTimeUs = activity.total.busy * microsPerTick;
    record.idleTimeUs = activity.total.idle * microsPerTick;
    record.haltedTimeUs = record.idleTimeUs;
    record.halted = activity.halted ? 1 : 0;
    return record;
}

SchedKsi_PcpuLoad toSchedLoad(const CpuActivity& activity)
{
    SchedKsi_PcpuLoad record{};
    record.nrActive = activity.activeLoad > 0 ? 1 : 0;
    record.nrAssociated = 1;
    record.activeLoad = activity.activeLoad;
    return record;
}

TcpipKsi_VnicIPv6AddrSummary toIpv6Summary(const Ipv6Assignment& address)
{
    TcpipKsi_VnicIPv6AddrSummary record{};
    putFixedText(record.address, address.address);
    record.prefixLength = address.prefixLength;
    return record;
}

}  // namespace orv::linuxhost
