// CPU activity from cumulative counters kept across requests: no request waits,
// and the activity covers at least one window once an old enough reading exists.
#include "cpu_load_sampler.hpp"

#include <gtest/gtest.h>

using namespace orv::linuxhost;
using namespace std::chrono_literals;

namespace {

CpuReading reading(std::uint64_t busy, std::uint64_t idle) { return {{0, CpuTimes{busy, idle}}}; }

}  // namespace

TEST(CpuLoadSampler, FirstRequestAnswersTheLoadSinceBoot)
{
    CpuLoadSampler sampler(50ms, "/nonexistent");
    auto activity = sampler.sample(CpuLoadSampler::Clock::time_point{} + 10s, reading(300, 700));
    EXPECT_EQ(activity.at(0).activeLoad, 30u);
    EXPECT_TRUE(activity.at(0).halted);
    EXPECT_EQ(activity.at(0).total.busy, 300u);
}

TEST(CpuLoadSampler, FrequentRequestsCompareWithAReadingAtLeastAWindowOld)
{
    CpuLoadSampler sampler(50ms, "/nonexistent");
    const auto start = CpuLoadSampler::Clock::time_point{} + 10s;
    sampler.sample(start, reading(100, 100));
    sampler.sample(start + 20ms, reading(110, 100));            // too young to be a baseline
    sampler.sample(start + 60ms, reading(140, 100));            // kept: a window after the first
    auto activity = sampler.sample(start + 70ms, reading(150, 100));
    EXPECT_EQ(activity.at(0).activeLoad, 100u);                 // busy only since start
    EXPECT_FALSE(activity.at(0).halted);
    activity = sampler.sample(start + 115ms, reading(150, 130));  // baseline now the reading at +60 ms
    EXPECT_EQ(activity.at(0).activeLoad, 25u);                  // 10 busy, 30 idle ticks
    EXPECT_TRUE(activity.at(0).halted);
}

TEST(CpuLoadSampler, RareRequestsCoverTheTimeSinceThePreviousOne)
{
    CpuLoadSampler sampler(50ms, "/nonexistent");
    const auto start = CpuLoadSampler::Clock::time_point{} + 10s;
    sampler.sample(start, reading(100, 100));
    auto activity = sampler.sample(start + 60s, reading(100, 6100));
    EXPECT_EQ(activity.at(0).activeLoad, 0u);
    EXPECT_TRUE(activity.at(0).halted);
    activity = sampler.sample(start + 120s, reading(3100, 9100));
    EXPECT_EQ(activity.at(0).activeLoad, 50u);
}

TEST(CpuLoadSampler, ReadsProcStat)
{
    CpuLoadSampler sampler(50ms, "/proc");
    auto activity = sampler.sample();
    ASSERT_FALSE(activity.empty());
    EXPECT_LE(activity.begin()->second.activeLoad, 100u);
}
