// The simulated host's interface-address list (getifaddrs): the virtual NICs
// of the default TCP/IP stack, the same interfaces the kernel IP nodes list.
#pragma once

#include <ifaddrs.h>

#include "HostModel.h"

namespace orv::platform::sim {

// Builds the list of `host` as getifaddrs lays it out: one link-layer entry per
// interface, then the IPv4 entries, then the IPv6 entries, each group in
// interface order. Injected getifaddrs rules either fail the call (nonzero
// answer, errno EIO) or add entries before an interface's link entry.
int makeInterfaceList(const HostModel& host, ifaddrs*& list);
// Releases a list made by makeInterfaceList.
void freeInterfaceList(ifaddrs* list);

} // namespace orv::platform::sim
