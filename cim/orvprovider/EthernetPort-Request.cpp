// The values one request of the Ethernet port provider shares among its ports.
#include "EthernetPort-Request.h"

#include <utility>

#include <omc/ComputerSystem.h>

#include "EthernetPort-Classes.h"

namespace EthernetProvider {

using NodeMgr::Network::PnicInfo;

namespace {

// Empties list and hands it over with its storage.
template <typename List>
List emptied(List& list) {
    List kept = std::move(list);
    kept.clear();
    return kept;
}

}  // namespace

PortRequest::PortRequest(const CmpiContext& ctx, const CmpiBroker& broker, const CmpiString& ns)
    : ctx_(ctx), broker_(broker), ns_(ns) {}

const CmpiString& PortRequest::systemName() {
    if (!systemName_) {
        systemName_ = OMC::getComputerSystemName(ctx_, broker_);
    }
    return *systemName_;
}

CmpiObjectPath PortRequest::portPath(const char* deviceId) {
    CmpiObjectPath path(ns_, kPortClass);
    path.setKey(kDeviceIdKey, CmpiData(deviceId));
    path.setKey("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
    path.setKey("SystemName", CmpiData(systemName()));
    path.setKey("CreationClassName", CmpiData(kPortClass));
    return path;
}

// Every member is reset by assigning a new record; the lists are taken out
// first and put back empty, so that reading the next port's record into them
// does not allocate again.
PnicInfo& PortRequest::freshInfo() {
    auto supportedPorts = emptied(info_.supportedPorts);
    auto supportedLinkModes = emptied(info_.supportedLinkModes);
    auto advertisedLinkModes = emptied(info_.advertisedLinkModes);
    auto supportsWakeOn = emptied(info_.supportsWakeOn);
    auto wakeOn = emptied(info_.wakeOn);
    info_ = PnicInfo{};
    info_.supportedPorts = std::move(supportedPorts);
    info_.supportedLinkModes = std::move(supportedLinkModes);
    info_.advertisedLinkModes = std::move(advertisedLinkModes);
    info_.supportsWakeOn = std::move(supportsWakeOn);
    info_.wakeOn = std::move(wakeOn);
    return info_;
}

}  // namespace EthernetProvider
