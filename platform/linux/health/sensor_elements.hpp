// hwmon sensors as "Orvane_NumericSensor" elements.
#pragma once

#include "hwmon_sensors.hpp"
#include "orv/platform/HealthElements.h"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kNumericSensorClass = "Orvane_NumericSensor";

// DeviceID "<chip>/<channel>"; readings and limits in the sensor's base unit
// times 10^UnitModifier, the modifier raised by thousands until every value
// fits a sint32.
orv::platform::HealthElement sensorElement(const HwmonSensor& sensor);
std::vector<orv::platform::HealthElement> sensorElements(const std::string& sysRoot);

}  // namespace orv::linuxhost::health
