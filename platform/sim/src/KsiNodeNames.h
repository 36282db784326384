// Names of the kernel nodes, as fixtures and messages spell them.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "ksi/KsiNodes.h"

namespace orv::platform::sim {

std::string_view nodeName(KSI_NodeId node);
std::optional<KSI_NodeId> nodeByName(std::string_view name);

} // namespace orv::platform::sim
