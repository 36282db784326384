// The heartbeat interval: the first line of the broker's configuration file
// that mentions "heartbeatInterval" decides it, whatever else that line holds.
#include "Heartbeat-Config.h"

#include <syslog.h>

#include <fstream>
#include <sstream>

#include <orv/platform/Paths.h>

namespace Heartbeat {

std::int32_t theHEARTBEAT_INTERVAL = 300;

namespace {

bool isDigit(char c) { return c >= '0' && c <= '9'; }

// The digit run read as an int; -1 when it does not fit.
int valueOf(const std::string& digits) {
    int value = -1;
    int read = 0;
    std::istringstream in(digits);
    if (in >> read) {
        value = read;
    }
    return value;
}

}  // namespace

DigitRun scanIntervalLine(const std::string& line) {
    DigitRun run;
    std::size_t at = 0;
    while (at < line.size() && !isDigit(line[at])) {
        if (line[at] == '#') {
            return run;
        }
        ++at;
    }
    run.start = at;
    while (at < line.size() && isDigit(line[at])) {
        ++at;
    }
    run.length = at - run.start;
    return run;
}

IntervalSetting readIntervalSetting(std::istream& config) {
    IntervalSetting setting;
    std::string line;
    while (std::getline(config, line)) {
        if (line.find(kIntervalKey) == std::string::npos) {
            continue;
        }
        const DigitRun run = scanIntervalLine(line);
        // A value at the very start of the line is not taken: the key comes first.
        if (run.length == 0 || run.start == 0) {
            return setting;
        }
        setting.value = valueOf(line.substr(run.start, run.length));
        setting.kind = setting.value > kMinimumInterval - 1 ? IntervalSetting::Kind::Accepted
                                                            : IntervalSetting::Kind::BelowMinimum;
        return setting;
    }
    return setting;
}

void LoadHeartBeatConfig() {
    const std::string path = orvRootPath(kConfigFile);
    std::ifstream config(path);
    if (!config.is_open()) {
        syslog(LOG_ERR, "Open file to read: %s failed, using default: %d seconds", path.c_str(),
               theHEARTBEAT_INTERVAL);
        return;
    }
    const IntervalSetting setting = readIntervalSetting(config);
    if (setting.kind == IntervalSetting::Kind::Accepted) {
        theHEARTBEAT_INTERVAL = setting.value;
    } else if (setting.kind == IntervalSetting::Kind::BelowMinimum) {
        syslog(LOG_WARNING, "heartbeat_interval (%d) is below minimum value (%d), using the default.",
               setting.value, kMinimumInterval);
    }
}

}  // namespace Heartbeat
