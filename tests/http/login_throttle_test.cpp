#include "login_throttle.hpp"

#include <gtest/gtest.h>

namespace orv::http::detail {
namespace {

using namespace std::chrono_literals;
using Clock = LoginThrottle::Clock;

TEST(LoginThrottle, FirstFailuresAreFreeThenTheDelayDoublesUpToItsCap) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    std::vector<long> delays;
    for (int i = 0; i < 10; ++i) {
        delays.push_back(static_cast<long>(throttle.failed("10.0.0.1", "u", now + i * 10ms).delay.count()));
    }
    EXPECT_EQ(delays, (std::vector<long>{0, 0, 0, 100, 200, 400, 800, 1600, 3200, 5000}));
}

TEST(LoginThrottle, OtherAddressesAreNotDelayed) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    for (int i = 0; i < 8; ++i) {
        throttle.failed("10.0.0.1", "u", now);
    }
    EXPECT_EQ(throttle.failed("10.0.0.2", "u", now).delay.count(), 0);
}

TEST(LoginThrottle, SuccessClearsTheAddress) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    for (int i = 0; i < 8; ++i) {
        throttle.failed("10.0.0.1", "u", now);
    }
    throttle.succeeded("10.0.0.1");
    EXPECT_EQ(throttle.failed("10.0.0.1", "u", now).delay.count(), 0);
}

TEST(LoginThrottle, AnAddressQuietForAMinuteStartsOver) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    for (int i = 0; i < 8; ++i) {
        throttle.failed("10.0.0.1", "u", now);
    }
    EXPECT_EQ(throttle.failed("10.0.0.1", "u", now + 61s).delay.count(), 0);
}

TEST(LoginThrottle, LogsOneLineASecondPerAddressCountingTheOnesHeldBack) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    EXPECT_EQ(throttle.failed("10.0.0.1", "root", now).logLine, "failed login from 10.0.0.1 as user \"root\"");
    EXPECT_FALSE(throttle.failed("10.0.0.1", "root", now + 300ms).logLine);
    EXPECT_FALSE(throttle.failed("10.0.0.1", "admin", now + 900ms).logLine);
    EXPECT_EQ(throttle.failed("10.0.0.2", "x", now + 900ms).logLine, "failed login from 10.0.0.2 as user \"x\"");
    EXPECT_EQ(throttle.failed("10.0.0.1", "admin", now + 1000ms).logLine,
              "failed login from 10.0.0.1 as user \"admin\" (2 more from this address since the last line)");
}

TEST(LoginThrottle, UserNameIsMadePrintableAndShortInTheLogLine) {
    LoginThrottle throttle;
    const std::string user = "a\"b\nc" + std::string(100, 'x');
    EXPECT_EQ(throttle.failed("10.0.0.1", user, Clock::time_point{}).logLine,
              "failed login from 10.0.0.1 as user \"a?b?c" + std::string(59, 'x') + "\"");
}

TEST(LoginThrottle, TrackedAddressesStayBounded) {
    LoginThrottle throttle;
    const Clock::time_point now{};
    for (std::size_t i = 0; i < LoginThrottle::kMaxAddresses + 500; ++i) {
        throttle.failed("addr" + std::to_string(i), "u", now);
    }
    EXPECT_LE(throttle.trackedAddresses(), LoginThrottle::kMaxAddresses);
}

}  // namespace
}  // namespace orv::http::detail
