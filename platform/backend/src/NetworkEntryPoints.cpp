// The host-management library's network entry point, answered by the
// selected substitute.
#include "tmkctl/network/NetworkInfoImpl.h"

#include "orv/platform/backend/Selector.h"

namespace TmkCtl {
namespace Network {

NetworkInfoImpl::NetworkInfoImpl()
{
    orv::platform::activeBackend().beginBatch();
}

NetworkInfoImpl::~NetworkInfoImpl() = default;

std::vector<NodeMgr::Network::Pnic*> NetworkInfoImpl::GetPnics()
{
    return orv::platform::activeBackend().network().getPnics();
}

NodeMgr::Network::Pnic* NetworkInfoImpl::GetPnicByName(const std::string& name)
{
    return orv::platform::activeBackend().network().getPnicByName(name);
}

} // namespace Network
} // namespace TmkCtl
