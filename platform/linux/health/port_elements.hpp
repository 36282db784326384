// SAS phys and SATA links as "Orvane_SASSATAPort" elements.
#pragma once

#include "orv/platform/HealthElements.h"
#include "storage_ports.hpp"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kSasSataPortClass = "Orvane_SASSATAPort";

// DeviceID is the port's id; Speed the negotiated rate.
orv::platform::HealthElement storagePortElement(const StoragePort& port);
// The SAS phys, then the SATA links.
std::vector<orv::platform::HealthElement> storagePortElements(const std::string& sysRoot);

}  // namespace orv::linuxhost::health
