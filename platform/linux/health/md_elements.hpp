// Software RAID arrays as storage elements: each array is an
// "Orvane_StorageVolume" and an "Orvane_StoragePool" (the capacity it
// manages), each member device an "Orvane_StorageExtent".
#pragma once

#include "md_arrays.hpp"
#include "orv/platform/HealthElements.h"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kStorageVolumeClass = "Orvane_StorageVolume";
inline constexpr const char* kStorageExtentClass = "Orvane_StorageExtent";
inline constexpr const char* kStoragePoolClass = "Orvane_StoragePool";

// Volume DeviceID and pool InstanceID: the array's id ("md:<uuid>").
orv::platform::HealthElement volumeElement(const MdArray& array);
orv::platform::HealthElement poolElement(const MdArray& array);
// Extent DeviceID: "<array id>/slot<n>" for an active member, "<array id>/dev-<device>" for a member without one (a spare, a failed member).
orv::platform::HealthElement extentElement(const MdArray& array, const MdMember& member);

std::vector<orv::platform::HealthElement> volumeElements(const std::string& sysRoot);
std::vector<orv::platform::HealthElement> poolElements(const std::string& sysRoot);
std::vector<orv::platform::HealthElement> extentElements(const std::string& sysRoot);

}  // namespace orv::linuxhost::health
