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

// Expects the first two listener lines to be heartbeats of this machine with
// stamps 0 and 1, the first sent within a few seconds of `subscribed`, the
// second one interval (30 s) later, both timestamps in whole seconds.
void expectFirstTwoHeartbeats(const std::vector<std::string>& lines, std::time_t subscribed);

}  // namespace orv::e2e
