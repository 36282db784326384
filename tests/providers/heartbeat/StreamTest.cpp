// The heartbeat stream over one interval (30 s, the shortest a configuration
// may set): these tests wait that long and carry the ctest label "slow".
#include <syslog.h>

#include <thread>

#include "DirectProvider.h"
#include "HeartbeatFixture.h"

namespace heartbeat {
namespace {

using namespace std::chrono_literals;
using orv::testsupport::SyslogLine;

constexpr auto kIntervalAndMargin = 45s;
constexpr std::uint64_t kIntervalMicroseconds = 30 * kMicrosecondsPerSecond;

class HeartbeatStreamTest : public HeartbeatTest {
protected:
    HeartbeatStreamTest() { root_.writeConfig("heartbeatInterval: 30\n"); }
};

TEST_F(HeartbeatStreamTest, SecondHeartbeatFollowsOneIntervalLaterWithStampOne) {
    start();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    // Subscriptions coming and going in between change nothing.
    ASSERT_EQ(core().activateFilter("root/cimv2", kQuery).rc(), CMPI_RC_OK);
    ASSERT_EQ(core().deactivateFilter("root/cimv2", kQuery).rc(), CMPI_RC_OK);
    ASSERT_EQ(core().deactivateFilter("root/cimv2", kQuery).rc(), CMPI_RC_OK);
    ASSERT_TRUE(heartbeats_.waitFor(2, kIntervalAndMargin));
    const std::vector<ReceivedHeartbeat> seen = heartbeats_.all();
    EXPECT_EQ(seen[0].stamp, 0u);
    EXPECT_EQ(seen[1].stamp, 1u);
    EXPECT_EQ(seen[1].hostname, hostName());
    EXPECT_FALSE(seen[1].indicationTimeIsInterval);
    EXPECT_GE(seen[1].indicationTime - seen[0].indicationTime, kIntervalMicroseconds);
    EXPECT_GE(seen[1].received - seen[0].received, 29s);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(HeartbeatStreamTest, FailedDeliveryKeepsTheStreamAndSkipsNoStamp) {
    DirectProvider direct(core().broker(), heartbeats_, {0});
    ASSERT_NE(direct.create(), nullptr);
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    ASSERT_TRUE(heartbeats_.waitFor(2, kIntervalAndMargin));
    const std::vector<ReceivedHeartbeat> seen = heartbeats_.all();
    EXPECT_EQ(seen[0].stamp, 0u);
    EXPECT_EQ(seen[1].stamp, 1u);
    EXPECT_EQ(syslog_.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed to deliver indication\n"}}));
    EXPECT_EQ(direct.cleanup(true).rc, CMPI_RC_OK);
}

}  // namespace
}  // namespace heartbeat
