#include "cpu_state.hpp"

#include "text_files.hpp"

#include <sstream>
#include <thread>

namespace orv::linuxhost {

HtState htStateFrom(std::string_view control, bool active)
{
    if (control == "on") return active ? HtState::Enabled : HtState::KernelDisabled;
    if (control == "off") return HtState::KernelDisabled;
    if (control == "forceoff") return HtState::FirmwareDisabled;
    return HtState::NotPresent;  // notsupported, notimplemented, or no SMT control at all
}

HtState readHtState(const std::string& sysRoot)
{
    const std::string dir = sysRoot + "/devices/system/cpu/smt/";
    auto control = readLine(dir + "control").value_or("");
    auto active = readNumber(dir + "active").value_or(0);
    return htStateFrom(control, active != 0);
}

PowerPolicy policyForGovernor(std::string_view governor)
{
    if (governor.empty()) return {1, "off", "Not supported", "The host has no processor frequency scaling"};
    if (governor == "performance") return {2, "static", "High performance", "Processors run at their highest frequency"};
    if (governor == "powersave") return {3, "low", "Low power", "Processors run at their lowest frequency"};
    if (governor == "userspace") return {5, "custom", "Custom", "Processor frequency set by a user program"};
    // ondemand, conservative, schedutil and any other governor that follows the load
    return {4, "dynamic", "Balanced", "Processor frequency follows the load (" + std::string(governor) + ")"};
}

PowerPolicy readPowerPolicy(const std::string& sysRoot)
{
    const std::string base = sysRoot + "/devices/system/cpu/";
    auto governor = readLine(base + "cpufreq/policy0/scaling_governor");
    if (!governor) governor = readLine(base + "cpu0/cpufreq/scaling_governor");
    return policyForGovernor(governor.value_or(""));
}

std::string parseModelName(std::string_view cpuinfo)
{
    while (!cpuinfo.empty()) {
        auto end = cpuinfo.find('\n');
        std::string_view line = cpuinfo.substr(0, end);
        auto colon = line.find(':');
        if (colon != std::string_view::npos && trimmed(line.substr(0, colon)) == "model name") {
            return std::string(trimmed(line.substr(colon + 1)));
        }
        cpuinfo = end == std::string_view::npos ? std::string_view{} : cpuinfo.substr(end + 1);
    }
    return {};
}

std::string readModelName(const std::string& procRoot)
{
    return parseModelName(readFileOrThrow(procRoot + "/cpuinfo"));
}

std::map<unsigned, CpuTimes> parseProcStat(std::string_view text)
{
    std::map<unsigned, CpuTimes> cpus;
    std::istringstream lines{std::string(text)};
    std::string line;
    while (std::getline(lines, line)) {
        if (line.rfind("cpu", 0) != 0 || line.size() < 4 || line[3] < '0' || line[3] > '9') continue;
        std::istringstream fields(line.substr(3));
        unsigned cpu = 0;
        std::uint64_t user = 0, nice = 0, system = 0, idle = 0, iowait = 0, irq = 0, softirq = 0, steal = 0;
        fields >> cpu >> user >> nice >> system >> idle >> iowait >> irq >> softirq >> steal;
        if (!fields && !fields.eof()) continue;
        cpus[cpu] = CpuTimes{user + nice + system + irq + softirq + steal, idle + iowait};
    }
    return cpus;
}

CpuActivity activityBetween(const CpuTimes& before, const CpuTimes& after)
{
    const std::uint64_t busy = after.busy >= before.busy ? after.busy - before.busy : 0;
    const std::uint64_t idle = after.idle >= before.idle ? after.idle - before.idle : 0;
    CpuActivity activity;
    activity.total = after;
    activity.halted = idle > 0;
    if (busy + idle > 0) activity.activeLoad = static_cast<std::uint32_t>((busy * 100 + busy + idle - 1) / (busy + idle));
    return activity;
}

std::map<unsigned, CpuActivity> sampleCpuActivity(std::chrono::milliseconds window, const std::string& procRoot)
{
    const std::string path = procRoot + "/stat";
    auto before = parseProcStat(readFileOrThrow(path));
    std::this_thread::sleep_for(window);
    auto after = parseProcStat(readFileOrThrow(path));
    std::map<unsigned, CpuActivity> activity;
    for (const auto& [cpu, times] : after) {
        auto earlier = before.find(cpu);
        activity[cpu] = activityBetween(earlier != before.end() ? earlier->second : CpuTimes{}, times);
    }
    return activity;
}

}  // namespace orv::linuxhost
