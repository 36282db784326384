// Answers of the individual kernel nodes from a host model, without faults.
#pragma once

#include <optional>

#include "HostModel.h"
#include "orv/platform/backend/KsiParam.h"

namespace orv::platform::sim {

// Fills out (outSize bytes) with the record of node under params.
KSI_Status readNode(const HostModel& host, KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize);
// The instance list of node under params (nullopt: a null list).
KSI_Status listNode(const HostModel& host, KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list);

} // namespace orv::platform::sim
