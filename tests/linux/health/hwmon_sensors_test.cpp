// hwmon sensors on sysfs trees shaped after the kernel's hwmon sysfs interface:
// a desktop board (coretemp and a Super-I/O chip), a server (a PCI temperature
// chip and an ACPI power meter), a laptop (a thermal-zone chip and drivers with
// no device), with alarms, faults and readings over their limits.
#include "health/sensor_elements.hpp"
#include "sysfs_tree.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost::health;
using namespace orv::linuxtest;
using orv::platform::HealthElement;

namespace {

// A chip at devices/<device>, its hwmon folder hwmon<n>, linked from class/hwmon.
std::string chip(const SysfsTree& tree, const std::string& device, int n, const std::string& name)
{
    const std::string dir = "devices/" + device + "/hwmon/hwmon" + std::to_string(n);
    tree.write(dir + "/name", name);
    tree.link(dir, "class/hwmon/hwmon" + std::to_string(n));
    return dir;
}

const HealthElement& byId(const std::vector<HealthElement>& elements, const std::string& id)
{
    for (const auto& element : elements) {
        if (keyOf(element, "DeviceID") == id) return element;
    }
    throw std::runtime_error("no element " + id);
}

class DesktopBoard : public ::testing::Test {
protected:
    void SetUp() override
    {
        const std::string core = chip(tree, "platform/coretemp.0", 1, "coretemp");
        tree.writeAll(core, {{"temp1_label", "Package id 0"}, {"temp1_input", "45000"}, {"temp1_max", "80000"},
                             {"temp1_crit", "100000"}, {"temp1_crit_alarm", "0"},
                             {"temp2_label", "Core 0"}, {"temp2_input", "101000"}, {"temp2_max", "80000"},
                             {"temp2_crit", "100000"}, {"temp2_crit_alarm", "0"}});
        const std::string sio = chip(tree, "platform/nct6775.656", 3, "nct6798");
        tree.writeAll(sio, {{"in0_input", "1040"}, {"in0_min", "0"}, {"in0_max", "1744"}, {"in0_alarm", "0"},
                            {"in1_input", "1000"}, {"in1_min", "0"}, {"in1_max", "0"},
                            {"in2_input", "3280"}, {"in2_min", "2960"}, {"in2_max", "3632"}, {"in2_alarm", "1"},
                            {"fan1_input", "1200"}, {"fan1_min", "300"}, {"fan1_alarm", "0"},
                            {"fan2_input", "150"}, {"fan2_min", "300"},
                            {"temp1_input", "-30000"}, {"temp1_fault", "1"},
                            {"temp2_input", "38000"}, {"temp2_enable", "0"}, {"temp2_max", "10000"},
                            {"curr1_input", "900"}, {"curr1_lcrit", "1000"}});
        elements = sensorElements(tree.root());
    }

