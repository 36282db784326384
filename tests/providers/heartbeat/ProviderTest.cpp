// The heartbeat provider through the broker core: the first heartbeat goes
// out as soon as the provider starts, filter and enable calls change nothing,
// the configuration is read at start, and a terminating cleanup stops the
// thread, also while the first heartbeat is being delivered.
#include <syslog.h>

#include <ctime>
#include <thread>

#include <orv/testsupport/StderrCapture.h>

#include "DirectProvider.h"
#include "HeartbeatFixture.h"

namespace heartbeat {
namespace {

using namespace std::chrono_literals;
using orv::testsupport::SyslogLine;

// Long enough for a stray heartbeat to show up, far below the 30 s minimum.
constexpr auto kQuietPeriod = 300ms;

std::uint64_t nowSeconds() { return static_cast<std::uint64_t>(std::time(nullptr)); }

class HeartbeatProviderTest : public HeartbeatTest {
protected:
    // Starts the provider with a valid configuration.
    void startConfigured() {
        root_.writeConfig("heartbeatInterval: 30\n");
        start();
    }
};

TEST_F(HeartbeatProviderTest, FirstHeartbeatGoesOutAtOnceWithStampZero) {
    const std::uint64_t before = nowSeconds();
    startConfigured();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    const std::uint64_t after = nowSeconds();
    const ReceivedHeartbeat first = heartbeats_.all().front();
    EXPECT_EQ(first.nameSpace, "root/cimv2");
    EXPECT_EQ(first.className, kClassName);
    EXPECT_EQ(first.stamp, 0u);
    EXPECT_EQ(first.hostname, hostName());
    EXPECT_FALSE(first.indicationTimeIsInterval);
    EXPECT_EQ(first.indicationTime % kMicrosecondsPerSecond, 0u) << "whole seconds";
    EXPECT_GE(first.indicationTime / kMicrosecondsPerSecond, before);
    EXPECT_LE(first.indicationTime / kMicrosecondsPerSecond, after);
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(HeartbeatProviderTest, HeartbeatsFlowWithoutAnyEnabledIndications) {
    startConfigured();
    // The filter's activation only loaded the provider; switching indications
    // off does not stop the thread, which already delivered.
    ASSERT_EQ(core().disableIndications("root/cimv2", kClassName).rc(), CMPI_RC_OK);
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(heartbeats_.all().front().stamp, 0u);
}

TEST_F(HeartbeatProviderTest, FilterCallsNeitherStartNorStopHeartbeats) {
    startConfigured();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    const std::size_t running = threadCount();
    const char* const narrower = "SELECT * FROM Orvane_CIMHeartbeat WHERE stamp > 5";
    EXPECT_EQ(core().activateFilter("root/cimv2", narrower).rc(), CMPI_RC_OK);
    EXPECT_EQ(core().enableIndications("root/cimv2", kClassName).rc(), CMPI_RC_OK);
    EXPECT_EQ(core().deactivateFilter("root/cimv2", kQuery).rc(), CMPI_RC_OK);
    EXPECT_EQ(core().disableIndications("root/cimv2", kClassName).rc(), CMPI_RC_OK);
    EXPECT_EQ(core().deactivateFilter("root/cimv2", narrower).rc(), CMPI_RC_OK);
    std::this_thread::sleep_for(kQuietPeriod);
    EXPECT_EQ(heartbeats_.size(), 1u) << "no heartbeat restarted or added";
    EXPECT_EQ(threadCount(), running) << "the heartbeat thread still runs, no other started";
    EXPECT_TRUE(syslog_.lines().empty());
}

TEST_F(HeartbeatProviderTest, ProviderStartWithoutConfigurationLogsTheDefault) {
    start();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{openFailureLine(root_.configPath(), 300)});
}

TEST_F(HeartbeatProviderTest, ProviderStartWithTooShortIntervalWarns) {
    root_.writeConfig("heartbeatInterval: 29\n");
    start();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{belowMinimumLine(29)});
}

TEST_F(HeartbeatProviderTest, ShutdownStopsTheThreadBeforeTheLibraryIsUnloaded) {
    startConfigured();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(threadCount(), threadsBefore_ + 1);
    stop();
    EXPECT_TRUE(core().loadedLibraries().empty());
    EXPECT_TRUE(threadCountSettlesAt(threadsBefore_)) << "the heartbeat thread has ended";
    EXPECT_EQ(heartbeats_.size(), 1u);
}

TEST_F(HeartbeatProviderTest, CleanupRightAfterStartStopsTheThread) {
    startConfigured();
    stop();
    EXPECT_TRUE(threadCountSettlesAt(threadsBefore_)) << "the heartbeat thread has ended";
    EXPECT_LE(heartbeats_.size(), 1u);
}

// The first delivery blocks in the subscriber while the broker shuts down:
// cleanup waits for the delivery, then wakes the thread's wait and joins it.
TEST_F(HeartbeatProviderTest, CleanupRacingTheFirstDeliveryWaitsForItAndStopsTheThread) {
    std::mutex gate;
    std::condition_variable changed;
    bool delivering = false;
    bool released = false;
    const std::uint64_t blocker = core().addIndicationSubscriber([&](std::string_view, const CMPIInstance*) {
        std::unique_lock lock(gate);
        delivering = true;
        changed.notify_all();
        changed.wait_for(lock, kAtOnce, [&] { return released; });
    });
    startConfigured();
    {
        std::unique_lock lock(gate);
        ASSERT_TRUE(changed.wait_for(lock, kAtOnce, [&] { return delivering; }));
    }
    std::thread releaser([&] {
        std::this_thread::sleep_for(kQuietPeriod);
        std::lock_guard lock(gate);
        released = true;
        changed.notify_all();
    });
    stop();  // blocks until the delivery is done and the thread has ended
    releaser.join();
    core().removeIndicationSubscriber(blocker);
    EXPECT_EQ(heartbeats_.size(), 1u);
    EXPECT_TRUE(threadCountSettlesAt(threadsBefore_)) << "the heartbeat thread has ended";
}

TEST_F(HeartbeatProviderTest, FactoryHandsOutTheIndicationTableWithoutATraceLine) {
    root_.writeConfig("heartbeatInterval: 30\n");
    DirectProvider direct(core().broker(), heartbeats_);
    orv::testsupport::StderrCapture stderrCapture;
    CMPIIndicationMI* mi = direct.create();
    EXPECT_EQ(stderrCapture.finish(), "");
    ASSERT_NE(mi, nullptr);
    EXPECT_STREQ(mi->ft->miName, "indicationOrvane_CIMHeartbeat");
    EXPECT_EQ(mi->ft->ftVersion, 200);
    EXPECT_EQ(mi->ft->miVersion, 200);
    EXPECT_NE(mi->ft->disableIndications, nullptr);
    EXPECT_EQ(direct.create(), mi) << "the same record and provider on a second call";
    EXPECT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(direct.cleanup(true).rc, CMPI_RC_OK) << "one use of two given back";
    EXPECT_FALSE(direct.threadFinished());
    EXPECT_EQ(direct.cleanup(true).rc, CMPI_RC_OK);
    EXPECT_TRUE(direct.threadFinished());
    EXPECT_EQ(heartbeats_.size(), 1u) << "initialize ran once: one thread";
}

TEST_F(HeartbeatProviderTest, TerminatingCleanupReturnsOnlyAfterTheThreadHasEnded) {
    root_.writeConfig("heartbeatInterval: 30\n");
    DirectProvider direct(core().broker(), heartbeats_);
    ASSERT_NE(direct.create(), nullptr);
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(threadCount(), threadsBefore_ + 1);
    EXPECT_FALSE(direct.threadFinished());
    EXPECT_EQ(direct.cleanup(true).rc, CMPI_RC_OK);
    EXPECT_TRUE(direct.threadFinished()) << "cleanup returned before the thread ended";
    EXPECT_TRUE(threadCountSettlesAt(threadsBefore_)) << "the heartbeat thread has ended";
}

TEST_F(HeartbeatProviderTest, NonTerminatingCleanupAnswersNeverUnloadAndLeavesTheThreadRunning) {
    root_.writeConfig("heartbeatInterval: 30\n");
    DirectProvider direct(core().broker(), heartbeats_);
    ASSERT_NE(direct.create(), nullptr);
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    EXPECT_EQ(direct.cleanup(false).rc, CMPI_RC_NEVER_UNLOAD);
    EXPECT_EQ(threadCount(), threadsBefore_ + 1);
    EXPECT_EQ(direct.cleanup(false).rc, CMPI_RC_NEVER_UNLOAD) << "asked again, same answer";
    EXPECT_FALSE(direct.threadFinished());
    EXPECT_EQ(direct.cleanup(true).rc, CMPI_RC_OK);
    EXPECT_TRUE(direct.threadFinished());
    EXPECT_TRUE(threadCountSettlesAt(threadsBefore_)) << "the heartbeat thread has ended";
    EXPECT_EQ(heartbeats_.size(), 1u);
}

TEST_F(HeartbeatProviderTest, IdleUnloadingKeepsTheLibraryWhileTheThreadRuns) {
    startConfigured();
    ASSERT_TRUE(heartbeats_.waitFor(1, kAtOnce));
    ASSERT_EQ(core().deactivateFilter("root/cimv2", kQuery).rc(), CMPI_RC_OK);
    EXPECT_EQ(core().unloadIdleProviders(), 0u);
    EXPECT_EQ(core().loadedLibraries(), std::vector<std::string>{"orvprovider"});
    EXPECT_EQ(threadCount(), threadsBefore_ + 1);
}

}  // namespace
}  // namespace heartbeat
