/* Fixed-layout records of the kernel system-information nodes. Sizes and
 * offsets are part of the kernel interface and are checked at compile time. */
#ifndef ORV_KSI_KSIRECORDS_H
#define ORV_KSI_KSIRECORDS_H

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef uint32_t KSI_HEX_U32;

/* The host CPU model name: 48 bytes, not necessarily NUL-terminated. */
typedef char KSI_HardwareCharArray48[48];

/* 4 bytes; in C++ any int value is a valid value of the type. */
#ifdef __cplusplus
typedef enum Hardware_HTStateEnum : int {
#else
typedef enum Hardware_HTStateEnum {
#endif
    HTNotPresent = 0,
    HTBIOSDisabled = 1,
    HTTMKDisabled = 2,
    HTEnabled = 3
} Hardware_HTStateEnum;

#pragma pack(push, 4)

/* KSI_NODE_power_currentPolicy */
typedef struct PowerKsi_Policy {
    uint64_t id;
    char shortName[193];
    char name[193];
    char description[193];
} PowerKsi_Policy;

/* KSI_NODE_sched_pcpus_stats, read with a CPU instance number */
typedef struct SchedKsi_PcpuInfo {
    uint64_t usedTimeUs;
    uint64_t idleTimeUs;
    uint64_t readyTimeUs;
    uint64_t wakeups;
    uint64_t switches;
    uint64_t migrations;
    uint64_t haltedTimeUs;
    uint64_t timerInterrupts;
    uint8_t halted;
    uint8_t reserved0[3];
    uint32_t reserved1[22];
} SchedKsi_PcpuInfo;

#pragma pack(pop)

/* KSI_NODE_hardware_cpu_cpuInfo */
typedef struct Hardware_CPUGlobalInfoStruct {
    Hardware_HTStateEnum htState;
    uint32_t numPackages;
    uint32_t numCores;
    uint32_t numPCPUs;
    uint32_t numNumaNodes;
    uint32_t cpuMHz;
    uint32_t busMHz;
    uint32_t l2CacheKB;
    uint32_t l3CacheKB;
} Hardware_CPUGlobalInfoStruct;

/* KSI_NODE_hardware_cpu_packageList, read with a package instance number */
typedef struct Hardware_CPUPackageInfoStruct {
    uint32_t numCores;
} Hardware_CPUPackageInfoStruct;

typedef struct Hardware_PCPUCPUIDLeafStruct {
    KSI_HEX_U32 eax;
    KSI_HEX_U32 ebx;
    KSI_HEX_U32 ecx;
    KSI_HEX_U32 edx;
} Hardware_PCPUCPUIDLeafStruct;

/* CPUID leaves 0, 1, 0x80000000, 0x80000001, 0x80000008 and 0x8000000A. */
typedef struct Hardware_PCPUCPUIDSummaryStruct {
    Hardware_PCPUCPUIDLeafStruct id0;
    Hardware_PCPUCPUIDLeafStruct id1;
    Hardware_PCPUCPUIDLeafStruct id80;
    Hardware_PCPUCPUIDLeafStruct id81;
    Hardware_PCPUCPUIDLeafStruct id88;
    Hardware_PCPUCPUIDLeafStruct id8a;
} Hardware_PCPUCPUIDSummaryStruct;

/* KSI_NODE_hardware_cpu_cpuList, read with a CPU instance number */
typedef struct Hardware_PCPUInfoStruct {
    uint8_t family;
    uint8_t model;
    uint8_t type;
    uint8_t stepping;
    uint32_t pcpuId;
    uint32_t packageId;
    uint32_t coreId;
    uint32_t threadId;
    uint32_t apicId;
    uint32_t numaNode;
    uint32_t mhz;
    uint32_t microcodeVersion;
    uint32_t reserved0[2];
    Hardware_PCPUCPUIDSummaryStruct cpuid;
    uint32_t reserved1[15];
} Hardware_PCPUInfoStruct;

/* KSI_NODE_sched_pcpus_load, read with a CPU instance number */
typedef struct SchedKsi_PcpuLoad {
    uint32_t nrActive;
    uint32_t nrAssociated;
    uint32_t activeLoad;
    uint32_t reserved[6];
} SchedKsi_PcpuLoad;

/* KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary */
typedef struct TcpipKsi_VnicIPv6AddrSummary {
    char address[48];              /* address text, NUL-padded */
    uint32_t prefixLength;
    uint32_t flags;
    uint32_t state;
    uint32_t validLifetime;
    uint32_t preferredLifetime;
} TcpipKsi_VnicIPv6AddrSummary;

#ifdef __cplusplus
#define ORV_KSI_ASSERT static_assert
#else
#define ORV_KSI_ASSERT _Static_assert
#endif

ORV_KSI_ASSERT(sizeof(PowerKsi_Policy) == 588, "PowerKsi_Policy is 588 bytes");
ORV_KSI_ASSERT(offsetof(PowerKsi_Policy, id) == 0, "PowerKsi_Policy.id at 0");
ORV_KSI_ASSERT(offsetof(PowerKsi_Policy, shortName) == 8, "PowerKsi_Policy.shortName at 8");
ORV_KSI_ASSERT(offsetof(PowerKsi_Policy, name) == 201, "PowerKsi_Policy.name at 201");
ORV_KSI_ASSERT(offsetof(PowerKsi_Policy, description) == 394, "PowerKsi_Policy.description at 394");
ORV_KSI_ASSERT(sizeof(Hardware_CPUGlobalInfoStruct) == 36, "Hardware_CPUGlobalInfoStruct is 36 bytes");
ORV_KSI_ASSERT(offsetof(Hardware_CPUGlobalInfoStruct, htState) == 0, "htState at 0");
ORV_KSI_ASSERT(sizeof(Hardware_HTStateEnum) == 4, "Hardware_HTStateEnum is 4 bytes");
ORV_KSI_ASSERT(sizeof(KSI_HardwareCharArray48) == 48, "the model name is 48 bytes");
ORV_KSI_ASSERT(sizeof(Hardware_CPUPackageInfoStruct) == 4, "Hardware_CPUPackageInfoStruct is 4 bytes");
ORV_KSI_ASSERT(offsetof(Hardware_CPUPackageInfoStruct, numCores) == 0, "numCores at 0");
ORV_KSI_ASSERT(sizeof(Hardware_PCPUCPUIDLeafStruct) == 16, "a CPUID leaf is 16 bytes");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDLeafStruct, eax) == 0, "eax at 0");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDLeafStruct, ebx) == 4, "ebx at 4");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDLeafStruct, ecx) == 8, "ecx at 8");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDLeafStruct, edx) == 12, "edx at 12");
ORV_KSI_ASSERT(sizeof(Hardware_PCPUCPUIDSummaryStruct) == 96, "Hardware_PCPUCPUIDSummaryStruct is 96 bytes");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id0) == 0, "id0 at 0");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id1) == 16, "id1 at 16");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id80) == 32, "id80 at 32");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id81) == 48, "id81 at 48");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id88) == 64, "id88 at 64");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUCPUIDSummaryStruct, id8a) == 80, "id8a at 80");
ORV_KSI_ASSERT(sizeof(Hardware_PCPUInfoStruct) == 200, "Hardware_PCPUInfoStruct is 200 bytes");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUInfoStruct, family) == 0, "family at 0");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUInfoStruct, model) == 1, "model at 1");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUInfoStruct, type) == 2, "type at 2");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUInfoStruct, stepping) == 3, "stepping at 3");
ORV_KSI_ASSERT(offsetof(Hardware_PCPUInfoStruct, cpuid) == 44, "cpuid at 44");
ORV_KSI_ASSERT(sizeof(SchedKsi_PcpuInfo) == 156, "SchedKsi_PcpuInfo is 156 bytes");
ORV_KSI_ASSERT(offsetof(SchedKsi_PcpuInfo, halted) == 64, "halted at 64");
ORV_KSI_ASSERT(sizeof(SchedKsi_PcpuLoad) == 36, "SchedKsi_PcpuLoad is 36 bytes");
ORV_KSI_ASSERT(offsetof(SchedKsi_PcpuLoad, nrActive) == 0, "nrActive at 0");
ORV_KSI_ASSERT(offsetof(SchedKsi_PcpuLoad, nrAssociated) == 4, "nrAssociated at 4");
ORV_KSI_ASSERT(offsetof(SchedKsi_PcpuLoad, activeLoad) == 8, "activeLoad at 8");
ORV_KSI_ASSERT(sizeof(TcpipKsi_VnicIPv6AddrSummary) == 68, "the IPv6 address summary is 68 bytes");
ORV_KSI_ASSERT(offsetof(TcpipKsi_VnicIPv6AddrSummary, address) == 0, "address text at 0");
ORV_KSI_ASSERT(offsetof(TcpipKsi_VnicIPv6AddrSummary, prefixLength) == 48, "prefix length at 48");

#undef ORV_KSI_ASSERT

#ifdef __cplusplus
}
#endif

#endif
