// Reading the heartbeat interval from the broker's configuration file: the
// first line mentioning the key decides, the value is the first digit run on
// it, values below 30 are refused with a warning, and a missing file is an
// error that keeps the interval.
#include <syslog.h>

#include <climits>
#include <sstream>

#include "Heartbeat-Config.h"
#include "HeartbeatFixture.h"

namespace heartbeat {
namespace {

using orv::testsupport::SyslogLine;

class ConfigTest : public ::testing::Test {
protected:
    ConfigTest() { Heartbeat::theHEARTBEAT_INTERVAL = 300; }

    // Loads `content` as the configuration file and answers the interval.
    std::int32_t load(const std::string& content) {
        root_.writeConfig(content);
        Heartbeat::LoadHeartBeatConfig();
        return Heartbeat::theHEARTBEAT_INTERVAL;
    }

    ConfigRoot root_;
    orv::testsupport::SyslogCapture syslog_;
};

TEST_F(ConfigTest, DefaultIntervalIsFiveMinutes) { EXPECT_EQ(Heartbeat::theHEARTBEAT_INTERVAL, 300); }

TEST_F(ConfigTest, ValueAfterAnEqualsSignSetsTheInterval) {
    EXPECT_EQ(load("heartbeatInterval=60\n"), 60);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, ValueAfterAColonWithBlanksAndACommentSetsTheInterval) {
    EXPECT_EQ(load("provider: x\nheartbeatInterval: 45     # seconds between heartbeats\n"), 45);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, CommentedKeyLineEndsTheReadingAndKeepsTheDefault) {
    EXPECT_EQ(load("#heartbeatInterval: 60\nheartbeatInterval: 60\n"), 300);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, ValueBelowTheMinimumIsRefusedWithAWarning) {
    EXPECT_EQ(load("heartbeatInterval: 29\n"), 300);
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{belowMinimumLine(29)});
}

TEST_F(ConfigTest, MinimumValueIsAccepted) {
    EXPECT_EQ(load("heartbeatInterval: 30\n"), 30);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, DigitsFollowedByAUnitAreReadUpToTheUnit) {
    EXPECT_EQ(load("heartbeatInterval: 1h\n"), 300);
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{belowMinimumLine(1)});
}

TEST_F(ConfigTest, ValueWithoutDigitsChangesNothingAndLogsNothing) {
    EXPECT_EQ(load("heartbeatInterval: abc\nheartbeatInterval: 60\n"), 300);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, MissingFileLogsAnErrorWithTheCurrentInterval) {
    Heartbeat::LoadHeartBeatConfig();
    EXPECT_EQ(Heartbeat::theHEARTBEAT_INTERVAL, 300);
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{openFailureLine(root_.configPath(), 300)});
}

TEST_F(ConfigTest, MissingFileMessageNamesTheIntervalInForce) {
    Heartbeat::theHEARTBEAT_INTERVAL = 45;
    Heartbeat::LoadHeartBeatConfig();
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{openFailureLine(root_.configPath(), 45)});
}

TEST_F(ConfigTest, FileWithoutTheKeyKeepsTheIntervalSilently) {
    EXPECT_EQ(load("httpPort: 5988\nkeepaliveTimeout: 15\n"), 300);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, ValueAtTheStartOfTheLineIsNotTaken) {
    EXPECT_EQ(load("60 heartbeatInterval\n"), 300);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(ConfigTest, KeyIsFoundAnywhereInTheLineAndCaseMatters) {
    EXPECT_EQ(load("HeartbeatInterval: 90\nmy heartbeatIntervals are 75 seconds\n"), 75);
}

TEST_F(ConfigTest, HashAfterTheDigitsIsIgnored) { EXPECT_EQ(load("heartbeatInterval: 120#60\n"), 120); }

TEST_F(ConfigTest, LastLineWithoutALineEndIsRead) { EXPECT_EQ(load("heartbeatInterval: 31"), 31); }

TEST_F(ConfigTest, CarriageReturnEndsTheDigitRun) { EXPECT_EQ(load("heartbeatInterval: 50\r\n"), 50); }

TEST_F(ConfigTest, DigitRunTooLongForAnIntIsLoggedAsMinusOne) {
    EXPECT_EQ(load("heartbeatInterval: 99999999999\n"), 300);
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{belowMinimumLine(-1)});
}

TEST_F(ConfigTest, LeadingZerosAreDecimal) { EXPECT_EQ(load("heartbeatInterval: 0090\n"), 90); }

TEST(IntervalLineScan, FindsTheFirstDigitRunUnlessAHashComesFirst) {
    const auto run = Heartbeat::scanIntervalLine("heartbeatInterval: 45 # 99");
    EXPECT_EQ(run.start, 19u);
    EXPECT_EQ(run.length, 2u);
    EXPECT_EQ(Heartbeat::scanIntervalLine("heartbeatInterval # 45").length, 0u);
    EXPECT_EQ(Heartbeat::scanIntervalLine("heartbeatInterval").length, 0u);
    const auto atStart = Heartbeat::scanIntervalLine("7heartbeatInterval");
    EXPECT_EQ(atStart.start, 0u);
    EXPECT_EQ(atStart.length, 1u);
}

TEST(IntervalSettingRead, ReportsWhatTheFirstKeyLineSays) {
    std::istringstream below("heartbeatInterval: 5\n");
    const auto setting = Heartbeat::readIntervalSetting(below);
    EXPECT_EQ(setting.kind, Heartbeat::IntervalSetting::Kind::BelowMinimum);
    EXPECT_EQ(setting.value, 5);
    std::istringstream none("other: 5\n");
    EXPECT_EQ(Heartbeat::readIntervalSetting(none).kind, Heartbeat::IntervalSetting::Kind::None);
    std::istringstream largest("heartbeatInterval: " + std::to_string(INT_MAX) + "\n");
    const auto accepted = Heartbeat::readIntervalSetting(largest);
    EXPECT_EQ(accepted.kind, Heartbeat::IntervalSetting::Kind::Accepted);
    EXPECT_EQ(accepted.value, INT_MAX);
}

}  // namespace
}  // namespace heartbeat
