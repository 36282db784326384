// Host-wide processor state: the SMT state, the frequency governor mapped to a
// power policy, the model name, and per-CPU busy/idle accounting from /proc/stat.
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace orv::linuxhost {

// Hyperthreading state codes of the processor records.
enum class HtState : std::uint32_t { NotPresent = 0, FirmwareDisabled = 1, KernelDisabled = 2, Enabled = 3 };

// smt/control ("on", "off", "forceoff", "notsupported", "notimplemented") and
// smt/active ("0"/"1") into a hyperthreading state.
HtState htStateFrom(std::string_view control, bool active);
HtState readHtState(const std::string& sysRoot = "/sys");

struct PowerPolicy {
    std::uint64_t id = 0;
    std::string shortName;
    std::string name;
    std::string description;
};

// The frequency governor of the first online CPU mapped to a power policy;
// an empty governor (no frequency scaling) is the "off" policy.
PowerPolicy policyForGovernor(std::string_view governor);
PowerPolicy readPowerPolicy(const std::string& sysRoot = "/sys");

// "model name" of the first processor in /proc/cpuinfo text; empty when absent.
std::string parseModelName(std::string_view cpuinfo);
// Throws LinuxCallError when /proc/cpuinfo cannot be read.
std::string readModelName(const std::string& procRoot = "/proc");

struct CpuTimes {
    std::uint64_t busy = 0;  // user nice system irq softirq steal, in clock ticks
    std::uint64_t idle = 0;  // idle iowait
};
// Per-CPU lines ("cpuN ...") of /proc/stat text.
std::map<unsigned, CpuTimes> parseProcStat(std::string_view text);

struct CpuActivity {
    bool halted = false;           // the CPU idled during the window
    std::uint32_t activeLoad = 0;  // busy share of the window in percent, rounded up
    CpuTimes total;                // counters at the end of the window
};
CpuActivity activityBetween(const CpuTimes& before, const CpuTimes& after);
// Two samples of /proc/stat the given window apart; throws LinuxCallError.
std::map<unsigned, CpuActivity> sampleCpuActivity(std::chrono::milliseconds window, const std::string& procRoot = "/proc");

}  // namespace orv::linuxhost
