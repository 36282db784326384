// A physical NIC of the simulated host. It keeps the host model it was made
// from, so it stays valid (and unchanged) when the fixture is re-read.
#pragma once

#include <memory>

#include "HostModel.h"
#include "nodemgr/network/Pnic.h"

namespace orv::platform::sim {

NodeMgr::Network::Pnic* makeSimPnic(std::shared_ptr<const HostModel> host, const NicModel& nic);

} // namespace orv::platform::sim
