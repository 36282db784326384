// The heartbeat's period, read from the broker's configuration file, and the
// pieces of that reading that the provider thread and the tests share.
#pragma once

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>

namespace Heartbeat {

// Seconds between two heartbeats; 300 until a configuration sets another value.
extern std::int32_t theHEARTBEAT_INTERVAL;

// Smallest interval a configuration may set.
constexpr std::int32_t kMinimumInterval = 30;

// The broker's configuration file and the key that holds the interval.
constexpr const char* kConfigFile = "/etc/sfcb/sfcb.cfg";
constexpr const char* kIntervalKey = "heartbeatInterval";

// Sets theHEARTBEAT_INTERVAL from the configuration file (under the root
// folder override), logging a file that cannot be opened and a value below
// the minimum. Never throws.
void LoadHeartBeatConfig();

// Where the value of a line holding the key starts and how long its digit
// run is. Scanning starts at the line's first character: a "#" before the
// first digit means no value; everything before the first digit and after
// the digit run is ignored. length 0: the line has no value.
struct DigitRun {
    std::size_t start = 0;
    std::size_t length = 0;
};
DigitRun scanIntervalLine(const std::string& line);

// What the configuration text says about the interval.
struct IntervalSetting {
    enum class Kind {
        None,          // no line with the key, or no usable value on it
        Accepted,      // value is at least the minimum
        BelowMinimum,  // value is below the minimum (-1 when the digits do not fit an int)
    };
    Kind kind = Kind::None;
    int value = -1;
};
// Reads lines until the first one containing the key, and takes its value.
IntervalSetting readIntervalSetting(std::istream& config);

}  // namespace Heartbeat
