// power_supply entries as "Orvane_PowerSupply" (mains and UPS supplies) and
// "Orvane_Battery" (batteries) elements.
#pragma once

#include "orv/platform/HealthElements.h"
#include "power_supplies.hpp"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kPowerSupplyClass = "Orvane_PowerSupply";
inline constexpr const char* kBatteryClass = "Orvane_Battery";

// DeviceID is the supply's name.
orv::platform::HealthElement powerSupplyElement(const PowerSupplyInfo& supply);
orv::platform::HealthElement batteryElement(const PowerSupplyInfo& battery);
// The supplies of type Mains or UPS.
std::vector<orv::platform::HealthElement> powerSupplyElements(const std::string& sysRoot);
// The supplies of type Battery.
std::vector<orv::platform::HealthElement> batteryElements(const std::string& sysRoot);

// CIM_Battery.BatteryStatus from status and capacity level.
std::uint16_t batteryStatusOf(const PowerSupplyInfo& battery);
// CIM_Battery.Chemistry from the technology text.
std::uint16_t chemistryOf(const std::string& technology);

}  // namespace orv::linuxhost::health
