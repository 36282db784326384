#include "power_supplies.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

#include <map>

namespace orv::linuxhost::health {

namespace {

PowerSupplyInfo readSupply(const std::string& dir, const std::string& name)
{
    auto text = [&](const char* file) { return readLine(dir + "/" + file); };
    auto number = [&](const char* file) { return readNumber(dir + "/" + file); };
    PowerSupplyInfo supply;
    supply.name = name;
    supply.type = text("type").value_or("Unknown");
    supply.scope = text("scope");
    supply.health = text("health");
    supply.status = text("status");
    supply.capacityLevel = text("capacity_level");
    supply.technology = text("technology");
    supply.modelName = text("model_name");
    supply.manufacturer = text("manufacturer");
    supply.serialNumber = text("serial_number");
    supply.present = number("present");
    supply.online = number("online");
    supply.capacity = number("capacity");
    supply.energyFullDesign = number("energy_full_design");
    supply.energyFull = number("energy_full");
    supply.chargeFullDesign = number("charge_full_design");
    supply.chargeFull = number("charge_full");
    supply.voltageMinDesign = number("voltage_min_design");
    return supply;
}

std::optional<std::uint16_t> fromHealthText(const std::optional<std::string>& text)
{
    static const std::map<std::string, std::uint16_t> states = {
        {"Good", kOk},
        {"Cold", kDegraded},
        {"Warm", kDegraded},
        {"Cool", kDegraded},
        {"Watchdog timer expire", kDegraded},
        {"Safety timer expire", kDegraded},
        {"Calibration required", kDegraded},
        {"Unspecified failure", kMajorFailure},
        {"No battery", kMajorFailure},
        {"Cell imbalance", kMajorFailure},
        {"Overheat", kCriticalFailure},
        {"Hot", kCriticalFailure},
        {"Over voltage", kCriticalFailure},
        {"Under voltage", kCriticalFailure},
        {"Over current", kCriticalFailure},
        {"Dead", kNonRecoverable},
        {"Blown fuse", kNonRecoverable},
    };
    if (!text || text->empty() || *text == "Unknown") return std::nullopt;
    auto found = states.find(*text);
    return found != states.end() ? found->second : kDegraded;
}

std::optional<std::uint16_t> fromCapacityLevel(const std::optional<std::string>& level)
{
    if (!level || level->empty() || *level == "Unknown") return std::nullopt;
    return *level == "Critical" ? kDegraded : kOk;
}

std::optional<std::uint16_t> fromStatus(const PowerSupplyInfo& supply)
{
    if (!supply.status || supply.status->empty() || *supply.status == "Unknown") return std::nullopt;
    if (supply.type == "UPS") return *supply.status == "Discharging" ? kDegraded : kOk;
    if (supply.type == "Battery") return kOk;
    return std::nullopt;
}

}  // namespace

std::vector<PowerSupplyInfo> readPowerSupplies(const std::string& sysRoot)
{
    std::vector<PowerSupplyInfo> supplies;
    const std::string classDir = sysRoot + "/class/power_supply";
    for (const std::string& name : directoryEntries(classDir)) {
        PowerSupplyInfo supply = readSupply(classDir + "/" + name, name);
        if (supply.scope == "Device") continue;
        supplies.push_back(std::move(supply));
    }
    return supplies;
}

std::optional<std::uint16_t> powerSupplyHealth(const PowerSupplyInfo& supply)
{
    return worse(worse(fromHealthText(supply.health), fromCapacityLevel(supply.capacityLevel)), fromStatus(supply));
}

}  // namespace orv::linuxhost::health
