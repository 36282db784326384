#include "power_elements.hpp"

#include "element_builder.hpp"

namespace orv::linuxhost::health {

namespace {

std::string nameOf(const PowerSupplyInfo& supply)
{
    return supply.modelName && !supply.modelName->empty() ? *supply.modelName : supply.name;
}

// mWh from µWh, or from µAh times the design voltage in µV.
std::optional<std::uint32_t> milliwattHours(const std::optional<std::uint64_t>& energy,
                                            const std::optional<std::uint64_t>& charge,
                                            const std::optional<std::uint64_t>& voltage)
{
    if (energy) return static_cast<std::uint32_t>(*energy / 1000);
    if (charge && voltage) return static_cast<std::uint32_t>(*charge / 1000 * (*voltage / 1000) / 1000);
    return std::nullopt;
}

std::vector<orv::platform::HealthElement> elementsWhere(const std::string& sysRoot, bool batteries)
{
    std::vector<orv::platform::HealthElement> elements;
    for (const PowerSupplyInfo& supply : readPowerSupplies(sysRoot)) {
        if (batteries && supply.type == "Battery") elements.push_back(batteryElement(supply));
        if (!batteries && (supply.type == "Mains" || supply.type == "UPS")) elements.push_back(powerSupplyElement(supply));
    }
    return elements;
}

}  // namespace

std::uint16_t batteryStatusOf(const PowerSupplyInfo& battery)
{
    const std::string status = battery.status.value_or("Unknown");
    const std::string level = battery.capacityLevel.value_or("Unknown");
    if (status == "Full") return 3;
    if (status == "Charging") {
        if (level == "Critical") return 9;
        if (level == "Low") return 8;
        if (level == "High" || level == "Full") return 7;
        return 6;
    }
    if (level == "Critical") return 5;
    if (level == "Low") return 4;
    if (status == "Discharging") return 1;
    if (status == "Not charging") return 11;
    return 2;
}

std::uint16_t chemistryOf(const std::string& technology)
{
    if (technology == "NiCd") return 4;
    if (technology == "NiMH") return 5;
    if (technology == "Li-ion") return 6;
    if (technology == "Li-poly") return 8;
    if (technology.empty() || technology == "Unknown") return 2;
    return 1;
}

orv::platform::HealthElement powerSupplyElement(const PowerSupplyInfo& supply)
{
    orv::platform::HealthElement element = keyedElement(kPowerSupplyClass, "DeviceID", supply.name);
    addProperty(element, "ElementName", nameOf(supply));
    setHealth(element, powerSupplyHealth(supply));
    return element;
}

orv::platform::HealthElement batteryElement(const PowerSupplyInfo& battery)
{
    orv::platform::HealthElement element = keyedElement(kBatteryClass, "DeviceID", battery.name);
    addProperty(element, "ElementName", nameOf(battery));
    addProperty(element, "BatteryStatus", batteryStatusOf(battery));
    if (battery.capacity) addProperty(element, "EstimatedChargeRemaining", static_cast<std::uint16_t>(*battery.capacity));
    if (battery.technology) addProperty(element, "Chemistry", chemistryOf(*battery.technology));
    addIfKnown(element, "DesignCapacity",
               milliwattHours(battery.energyFullDesign, battery.chargeFullDesign, battery.voltageMinDesign));
    addIfKnown(element, "FullChargeCapacity", milliwattHours(battery.energyFull, battery.chargeFull, battery.voltageMinDesign));
    if (battery.voltageMinDesign) addProperty(element, "DesignVoltage", std::uint64_t{*battery.voltageMinDesign / 1000});
    setHealth(element, powerSupplyHealth(battery));
    return element;
}

std::vector<orv::platform::HealthElement> powerSupplyElements(const std::string& sysRoot)
{
    return elementsWhere(sysRoot, false);
}

std::vector<orv::platform::HealthElement> batteryElements(const std::string& sysRoot)
{
    return elementsWhere(sysRoot, true);
}

}  // namespace orv::linuxhost::health
