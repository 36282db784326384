// Block-layer disks as "Orvane_DiskDrive" elements, with HealthState from
// their SMART status.
#pragma once

#include "block_disks.hpp"
#include "orv/platform/HealthElements.h"
#include "smart_probe.hpp"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kDiskDriveClass = "Orvane_DiskDrive";

// The disk's SMART health: NVMe from the health log, ATA from the status and
// attributes; nothing for other buses, for an ATA drive in standby (not woken
// for it), or when the drive does not answer.
std::optional<std::uint16_t> diskHealth(const BlockDisk& disk, SmartProbe& probe);

// DeviceID is the disk's identity; ElementName its model (else its name);
// MaxMediaSize in kilobytes.
orv::platform::HealthElement diskElement(const BlockDisk& disk, std::optional<std::uint16_t> health);
std::vector<orv::platform::HealthElement> diskElements(const std::string& sysRoot, SmartProbe& probe);

}  // namespace orv::linuxhost::health
