// Per-CPU busy/idle activity without waiting: the cumulative counters of
// /proc/stat read now, compared with an earlier reading kept by the sampler
// across requests. The earlier reading is the newest one at least the window
// old, so the activity covers at least one window when requests come often,
// and the time since the previous request otherwise; before any earlier
// reading exists it covers the time since boot.
#pragma once

#include "cpu_state.hpp"

#include <chrono>
#include <map>
#include <mutex>
#include <string>
#include <vector>

namespace orv::linuxhost {

using CpuReading = std::map<unsigned, CpuTimes>;
using CpuActivities = std::map<unsigned, CpuActivity>;

class CpuLoadSampler {
public:
    using Clock = std::chrono::steady_clock;

    CpuLoadSampler(std::chrono::milliseconds window, std::string procRoot);

    // Reads /proc/stat and answers the activity since the baseline; throws LinuxCallError.
    CpuActivities sample();
    // The same for a reading taken at the given time (thread-safe).
    CpuActivities sample(Clock::time_point now, const CpuReading& current);

private:
    struct Stamped {
        Clock::time_point at;
        CpuReading reading;
    };

    std::chrono::milliseconds window_;
    std::string procRoot_;
    std::mutex mutex_;
    std::vector<Stamped> history_;  // oldest first; at most one entry older than the window
};

}  // namespace orv::linuxhost
