#include "Heartbeat-Deadline.h"

namespace Heartbeat {

namespace {

constexpr long kNanosecondsPerSecond = 1000000000L;
constexpr long kNanosecondsPerMicrosecond = 1000L;

}  // namespace

timespec heartbeatDeadline(const timeval& now, std::int32_t interval) {
    timespec deadline{};
    deadline.tv_sec = now.tv_sec + interval;
    deadline.tv_nsec = static_cast<long>(now.tv_usec) * kNanosecondsPerMicrosecond;
    if (deadline.tv_nsec >= kNanosecondsPerSecond) {
        deadline.tv_sec += deadline.tv_nsec / kNanosecondsPerSecond;
        deadline.tv_nsec %= kNanosecondsPerSecond;
    }
    return deadline;
}

}  // namespace Heartbeat
