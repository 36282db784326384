// The kernel system-information records filled from the Linux readers' answers.
#pragma once

#include "cpu_state.hpp"
#include "cpu_topology.hpp"
#include "cpuid_reader.hpp"
#include "interface_addresses.hpp"

#include "ksi/KsiRecords.h"

#include <string>

namespace orv::linuxhost {

PowerKsi_Policy toPolicyRecord(const PowerPolicy& policy);
Hardware_CPUGlobalInfoStruct toGlobalInfo(HtState htState, const CpuTopology& topology);
// The name NUL-padded into 48 bytes (cut at 48, the record need not be terminated).
void toModelName(const std::string& name, KSI_HardwareCharArray48& out);
// pcpuId, packageId, coreId (position of its core in the package), threadId
// (position in its core), the signature from leaf 1 and the six leaves.
Hardware_PCPUInfoStruct toPcpuInfo(unsigned cpu, const CpuTopology& topology, const CpuidLeaves& leaves);
SchedKsi_PcpuInfo toSchedInfo(const CpuActivity& activity, long ticksPerSecond);
SchedKsi_PcpuLoad toSchedLoad(const CpuActivity& activity);
TcpipKsi_VnicIPv6AddrSummary toIpv6Summary(const Ipv6Assignment& address);

}  // namespace orv::linuxhost
