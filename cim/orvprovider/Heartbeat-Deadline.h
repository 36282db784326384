// The end of one heartbeat wait, as an absolute wall-clock time.
#pragma once

#include <sys/time.h>
#include <time.h>

#include <cstdint>

namespace Heartbeat {

// `interval` seconds after `now`, the microseconds turned into nanoseconds
// (a full second of them carried into the seconds).
timespec heartbeatDeadline(const timeval& now, std::int32_t interval);

}  // namespace Heartbeat
