#include "KsiNodeNames.h"

#include <iterator>
#include <utility>

namespace orv::platform::sim {
namespace {

#define ORV_NODE(id) {id, #id}

constexpr std::pair<KSI_NodeId, std::string_view> kNodes[] = {
    ORV_NODE(KSI_NODE_net_tcpip_instances_vNics),
    ORV_NODE(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr),
    ORV_NODE(KSI_NODE_net_tcpip_instances_vNics_v4_netmask),
    ORV_NODE(KSI_NODE_net_tcpip_instances_vNics_v6_addresses),
    ORV_NODE(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary),
    ORV_NODE(KSI_NODE_power_currentPolicy),
    ORV_NODE(KSI_NODE_hardware_cpu_cpuInfo),
    ORV_NODE(KSI_NODE_hardware_cpu_cpuModelName),
    ORV_NODE(KSI_NODE_hardware_cpu_packageList),
    ORV_NODE(KSI_NODE_hardware_cpu_cpuList),
    ORV_NODE(KSI_NODE_sched_pcpus_stats),
    ORV_NODE(KSI_NODE_sched_pcpus_load),
};

#undef ORV_NODE

} // namespace

std::string_view nodeName(KSI_NodeId node)
{
    for (const auto& [id, name] : kNodes) {
        if (id == node) {
            return name;
        }
    }
    return "unknown node";
}

std::optional<KSI_NodeId> nodeByName(std::string_view name)
{
    for (const auto& [id, known] : kNodes) {
        if (known == name) {
            return id;
        }
    }
    return std::nullopt;
}

} // namespace orv::platform::sim
