#include "linux_backend.hpp"
#include "linux_pnic.hpp"
#include "sysfs_net.hpp"

#include "nodemgr/lib/NodeMgrException.h"

namespace orv::linuxhost {

LinuxNetwork::LinuxNetwork(std::string sysRoot, std::shared_ptr<EthtoolChannel> channel,
                           std::shared_ptr<EthtoolNetlinkChannel> netlink)
    : sysRoot_(std::move(sysRoot)),
      channel_(std::move(channel)),
      netlink_(std::move(netlink)),
      route_(std::make_shared<RouteStatistics>())
{
}

std::vector<NodeMgr::Network::Pnic*> LinuxNetwork::getPnics()
{
    std::vector<NodeMgr::Network::Pnic*> pnics;
    try {
        for (const auto& name : SysfsNet(sysRoot_).busDevices()) pnics.push_back(new LinuxPnic(name, sysRoot_, channel_, netlink_, route_));
    } catch (...) {
        for (auto* pnic : pnics) delete pnic;
        throw;
    }
    return pnics;
}

NodeMgr::Network::Pnic* LinuxNetwork::getPnicByName(const std::string& name)
{
    if (name.empty() || name.find('/') != std::string::npos || name == "." || name == "..") return nullptr;
    if (!SysfsNet(sysRoot_).hasBusDevice(name)) return nullptr;
    return new LinuxPnic(name, sysRoot_, channel_, netlink_, route_);
}

}  // namespace orv::linuxhost
