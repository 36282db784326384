// Fixture key names of the NIC records' numeric fields, with the member each
// one fills. Shared by the fixture reader and the fixture generators so the
// two cannot drift apart.
#pragma once

#include <cstdint>
#include <utility>
#include <vector>

#include "nodemgr/network/PnicRecords.h"

namespace orv::platform::sim {

template <typename Record, typename Value>
using FieldTable = std::vector<std::pair<const char*, Value Record::*>>;

const FieldTable<NodeMgr::Network::PnicStats, uint64_t>& statsFields();
const FieldTable<NodeMgr::Network::PnicCoalesceInfo, uint32_t>& coalesceCounterFields();
const FieldTable<NodeMgr::Network::PnicCoalesceInfo, bool>& coalesceFlagFields();
const FieldTable<NodeMgr::Network::PnicRingInfo, uint32_t>& ringFields();
const FieldTable<NodeMgr::Network::PnicPauseInfo, bool>& pauseFlagFields();
const FieldTable<NodeMgr::Network::PnicInfo, bool>& infoFlagFields();
const FieldTable<NodeMgr::Network::PnicDriverInfo, std::string>& driverFields();

// Enumerator names accepted (and written) for the NIC enumerations.
using EnumNames = std::vector<std::pair<const char*, int64_t>>;
const EnumNames& linkSpeedNames();
const EnumNames& duplexNames();
const EnumNames& portModeNames();
const EnumNames& transceiverNames();
const EnumNames& wakeOnNames();
const EnumNames& pauseResultNames();
const EnumNames& htStateNames();

} // namespace orv::platform::sim
