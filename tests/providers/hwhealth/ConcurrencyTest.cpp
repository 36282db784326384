// Requests on several broker threads at once: each reads the platform afresh
// and returns the whole answer, the computer system's roll-up included.
#include <atomic>
#include <string>
#include <thread>

#include "HwHealthFixture.h"

namespace hwhealth_test {
namespace {

using HwHealthConcurrencyTest = HwHealthTest;

TEST_F(HwHealthConcurrencyTest, ConcurrentRequestsEachSeeEveryElementAndTheSameSystem) {
    serve({element("CIM_Sensor", "Orvane_NumericSensor", {{"DeviceID", "temp1"}}, 5),
           element("CIM_Sensor", "CIM_Sensor", {{"DeviceID", "fan0"}}, 10),
           element("Orvane_DiskDrive", "Orvane_DiskDrive", {{"DeviceID", "sda"}}, 20)});
    const std::vector<std::string> sensors = pathsOf(provider().enumerateInstanceNames("CIM_Sensor"));
    ASSERT_EQ(sensors.size(), 2U);
    std::atomic<int> mismatches{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([this, &sensors, &mismatches] {
            for (int i = 0; i < 25; ++i) {
                const orv::host::Reply names = provider().enumerateInstanceNames("CIM_Sensor");
                const orv::host::Reply system = provider().enumerateInstances(kSystemClass);
                const std::optional<NamedValue> health =
                    system.instances().size() == 1
                        ? orv::providertest::propertyOf(system.instances()[0], "HealthState")
                        : std::nullopt;
                if (pathsOf(names) != sensors || !health || health->text != "20") {
                    ++mismatches;
                }
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(mismatches.load(), 0);
}

}  // namespace
}  // namespace hwhealth_test
