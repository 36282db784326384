// Entry point of the host-management library's network information. One
// object per request; it holds no state of its own.
#pragma once

#include <string>
#include <vector>

#include "nodemgr/lib/NodeMgrException.h"
#include "nodemgr/network/Pnic.h"

namespace TmkCtl {
namespace Network {

class NetworkInfoImpl {
public:
    NetworkInfoImpl();
    ~NetworkInfoImpl();
    NetworkInfoImpl(const NetworkInfoImpl&) = delete;
    NetworkInfoImpl& operator=(const NetworkInfoImpl&) = delete;

    // Every physical NIC of the host, each newly made and owned by the caller
    // (keep them in a TmkCtl::Util::AutoVector). Throws NodeMgrException.
    std::vector<NodeMgr::Network::Pnic*> GetPnics();

    // The NIC whose GetName() equals name, owned by the caller; null when the
    // host has no such NIC. Throws NodeMgrException.
    NodeMgr::Network::Pnic* GetPnicByName(const std::string& name);
};

} // namespace Network
} // namespace TmkCtl
