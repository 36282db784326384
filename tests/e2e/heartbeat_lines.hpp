// Reading the heartbeat indications orv-cimlistener prints (one text line each),
// for the end-to-end heartbeat tests of both brokers.
#pragma once

#include <ctime>
#include <optional>
#include <string>
#include <vector>

namespace orv::e2e {

struct HeartbeatLine {
    long stamp = -1;
    std::string hostname;
    std::string indicationTime;  // the datetime string as delivered
};

// The heartbeat of one listener line; nullopt when the line is not an
// Orvane_CIMHeartbeat with a stamp, a hostname and an IndicationTime.
std::optional<HeartbeatLine> parseHeartbeatLine(const std::string& line);

// The moment a CIM datetime timestamp ("yyyymmddhhmmss.mmmmmm+utc") names;
// nullopt for an interval, a malformed value or a fraction of a second.
std::optional<std::time_t> wholeSecondTimestamp(const std::string& datetime);

// This machine's gethostname().
std::string machineHostName();

}  // namespace orv::e2e
