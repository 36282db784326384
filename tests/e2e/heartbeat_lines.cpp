#include "heartbeat_lines.hpp"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>

#include <regex>

namespace orv::e2e {

std::optional<HeartbeatLine> parseHeartbeatLine(const std::string& line) {
    static const std::regex kStamp(R"((?:^| )stamp=([0-9]+)(?: |$))");
    static const std::regex kHost(R"((?:^| )hostname="([^"]*)\")");
    static const std::regex kTime(R"((?:^| )IndicationTime="([^"]*)\")");
    std::smatch stamp;
    std::smatch host;
    std::smatch when;
    if (line.rfind("Orvane_CIMHeartbeat ", 0) != 0 || !std::regex_search(line, stamp, kStamp) ||
        !std::regex_search(line, host, kHost) || !std::regex_search(line, when, kTime)) {
        return std::nullopt;
    }
    return HeartbeatLine{std::stol(stamp[1]), host[1], when[1]};
}

std::optional<std::time_t> wholeSecondTimestamp(const std::string& datetime) {
    static const std::regex kTimestamp(R"(([0-9]{4})([0-9]{2})([0-9]{2})([0-9]{2})([0-9]{2})([0-9]{2})\.000000([+-])([0-9]{3}))");
    std::smatch m;
    if (!std::regex_match(datetime, m, kTimestamp)) {
        return std::nullopt;
    }
    std::tm fields{};
    fields.tm_year = std::stoi(m[1]) - 1900;
    fields.tm_mon = std::stoi(m[2]) - 1;
    fields.tm_mday = std::stoi(m[3]);
    fields.tm_hour = std::stoi(m[4]);
    fields.tm_min = std::stoi(m[5]);
    fields.tm_sec = std::stoi(m[6]);
    // The offset is the local time's minutes east of UTC.
    const long offsetMinutes = std::stol(m[8]) * (m[7] == "-" ? -1 : 1);
    return timegm(&fields) - offsetMinutes * 60;
}

std::string machineHostName() {
    char name[256] = {};
    gethostname(name, sizeof name - 1);
    return name;
}

void expectFirstTwoHeartbeats(const std::vector<std::string>& lines, std::time_t subscribed) {
    constexpr long kIntervalSeconds = 30;
    ASSERT_GE(lines.size(), 2U);
    const auto first = parseHeartbeatLine(lines[0]);
    const auto second = parseHeartbeatLine(lines[1]);
    ASSERT_TRUE(first.has_value()) << lines[0];
    ASSERT_TRUE(second.has_value()) << lines[1];
    EXPECT_EQ(first->stamp, 0);
    EXPECT_EQ(second->stamp, 1);
    EXPECT_EQ(first->hostname, machineHostName());
    EXPECT_EQ(second->hostname, machineHostName());
    const auto firstTime = wholeSecondTimestamp(first->indicationTime);
    const auto secondTime = wholeSecondTimestamp(second->indicationTime);
    ASSERT_TRUE(firstTime.has_value()) << first->indicationTime;
    ASSERT_TRUE(secondTime.has_value()) << second->indicationTime;
    // The first comes at once when the filter is activated.
    EXPECT_LE(std::labs(*firstTime - subscribed), 5) << first->indicationTime;
    EXPECT_LE(std::labs(*secondTime - *firstTime - kIntervalSeconds), 2)
        << first->indicationTime << " " << second->indicationTime;
}

}  // namespace orv::e2e
