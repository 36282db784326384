// Power supplies and batteries on power_supply trees shaped after the kernel's
// power_supply ABI: a laptop (mains adapter and battery), a server with a UPS,
// peripherals' batteries and USB ports, with failing batteries.
#include "health/power_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

const std::string kClass = "class/power_supply/";

void laptop(const SysfsTree& tree, const std::string& health, const std::string& status, const std::string& level)
{
    tree.writeAll("devices/LNXSYSTM:00/LNXSYBUS:00/ACPI0003:00/power_supply/AC", {{"type", "Mains"}, {"online", "0"}});
    tree.link("devices/LNXSYSTM:00/LNXSYBUS:00/ACPI0003:00/power_supply/AC", kClass + "AC");
    tree.writeAll("devices/LNXSYSTM:00/LNXSYBUS:00/PNP0C0A:00/power_supply/BAT0",
                  {{"type", "Battery"}, {"status", status}, {"present", "1"}, {"technology", "Li-ion"},
                   {"capacity", "57"}, {"capacity_level", level}, {"model_name", "5B10W13930"},
                   {"manufacturer", "SMP"}, {"energy_full_design", "57000000"}, {"energy_full", "51300000"},
                   {"voltage_min_design", "11520000"}, {"health", health}});
    tree.link("devices/LNXSYSTM:00/LNXSYBUS:00/PNP0C0A:00/power_supply/BAT0", kClass + "BAT0");
}

TEST(LaptopPower, MainsAdapterIsAPowerSupplyWithoutHealthInformation)
{
    SysfsTree tree;
    laptop(tree, "Good", "Discharging", "Normal");
    auto supplies = powerSupplyElements(tree.root());
    ASSERT_EQ(supplies.size(), 1u);
    EXPECT_EQ(supplies[0].className, "Orvane_PowerSupply");
    EXPECT_EQ(keyOf(supplies[0], "CreationClassName"), "Orvane_PowerSupply");
    EXPECT_EQ(keyOf(supplies[0], "DeviceID"), "AC");
    EXPECT_EQ(property<std::string>(supplies[0], "ElementName"), "AC");
    EXPECT_FALSE(supplies[0].healthState);
}

TEST(LaptopPower, GoodBatteryIsOkWithChargeChemistryAndCapacities)
{
    SysfsTree tree;
    laptop(tree, "Good", "Discharging", "Normal");
    auto batteries = batteryElements(tree.root());
    ASSERT_EQ(batteries.size(), 1u);
    const HealthElement& battery = batteries[0];
    EXPECT_EQ(battery.className, "Orvane_Battery");
    EXPECT_EQ(keyOf(battery, "DeviceID"), "BAT0");
    EXPECT_EQ(healthOf(battery), 5);
    EXPECT_EQ(property<std::string>(battery, "ElementName"), "5B10W13930");
    EXPECT_EQ(property<std::uint16_t>(battery, "BatteryStatus"), 1);
    EXPECT_EQ(property<std::uint16_t>(battery, "EstimatedChargeRemaining"), 57);
    EXPECT_EQ(property<std::uint16_t>(battery, "Chemistry"), 6);
    EXPECT_EQ(property<std::uint32_t>(battery, "DesignCapacity"), 57000u);
    EXPECT_EQ(property<std::uint32_t>(battery, "FullChargeCapacity"), 51300u);
    EXPECT_EQ(property<std::uint64_t>(battery, "DesignVoltage"), 11520u);
}

TEST(LaptopPower, DeadBatteryIsNonRecoverable)
{
    SysfsTree tree;
    laptop(tree, "Dead", "Not charging", "Unknown");
    auto batteries = batteryElements(tree.root());
    ASSERT_EQ(batteries.size(), 1u);
    EXPECT_EQ(healthOf(batteries[0]), 30);
    EXPECT_EQ(property<std::vector<std::uint16_t>>(batteries[0], "OperationalStatus"), std::vector<std::uint16_t>{7});
    EXPECT_EQ(property<std::uint16_t>(batteries[0], "BatteryStatus"), 11);
}

TEST(LaptopPower, OverheatingBatteryIsCriticalFailure)
{
    SysfsTree tree;
    laptop(tree, "Overheat", "Charging", "High");
    auto batteries = batteryElements(tree.root());
    EXPECT_EQ(healthOf(batteries.at(0)), 25);
    EXPECT_EQ(property<std::uint16_t>(batteries.at(0), "BatteryStatus"), 7);
}

