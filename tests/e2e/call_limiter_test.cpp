// The provider call limit's thread pool, driven directly: inline calls without a
// limit, results within it, overruns answered at once and waited for by drain(),
// and call threads kept for the next request.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>

#include "call_limiter.hpp"

namespace orv::cimhost::detail {
namespace {

using namespace std::chrono_literals;

TEST(CallLimiter, ZeroLimitRunsTheWorkOnTheCallingThread) {
    CallLimiter limiter(0ms);
    std::thread::id ranOn;
    EXPECT_EQ(limiter.run([&ranOn] {
        ranOn = std::this_thread::get_id();
        return std::string("done");
    }),
              "done");
    EXPECT_EQ(ranOn, std::this_thread::get_id());
}

TEST(CallLimiter, WorkWithinTheLimitAnswersItsResultFromACallThread) {
    CallLimiter limiter(5000ms);
    std::thread::id ranOn;
    EXPECT_EQ(limiter.run([&ranOn] {
        ranOn = std::this_thread::get_id();
        return std::string("answer");
    }),
              "answer");
    EXPECT_NE(ranOn, std::this_thread::get_id());
    EXPECT_EQ(limiter.overrunning(), 0U);
}

TEST(CallLimiter, OverrunAnswersAtTheLimitAndDrainWaitsForTheCall) {
    CallLimiter limiter(50ms);
    auto finished = std::make_shared<std::atomic<bool>>(false);
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(limiter.run([finished] {
        std::this_thread::sleep_for(400ms);
        finished->store(true);
        return std::string("late");
    }),
              std::nullopt);
    EXPECT_LT(std::chrono::steady_clock::now() - start, 350ms);
    EXPECT_EQ(limiter.overrunning(), 1U);
    EXPECT_FALSE(finished->load());
    limiter.drain();
    EXPECT_TRUE(finished->load());
    EXPECT_EQ(limiter.overrunning(), 0U);
}

TEST(CallLimiter, RequestDoesNotQueueBehindAnOverrunningCall) {
    CallLimiter limiter(100ms);
    EXPECT_EQ(limiter.run([] {
        std::this_thread::sleep_for(600ms);
        return std::string("stuck");
    }),
              std::nullopt);
    EXPECT_EQ(limiter.run([] { return std::string("next"); }), "next");
}

TEST(CallLimiter, CallThreadIsKeptForTheNextRequest) {
    CallLimiter limiter(5000ms);
    std::thread::id first;
    std::thread::id second;
    limiter.run([&first] {
        first = std::this_thread::get_id();
        return std::string();
    });
    limiter.run([&second] {
        second = std::this_thread::get_id();
        return std::string();
    });
    EXPECT_EQ(first, second);
}

}  // namespace
}  // namespace orv::cimhost::detail