    SysfsTree tree;
    std::vector<HealthElement> elements;
};

TEST_F(DesktopBoard, EveryEnabledChannelIsASensorKeyedByChipDevicePathAndChannel)
{
    std::vector<std::string> ids;
    for (const auto& element : elements) {
        EXPECT_EQ(element.className, "Orvane_NumericSensor");
        EXPECT_EQ(keyOf(element, "CreationClassName"), "Orvane_NumericSensor");
        ids.push_back(*keyOf(element, "DeviceID"));
    }
    EXPECT_EQ(ids, (std::vector<std::string>{
                       "platform/coretemp.0/temp1", "platform/coretemp.0/temp2", "platform/nct6775.656/temp1",
                       "platform/nct6775.656/in0", "platform/nct6775.656/in1", "platform/nct6775.656/in2",
                       "platform/nct6775.656/fan1", "platform/nct6775.656/fan2", "platform/nct6775.656/curr1"}));
}

TEST_F(DesktopBoard, TemperatureBelowItsLimitsIsOkWithReadingAndThresholdsInMillidegrees)
{
    const HealthElement& package = byId(elements, "platform/coretemp.0/temp1");
    EXPECT_EQ(healthOf(package), 5);
    EXPECT_EQ(property<std::string>(package, "ElementName"), "Package id 0");
    EXPECT_EQ(property<std::uint16_t>(package, "SensorType"), 2);
    EXPECT_EQ(property<std::uint16_t>(package, "BaseUnits"), 2);
    EXPECT_EQ(property<std::int32_t>(package, "UnitModifier"), -3);
    EXPECT_EQ(property<std::int32_t>(package, "CurrentReading"), 45000);
    EXPECT_EQ(property<std::int32_t>(package, "UpperThresholdNonCritical"), 80000);
    EXPECT_EQ(property<std::int32_t>(package, "UpperThresholdCritical"), 100000);
    EXPECT_EQ(property<std::string>(package, "CurrentState"), "Normal");
    EXPECT_EQ(property<std::vector<std::uint16_t>>(package, "OperationalStatus"), std::vector<std::uint16_t>{2});
}

TEST_F(DesktopBoard, ReadingOverTheCriticalLimitIsCriticalFailure)
{
    const HealthElement& core = byId(elements, "platform/coretemp.0/temp2");
    EXPECT_EQ(healthOf(core), 25);
    EXPECT_EQ(property<std::string>(core, "CurrentState"), "Upper Critical");
    EXPECT_EQ(property<std::vector<std::uint16_t>>(core, "OperationalStatus"), std::vector<std::uint16_t>{6});
}

TEST_F(DesktopBoard, FaultyChannelIsMajorFailureWithoutReading)
{
    const HealthElement& faulty = byId(elements, "platform/nct6775.656/temp1");
    EXPECT_EQ(healthOf(faulty), 20);
    EXPECT_EQ(property<std::string>(faulty, "CurrentState"), "Fault");
    EXPECT_FALSE(propertyOf(faulty, "CurrentReading"));
    EXPECT_EQ(property<std::string>(faulty, "ElementName"), "nct6798 temp1");
}

TEST_F(DesktopBoard, AlarmSetIsDegradedEvenInsideTheLimits)
{
    EXPECT_EQ(healthOf(byId(elements, "platform/nct6775.656/in2")), 10);
    EXPECT_EQ(property<std::string>(byId(elements, "platform/nct6775.656/in2"), "CurrentState"), "Non-Critical");
    EXPECT_EQ(healthOf(byId(elements, "platform/nct6775.656/in0")), 5);
}

TEST_F(DesktopBoard, UpperLimitOfZeroCountsAsUnset)
{
    EXPECT_EQ(healthOf(byId(elements, "platform/nct6775.656/in1")), 5);
}

TEST_F(DesktopBoard, FanUnderItsMinimumIsDegradedInRpm)
{
    const HealthElement& fan = byId(elements, "platform/nct6775.656/fan2");
    EXPECT_EQ(healthOf(fan), 10);
    EXPECT_EQ(property<std::string>(fan, "CurrentState"), "Lower Non-Critical");
    EXPECT_EQ(property<std::uint16_t>(fan, "SensorType"), 5);
    EXPECT_EQ(property<std::uint16_t>(fan, "BaseUnits"), 19);
    EXPECT_EQ(property<std::int32_t>(fan, "UnitModifier"), 0);
    EXPECT_EQ(healthOf(byId(elements, "platform/nct6775.656/fan1")), 5);
}

TEST_F(DesktopBoard, CurrentUnderItsLowerCriticalLimitIsCriticalFailure)
{
    const HealthElement& current = byId(elements, "platform/nct6775.656/curr1");
    EXPECT_EQ(healthOf(current), 25);
    EXPECT_EQ(property<std::string>(current, "CurrentState"), "Lower Critical");
    EXPECT_EQ(property<std::int32_t>(current, "LowerThresholdCritical"), 1000);
}

TEST_F(DesktopBoard, ChipNumbersDoNotChangeTheKeys)
{
    SysfsTree renumbered;
    const std::string core = chip(renumbered, "platform/coretemp.0", 7, "coretemp");
    renumbered.writeAll(core, {{"temp1_input", "45000"}});
    EXPECT_EQ(keyOf(sensorElements(renumbered.root()).at(0), "DeviceID"), "platform/coretemp.0/temp1");
}

TEST(ServerSensors, PciChipWithoutLimitsReportsNoHealth)
{
    SysfsTree tree;
    const std::string k10 = chip(tree, "pci0000:00/0000:00:18.3", 0, "k10temp");
    tree.writeAll(k10, {{"temp1_label", "Tctl"}, {"temp1_input", "52125"}});
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "pci0000:00/0000:00:18.3/temp1");
    EXPECT_FALSE(elements[0].healthState);
    EXPECT_FALSE(propertyOf(elements[0], "OperationalStatus"));
    EXPECT_FALSE(propertyOf(elements[0], "CurrentState"));
    EXPECT_EQ(property<std::int32_t>(elements[0], "CurrentReading"), 52125);
}

