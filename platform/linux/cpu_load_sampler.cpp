#include "cpu_load_sampler.hpp"

#include "text_files.hpp"

namespace orv::linuxhost {

CpuLoadSampler::CpuLoadSampler(std::chrono::milliseconds window, std::string procRoot)
    : window_(window), procRoot_(std::move(procRoot))
{
}

CpuActivities CpuLoadSampler::sample()
{
    CpuReading current = parseProcStat(readFileOrThrow(procRoot_ + "/stat"));
    return sample(Clock::now(), current);
}

CpuActivities CpuLoadSampler::sample(Clock::time_point now, const CpuReading& current)
{
    static const CpuReading sinceBoot;
    std::lock_guard<std::mutex> lock(mutex_);
    // The baseline: the newest reading at least a window old, else the oldest one kept.
    std::size_t base = 0;
    for (std::size_t i = 0; i < history_.size(); ++i) {
        if (now - history_[i].at >= window_) base = i;
    }
    const CpuReading& before = history_.empty() ? sinceBoot : history_[base].reading;
    CpuActivities activities;
    for (const auto& [cpu, times] : current) {
        auto earlier = before.find(cpu);
        activities[cpu] = activityBetween(earlier != before.end() ? earlier->second : CpuTimes{}, times);
    }
    // Readings older than the baseline are never a baseline again.
    if (!history_.empty() && now - history_[base].at >= window_) history_.erase(history_.begin(), history_.begin() + base);
    // One reading per window is enough to keep the baseline fresh.
    if (history_.empty() || now - history_.back().at >= window_) history_.push_back({now, current});
    return activities;
}

}  // namespace orv::linuxhost
