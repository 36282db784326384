// The provider call limit, driven directly: inline calls without a limit, results within
// it, overruns answered at once and waited for by drain(), and call threads kept for the
// next request; calls run on the caller's own thread under the watchdog the same way.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>
#include <vector>

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

TEST(CallLimiter, HereRunsTheWorkOnTheCallingThreadWithoutCallingOverrun) {
    CallLimiter limiter(5000ms);
    std::thread::id ranOn;
    bool overran = false;
    EXPECT_EQ(limiter.runHere(
                  [&ranOn] {
                      ranOn = std::this_thread::get_id();
                      return std::string("answer");
                  },
                  [&overran]() noexcept { overran = true; }),
              "answer");
    EXPECT_EQ(ranOn, std::this_thread::get_id());
    EXPECT_FALSE(overran);
    EXPECT_EQ(limiter.overrunning(), 0U);
}

TEST(CallLimiter, HereOverrunIsCalledOnceAtTheLimitWhileTheWorkGoesOn) {
    CallLimiter limiter(100ms);
    std::atomic<int> overruns{0};
    std::atomic<bool> workReturned{false};
    std::thread::id overrunOn;
    std::atomic<std::size_t> overrunningSeen{0};
    const auto start = std::chrono::steady_clock::now();
    std::chrono::steady_clock::duration firedAfter{};
    const std::string result = limiter.runHere(
        [&] {
            std::this_thread::sleep_for(600ms);
            overrunningSeen = limiter.overrunning();
            workReturned = true;
            return std::string("late");
        },
        [&]() noexcept {
            firedAfter = std::chrono::steady_clock::now() - start;
            overrunOn = std::this_thread::get_id();
            EXPECT_FALSE(workReturned.load());
            ++overruns;
        });
    EXPECT_EQ(result, "late");
    EXPECT_EQ(overruns.load(), 1);
    EXPECT_NE(overrunOn, std::this_thread::get_id());
    EXPECT_GE(firedAfter, 100ms);
    EXPECT_LT(firedAfter, 500ms);
    EXPECT_EQ(overrunningSeen.load(), 1U);
    EXPECT_EQ(limiter.overrunning(), 0U);
}

TEST(CallLimiter, DrainWaitsForAnOverrunningCallRunningOnItsCaller) {
    CallLimiter limiter(50ms);
    std::atomic<bool> overran{false};
    std::atomic<bool> finished{false};
    std::thread caller([&] {
        limiter.runHere(
            [&finished] {
                std::this_thread::sleep_for(400ms);
                finished = true;
                return std::string();
            },
            [&overran]() noexcept { overran = true; });
    });
    while (!overran.load()) {
        std::this_thread::sleep_for(5ms);
    }
    EXPECT_EQ(limiter.overrunning(), 1U);
    limiter.drain();
    EXPECT_TRUE(finished.load());
    caller.join();
}

TEST(CallLimiter, ManyCallersHereEachOverrunOnlyWhenLate) {
    CallLimiter limiter(150ms);
    std::atomic<int> overruns{0};
    std::atomic<int> answers{0};
    std::vector<std::thread> callers;
    for (int t = 0; t < 8; ++t) {
        callers.emplace_back([&, t] {
            for (int i = 0; i < 40; ++i) {
                const bool slow = (t == 0 && i < 2);  // two calls overrun, the rest are quick
                const std::string answer = limiter.runHere(
                    [slow] {
                        if (slow) {
                            std::this_thread::sleep_for(400ms);
                        }
                        return std::string("ok");
                    },
                    [&overruns]() noexcept { ++overruns; });
                if (answer == "ok") {
                    ++answers;
                }
            }
        });
    }
    for (auto& caller : callers) {
        caller.join();
    }
    EXPECT_EQ(answers.load(), 320);
    EXPECT_EQ(overruns.load(), 2);
    EXPECT_EQ(limiter.overrunning(), 0U);
}

}  // namespace
}  // namespace orv::cimhost::detail
