#include "sensor_elements.hpp"

#include "element_builder.hpp"

#include <cstdlib>
#include <limits>

namespace orv::linuxhost::health {

namespace {

struct Units {
    std::uint16_t sensorType;  // CIM_Sensor.SensorType
    std::uint16_t baseUnits;   // CIM_NumericSensor.BaseUnits
    std::int32_t modifier;     // of the chip's own unit
};

Units unitsOf(SensorKind kind)
{
    switch (kind) {
    case SensorKind::Temperature: return {2, 2, -3};  // Temperature, Degrees C, millidegrees
    case SensorKind::Voltage: return {3, 5, -3};      // Voltage, Volts, millivolts
    case SensorKind::Fan: return {5, 19, 0};          // Tachometer, RPM
    case SensorKind::Current: return {4, 6, -3};      // Current, Amps, milliamperes
    case SensorKind::Power: return {13, 7, -6};       // Power Consumption, Watts, microwatts
    }
    return {0, 0, 0};
}

bool fits(const std::optional<std::int64_t>& value)
{
    return !value || (*value >= std::numeric_limits<std::int32_t>::min() && *value <= std::numeric_limits<std::int32_t>::max());
}


std::optional<std::int32_t> narrow(const std::optional<std::int64_t>& value)
{
    if (!value) return std::nullopt;
    return static_cast<std::int32_t>(*value);
}

}  // namespace

orv::platform::HealthElement sensorElement(const HwmonSensor& sensor)
{
    orv::platform::HealthElement element = keyedElement(kNumericSensorClass, "DeviceID", sensor.chip + "/" + sensor.channel);
    const Units units = unitsOf(sensor.kind);
    const SensorCondition condition = sensorCondition(sensor);
    std::optional<std::int64_t> reading = sensor.fault.value_or(false) ? std::nullopt : sensor.input;
    std::optional<std::int64_t> min = sensor.min, max = sensor.max, lcrit = sensor.lcrit, crit = sensor.crit,
                                emergency = sensor.emergency;
    std::optional<std::int64_t>* values[] = {&reading, &min, &max, &lcrit, &crit, &emergency};
    std::int32_t modifier = units.modifier;
    auto allFit = [&] {
        for (auto* value : values) if (!fits(*value)) return false;
        return true;
    };
    while (!allFit()) {
        for (auto* value : values) if (*value) **value /= 1000;
        modifier += 3;
    }
    addProperty(element, "ElementName", sensor.label.value_or(sensor.chipName + " " + sensor.channel));
    addProperty(element, "SensorType", units.sensorType);
    addProperty(element, "BaseUnits", units.baseUnits);
    addProperty(element, "UnitModifier", modifier);
    addIfKnown(element, "CurrentReading", narrow(reading));
    addIfKnown(element, "LowerThresholdNonCritical", narrow(min));
    addIfKnown(element, "UpperThresholdNonCritical", narrow(max));
    addIfKnown(element, "LowerThresholdCritical", narrow(lcrit));
    addIfKnown(element, "UpperThresholdCritical", narrow(crit));
    addIfKnown(element, "UpperThresholdFatal", narrow(emergency));
    if (!condition.state.empty()) addProperty(element, "CurrentState", condition.state);
    setHealth(element, condition.healthState);
    return element;
}

std::vector<orv::platform::HealthElement> sensorElements(const std::string& sysRoot)
{
    return elementsFrom(readHwmonSensors(sysRoot), sensorElement);
}

}  // namespace orv::linuxhost::health
