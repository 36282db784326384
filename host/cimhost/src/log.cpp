#include "orv/cimhost/log.hpp"

#include <atomic>
#include <cstdio>
#include <string>

namespace orv::cimhost {

namespace {
std::atomic<LogLevel> gLevel{LogLevel::Info};
}

void setLogLevel(LogLevel level) noexcept {
    gLevel.store(level);
}

bool logEnabled(LogLevel level) noexcept {
    return static_cast<int>(level) <= static_cast<int>(gLevel.load());
}

void logLine(LogLevel level, std::string_view message) {
    if (!logEnabled(level)) {
        return;
    }
    std::string line = "orv-cimhost: ";
    line += logLevelName(level);
    line += ": ";
    line += message;
    line += '\n';
    std::fputs(line.c_str(), stderr);
}

}  // namespace orv::cimhost
