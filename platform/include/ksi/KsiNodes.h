/* Identifiers of the kernel system-information nodes read by the providers. */
#ifndef ORV_KSI_KSINODES_H
#define ORV_KSI_KSINODES_H

typedef enum KSI_NodeId {
    /* TCP/IP stacks: instance list of a stack's virtual NICs (parameter: stack name) */
    KSI_NODE_net_tcpip_instances_vNics = 0x0101,
    /* 4 bytes, network byte order (parameters: stack, vNIC) */
    KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr = 0x0102,
    /* 4 bytes, network byte order (parameters: stack, vNIC) */
    KSI_NODE_net_tcpip_instances_vNics_v4_netmask = 0x0103,
    /* instance list of a vNIC's IPv6 addresses (parameters: stack, vNIC) */
    KSI_NODE_net_tcpip_instances_vNics_v6_addresses = 0x0104,
    /* TcpipKsi_VnicIPv6AddrSummary (parameters: stack, vNIC, address) */
    KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary = 0x0105,

    /* PowerKsi_Policy, no parameters */
    KSI_NODE_power_currentPolicy = 0x0201,

    /* Hardware_CPUGlobalInfoStruct, no parameters */
    KSI_NODE_hardware_cpu_cpuInfo = 0x0301,
    /* KSI_HardwareCharArray48, no parameters */
    KSI_NODE_hardware_cpu_cpuModelName = 0x0302,
    /* instance list of packages; with a package instance number: Hardware_CPUPackageInfoStruct */
    KSI_NODE_hardware_cpu_packageList = 0x0303,
    /* instance list of physical CPUs; with a CPU instance number: Hardware_PCPUInfoStruct */
    KSI_NODE_hardware_cpu_cpuList = 0x0304,

    /* SchedKsi_PcpuInfo (parameter: CPU instance number) */
    KSI_NODE_sched_pcpus_stats = 0x0401,
    /* SchedKsi_PcpuLoad (parameter: CPU instance number) */
    KSI_NODE_sched_pcpus_load = 0x0402
} KSI_NodeId;

#endif
