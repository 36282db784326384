// Cost of one request of a watched hardware class through the Linux
// substitute's health readers: each class on this machine, and the sensors of
// a written server-sized hwmon tree (4 chips of 6 temperatures, 8 voltages and
// 6 fans, each with limits and alarm flags).
#include "health/linux_health.hpp"

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <unistd.h>

namespace fs = std::filesystem;

namespace {

const char* const kWatched[] = {"CIM_Sensor",          "CIM_PhysicalMemory",   "CIM_PowerSupply",
                                "Orvane_PortController", "Orvane_Controller",    "Orvane_Battery",
                                "Orvane_StorageVolume", "Orvane_StorageExtent", "Orvane_DiskDrive",
                                "Orvane_SASSATAPort",   "Orvane_StoragePool"};

void machineClass(benchmark::State& state)
{
    orv::linuxhost::LinuxHealth health("/sys", "/dev");
    const char* watched = kWatched[state.range(0)];
    state.SetLabel(watched);
    std::size_t count = 0;
    for (auto _ : state) count = health.elements(watched).size();
    state.counters["elements"] = static_cast<double>(count);
}
BENCHMARK(machineClass)->DenseRange(0, sizeof kWatched / sizeof *kWatched - 1);

void put(const fs::path& file, const std::string& text)
{
    fs::create_directories(file.parent_path());
    std::ofstream(file) << text << "\n";
}

// A server's hwmon tree under a fresh temporary root; removed at exit.
std::string serverTree()
{
    static const std::string root = [] {
        std::string dir = (fs::temp_directory_path() / ("orv-health-bench-" + std::to_string(::getpid()))).string();
        for (int chip = 0; chip < 4; ++chip) {
            const fs::path hwmon = fs::path(dir) / ("devices/platform/nct6775." + std::to_string(656 + chip)) / "hwmon" /
                                   ("hwmon" + std::to_string(chip));
            put(hwmon / "name", "nct6798");
            auto channels = [&](const char* kind, int first, int count, const char* input) {
                for (int n = first; n < first + count; ++n) {
                    const std::string channel = kind + std::to_string(n);
                    put(hwmon / (channel + "_input"), input);
                    put(hwmon / (channel + "_min"), "0");
                    put(hwmon / (channel + "_max"), "90000");
                    put(hwmon / (channel + "_alarm"), "0");
                    put(hwmon / (channel + "_label"), "channel " + channel);
                }
            };
            channels("temp", 1, 6, "45000");
            channels("in", 0, 8, "1200");
            channels("fan", 1, 6, "1100");
            fs::create_directories(fs::path(dir) / "class/hwmon");
            fs::create_symlink(fs::relative(hwmon, fs::path(dir) / "class/hwmon"),
                               fs::path(dir) / "class/hwmon" / ("hwmon" + std::to_string(chip)));
        }
        std::atexit([] { fs::remove_all(root); });
        return dir;
    }();
    return root;
}

void serverSensors(benchmark::State& state)
{
    orv::linuxhost::LinuxHealth health(serverTree(), "/nonexistent");
    std::size_t count = 0;
    for (auto _ : state) count = health.elements("CIM_Sensor").size();
    state.counters["elements"] = static_cast<double>(count);
}
BENCHMARK(serverSensors);

}  // namespace

BENCHMARK_MAIN();
