// EDAC memory modules as "Orvane_PhysicalMemory" elements.
#pragma once

#include "edac_memory.hpp"
#include "orv/platform/HealthElements.h"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kPhysicalMemoryClass = "Orvane_PhysicalMemory";

// Tag "edac:<location>"; ElementName and BankLabel the module's label;
// Capacity in bytes; MemoryType from the EDAC type text.
orv::platform::HealthElement memoryElement(const MemoryModule& module);
std::vector<orv::platform::HealthElement> memoryElements(const std::string& sysRoot);

// CIM_PhysicalMemory.MemoryType for an EDAC type text ("Registered-DDR3" -> 24
// DDR3); 1 (Other) for a type the class has no value for, 0 when unknown.
std::uint16_t memoryTypeOf(const std::string& edacType);

}  // namespace orv::linuxhost::health