TEST(LaptopPower, CriticalCapacityLevelDegradesAGoodBattery)
{
    SysfsTree tree;
    laptop(tree, "Good", "Discharging", "Critical");
    auto batteries = batteryElements(tree.root());
    EXPECT_EQ(healthOf(batteries.at(0)), 10);
    EXPECT_EQ(property<std::uint16_t>(batteries.at(0), "BatteryStatus"), 5);
}

TEST(LaptopPower, UnlistedHealthTextIsDegradedAndUnknownGivesNoHealth)
{
    SysfsTree tree;
    tree.writeAll(kClass + "BAT1", {{"type", "Battery"}, {"health", "Something new"}});
    tree.writeAll(kClass + "BAT2", {{"type", "Battery"}, {"health", "Unknown"}});
    auto batteries = batteryElements(tree.root());
    ASSERT_EQ(batteries.size(), 2u);
    EXPECT_EQ(healthOf(batteries[0]), 10);
    EXPECT_FALSE(batteries[1].healthState);
    EXPECT_EQ(property<std::uint16_t>(batteries[1], "BatteryStatus"), 2);
}

TEST(LaptopPower, BatteryCapacityFromChargeAndDesignVoltage)
{
    SysfsTree tree;
    tree.writeAll(kClass + "BAT0", {{"type", "Battery"}, {"charge_full_design", "5000000"},
                                    {"charge_full", "4000000"}, {"voltage_min_design", "11100000"},
                                    {"technology", "Li-poly"}, {"status", "Full"}});
    auto batteries = batteryElements(tree.root());
    ASSERT_EQ(batteries.size(), 1u);
    EXPECT_EQ(property<std::uint32_t>(batteries[0], "DesignCapacity"), 55500u);
    EXPECT_EQ(property<std::uint32_t>(batteries[0], "FullChargeCapacity"), 44400u);
    EXPECT_EQ(property<std::uint16_t>(batteries[0], "Chemistry"), 8);
    EXPECT_EQ(property<std::uint16_t>(batteries[0], "BatteryStatus"), 3);
    EXPECT_EQ(healthOf(batteries[0]), 5);
}

TEST(PeripheralPower, DeviceScopedBatteriesAndUsbPortsAreLeftOut)
{
    SysfsTree tree;
    tree.writeAll(kClass + "hidpp_battery_0", {{"type", "Battery"}, {"scope", "Device"}, {"capacity_level", "Critical"}});
    tree.writeAll(kClass + "ucsi-source-psy-USBC000:001", {{"type", "USB"}, {"online", "1"}, {"scope", "Unknown"}});
    EXPECT_TRUE(batteryElements(tree.root()).empty());
    EXPECT_TRUE(powerSupplyElements(tree.root()).empty());
}

TEST(ServerPower, UpsOnBatteryIsDegradedAndOnMainsIsOk)
{
    SysfsTree tree;
    tree.writeAll(kClass + "ups0", {{"type", "UPS"}, {"status", "Discharging"}, {"model_name", "Back-UPS"}});
    tree.writeAll(kClass + "ups1", {{"type", "UPS"}, {"status", "Charging"}});
    tree.writeAll(kClass + "psu0", {{"type", "Mains"}, {"online", "1"}, {"health", "Over voltage"}});
    auto supplies = powerSupplyElements(tree.root());
    ASSERT_EQ(supplies.size(), 3u);
    EXPECT_EQ(keyOf(supplies[0], "DeviceID"), "psu0");
    EXPECT_EQ(healthOf(supplies[0]), 25);
    EXPECT_EQ(keyOf(supplies[1], "DeviceID"), "ups0");
    EXPECT_EQ(property<std::string>(supplies[1], "ElementName"), "Back-UPS");
    EXPECT_EQ(healthOf(supplies[1]), 10);
    EXPECT_EQ(healthOf(supplies[2]), 5);
    EXPECT_TRUE(batteryElements(tree.root()).empty());
}

TEST(NoPower, MachineWithoutPowerSupplyClassAnswersNothing)
{
    SysfsTree tree;
    EXPECT_TRUE(powerSupplyElements(tree.root()).empty());
    EXPECT_TRUE(batteryElements(tree.root()).empty());
}

}  // namespace
