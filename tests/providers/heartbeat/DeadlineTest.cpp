// The end of a heartbeat wait: the interval added to the seconds, the
// microseconds turned into nanoseconds, a full second carried.
#include <gtest/gtest.h>

#include "Heartbeat-Deadline.h"

namespace heartbeat {
namespace {

TEST(HeartbeatDeadline, AddsTheIntervalAndTurnsMicrosecondsIntoNanoseconds) {
    const timespec deadline = Heartbeat::heartbeatDeadline(timeval{1000, 250000}, 300);
    EXPECT_EQ(deadline.tv_sec, 1300);
    EXPECT_EQ(deadline.tv_nsec, 250000000);
}

TEST(HeartbeatDeadline, LastMicrosecondOfASecondStaysInThatSecond) {
    const timespec deadline = Heartbeat::heartbeatDeadline(timeval{1000, 999999}, 30);
    EXPECT_EQ(deadline.tv_sec, 1030);
    EXPECT_EQ(deadline.tv_nsec, 999999000);
}

TEST(HeartbeatDeadline, AFullSecondOfMicrosecondsIsCarriedIntoTheSeconds) {
    const timespec deadline = Heartbeat::heartbeatDeadline(timeval{1000, 1000000}, 30);
    EXPECT_EQ(deadline.tv_sec, 1031);
    EXPECT_EQ(deadline.tv_nsec, 0);
}

}  // namespace
}  // namespace heartbeat