TEST(ServerSensors, PowerMeterAverageInWattsScaledToFit)
{
    SysfsTree tree;
    const std::string meter = chip(tree, "LNXSYSTM:00/device:00/ACPI000D:00", 2, "power_meter");
    tree.writeAll(meter, {{"power1_average", "3100000000"}, {"power1_cap", "3500000000"}, {"power1_max", "3000000000"}});
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(property<std::uint16_t>(elements[0], "SensorType"), 13);
    EXPECT_EQ(property<std::uint16_t>(elements[0], "BaseUnits"), 7);
    EXPECT_EQ(property<std::int32_t>(elements[0], "UnitModifier"), -3);
    EXPECT_EQ(property<std::int32_t>(elements[0], "CurrentReading"), 3100000);
    EXPECT_EQ(property<std::int32_t>(elements[0], "UpperThresholdNonCritical"), 3000000);
    EXPECT_EQ(healthOf(elements[0]), 10);
}

TEST(ServerSensors, EmergencyAlarmIsNonRecoverable)
{
    SysfsTree tree;
    const std::string dir = chip(tree, "platform/it87.2592", 0, "it8728");
    tree.writeAll(dir, {{"temp1_input", "60000"}, {"temp1_emergency", "110000"}, {"temp1_emergency_alarm", "1"}});
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(healthOf(elements[0]), 30);
    EXPECT_EQ(property<std::string>(elements[0], "CurrentState"), "Upper Fatal");
    EXPECT_EQ(property<std::vector<std::uint16_t>>(elements[0], "OperationalStatus"), std::vector<std::uint16_t>{7});
}

TEST(LaptopSensors, ThermalZoneChipIsKeyedByItsZone)
{
    SysfsTree tree;
    const std::string zone = "devices/virtual/thermal/thermal_zone0/hwmon1";
    tree.writeAll(zone, {{"name", "acpitz"}, {"temp1_input", "27800"}, {"temp1_crit", "119000"}});
    tree.link(zone, "class/hwmon/hwmon1");
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "virtual/thermal/thermal_zone0/temp1");
    EXPECT_EQ(healthOf(elements[0]), 5);
}

TEST(LaptopSensors, ChipsWithoutDeviceAreKeyedByNameInOrder)
{
    SysfsTree tree;
    for (int n : {4, 12}) {
        const std::string dir = "devices/virtual/hwmon/hwmon" + std::to_string(n);
        tree.writeAll(dir, {{"name", "nvme_like"}, {"temp1_input", "30000"}});
        tree.link(dir, "class/hwmon/hwmon" + std::to_string(n));
    }
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "virtual/nvme_like/temp1");
    EXPECT_EQ(keyOf(elements[1], "DeviceID"), "virtual/nvme_like#2/temp1");
}

TEST(LaptopSensors, AttributesInTheDeviceFolderOfOldDrivers)
{
    SysfsTree tree;
    const std::string device = "devices/platform/applesmc.768";
    tree.writeAll(device, {{"name", "applesmc"}, {"fan1_input", "2000"}, {"fan1_min", "1800"}, {"fan1_label", "Exhaust"}});
    tree.mkdir(device + "/hwmon/hwmon0");
    tree.link(device, device + "/hwmon/hwmon0/device");
    tree.link(device + "/hwmon/hwmon0", "class/hwmon/hwmon0");
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_EQ(keyOf(elements[0], "DeviceID"), "platform/applesmc.768/fan1");
    EXPECT_EQ(property<std::string>(elements[0], "ElementName"), "Exhaust");
    EXPECT_EQ(healthOf(elements[0]), 5);
}

TEST(LaptopSensors, UnreadableReadingLeavesOnlyThatValueOut)
{
    SysfsTree tree;
    const std::string dir = chip(tree, "platform/coretemp.0", 0, "coretemp");
    tree.writeAll(dir, {{"temp1_max", "80000"}, {"temp1_crit_alarm", "0"}});
    tree.mkdir(dir + "/temp1_input");  // reading it fails
    auto elements = sensorElements(tree.root());
    ASSERT_EQ(elements.size(), 1u);
    EXPECT_FALSE(propertyOf(elements[0], "CurrentReading"));
    EXPECT_EQ(property<std::int32_t>(elements[0], "UpperThresholdNonCritical"), 80000);
    EXPECT_EQ(healthOf(elements[0]), 5);
}

TEST(NoSensors, MachineWithoutHwmonAnswersNothing)
{
    SysfsTree tree;
    EXPECT_TRUE(sensorElements(tree.root()).empty());
}

}  // namespace
