// Sensors of the hwmon class (<sys>/class/hwmon): one entry per temperature,
// voltage, fan, current and power channel, with its reading, limits and the
// alarm and fault flags the chip reports, and the health they amount to.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

enum class SensorKind { Temperature, Voltage, Fan, Current, Power };

struct HwmonSensor {
    // The chip's identity that survives reboots: its device path under
    // <sys>/devices ("platform/coretemp.0", "pci0000:00/0000:00:18.3"), or
    // "virtual/<name>" (with "#n" from the second one on) for a chip without one.
    std::string chip;
    std::string chipName;  // the chip's `name` file
    SensorKind kind = SensorKind::Temperature;
    std::string channel;   // the attribute prefix: "temp1", "in0", "fan2"
    std::optional<std::string> label;
    // Values as the chip writes them: millidegrees Celsius, millivolts, RPM,
    // milliamperes, microwatts.
    std::optional<std::int64_t> input;
    std::optional<std::int64_t> min, max, lcrit, crit, emergency;
    std::optional<bool> alarm, minAlarm, maxAlarm, lcritAlarm, critAlarm, emergencyAlarm, fault;
};

// The sensor's condition: its HealthState (nothing when the chip gives no
// limit and no flag to judge it by) and a short text for CurrentState.
struct SensorCondition {
    std::optional<std::uint16_t> healthState;
    std::string state;  // "Normal", "Upper Critical", ... ; empty when not judged
};

// Every enabled channel of every chip, chips in hwmon order, channels by kind
// then number. A chip or file that cannot be read leaves only that out.
std::vector<HwmonSensor> readHwmonSensors(const std::string& sysRoot);

// Fault: 20. Emergency alarm or reading over the emergency limit: 30.
// Critical alarm or reading beyond crit/lcrit: 25. Any other alarm or reading
// beyond max/min: 10. Otherwise 5 when some limit or flag exists, else nothing.
// An upper limit of 0 is taken as not set (chips show unset limits as 0).
SensorCondition sensorCondition(const HwmonSensor& sensor);

}  // namespace orv::linuxhost::health
