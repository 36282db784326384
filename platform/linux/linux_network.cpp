#include "bus_device.hpp"
#include "linux_backend.hpp"
#include "linux_call_error.hpp"
#include "linux_pnic.hpp"

#include "nodemgr/lib/NodeMgrException.h"

namespace orv::linuxhost {

LinuxNetwork::LinuxNetwork(std::string sysRoot, std::shared_ptr<EthtoolChannel> channel,
                           std::shared_ptr<EthtoolNetlinkChannel> netlink, bool kernelNamesParents)
    : kernel_(std::move(channel), std::move(netlink), std::make_shared<RouteLinks>(), std::move(sysRoot)),
      kernelNamesParents_(kernelNamesParents)
{
}

bool LinuxNetwork::isNic(LinkRecord& link) const
{
    return recognizeNic(link, *kernel_.ethtool, kernelNamesParents_);
}

std::vector<NodeMgr::Network::Pnic*> LinuxNetwork::getPnics()
{
    std::vector<NodeMgr::Network::Pnic*> pnics;
    try {
        auto pci = std::make_shared<PciIdentities>(kernel_.sysRoot);
        for (auto& link : kernel_.route->all()) {
            if (!isNic(link)) continue;
            std::string name = link.name;
            pnics.push_back(new LinuxPnic(std::move(name), kernel_, std::move(link), pci));
        }
    } catch (const LinuxCallError& error) {
        for (auto* pnic : pnics) delete pnic;
        throw NodeMgr::Lib::NodeMgrException(std::string("GetPnics failed: ") + error.what());
    } catch (...) {
        for (auto* pnic : pnics) delete pnic;
        throw;
    }
    return pnics;
}

NodeMgr::Network::Pnic* LinuxNetwork::getPnicByName(const std::string& name)
{
    std::optional<LinkRecord> link;
    try {
        link = kernel_.route->named(name);
        if (!isNic(*link)) return nullptr;
    } catch (const LinuxCallError& error) {
        if (error.vanished()) return nullptr;  // no such interface
        throw NodeMgr::Lib::NodeMgrException("GetPnicByName failed for " + name + ": " + error.what());
    }
    return new LinuxPnic(name, kernel_, std::move(link));
}

}  // namespace orv::linuxhost
