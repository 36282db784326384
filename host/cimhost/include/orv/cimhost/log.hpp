// Diagnostics of the host on standard error, one line each, filtered by level.
#pragma once

#include <string_view>

#include "orv/cimhost/host_config.hpp"

namespace orv::cimhost {

void setLogLevel(LogLevel level) noexcept;
bool logEnabled(LogLevel level) noexcept;
// "orv-cimhost: <level>: <message>" when the level is enabled.
void logLine(LogLevel level, std::string_view message);

}  // namespace orv::cimhost
