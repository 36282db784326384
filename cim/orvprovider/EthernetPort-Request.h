// What the port instances and port paths of one request share: the
// namespace, the computer system's name (asked from the platform once per
// request, not once per port), the arrays whose content repeats from port to
// port, and the NIC record the port fill reads into, whose lists keep their
// storage from one port to the next.
#ifndef ORV_ETHERNETPORT_REQUEST_H
#define ORV_ETHERNETPORT_REQUEST_H

#include <optional>

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiString.h>
#include <nodemgr/network/PnicRecords.h>

#include "EthernetPort-ArrayMemo.h"

namespace EthernetProvider {

class PortRequest {
public:
    PortRequest(const CmpiContext& ctx, const CmpiBroker& broker, const CmpiString& ns);
    PortRequest(const PortRequest&) = delete;
    PortRequest& operator=(const PortRequest&) = delete;

    const CmpiString& nameSpace() const { return ns_; }
    // The SystemName key, asked the first time it is needed.
    const CmpiString& systemName();
    // The port's path: DeviceID, SystemCreationClassName, SystemName and
    // CreationClassName, in that order.
    CmpiObjectPath portPath(const char* deviceId);

    ArrayMemo& arrays() { return arrays_; }
    // The record for the next port, as a new one would be; its lists keep
    // the storage of the previous port's.
    NodeMgr::Network::PnicInfo& freshInfo();

private:
    const CmpiContext& ctx_;
    const CmpiBroker& broker_;
    CmpiString ns_;
    std::optional<CmpiString> systemName_;
    ArrayMemo arrays_;
    NodeMgr::Network::PnicInfo info_;
};

}  // namespace EthernetProvider

#endif
