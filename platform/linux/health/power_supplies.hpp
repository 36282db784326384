// Power supplies and batteries of the power_supply class
// (<sys>/class/power_supply/<name>), as the power_supply ABI describes them.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

struct PowerSupplyInfo {
    std::string name;  // the driver's or firmware's name: "AC", "BAT0", "ups0"
    std::string type;  // "Mains", "UPS", "Battery", "USB", ...
    std::optional<std::string> scope;  // "System", "Device", "Unknown"
    std::optional<std::string> health, status, capacityLevel, technology, modelName, manufacturer, serialNumber;
    std::optional<std::uint64_t> present, online, capacity;
    // Design and full capacities: energy in µWh, or charge in µAh with the design voltage in µV.
    std::optional<std::uint64_t> energyFullDesign, energyFull, chargeFullDesign, chargeFull, voltageMinDesign;
};

// Every supply except those whose scope is "Device" (the batteries of
// peripherals), in name order; empty without the class.
std::vector<PowerSupplyInfo> readPowerSupplies(const std::string& sysRoot);

// The supply's HealthState from its `health` text (Good 5; Cold, Warm, Cool,
// timer expiries, Calibration required 10; Unspecified failure, No battery,
// Cell imbalance 20; Overheat, Hot, Over/Under voltage, Over current 25; Dead,
// Blown fuse 30; any other text but Unknown 10), its capacity level (Critical
// 10, another known level 5) and its status (a UPS that is Discharging runs
// on its battery: 10; a known status of a battery: 5); the worst of them, or
// nothing when none is known.
std::optional<std::uint16_t> powerSupplyHealth(const PowerSupplyInfo& supply);

}  // namespace orv::linuxhost::health
