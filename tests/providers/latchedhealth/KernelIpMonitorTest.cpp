// The kernel IP check: its failures, and its place behind a running health
// pass under the shared lock.
#include <syslog.h>

#include <atomic>
#include <chrono>
#include <thread>

#include <orv/testsupport/SyslogCapture.h>

#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

using KernelIpMonitorTest = LatchedHealthTest;

// The failure here is the broker's thread-memory release after the check; the
// line has no line end.
TEST_F(KernelIpMonitorTest, FailedCheckLogsOneLineAndTheNextCheckFollows) {
    start();
    SyslogCapture log;
    FailingReleaseContext context;
    runIpCheck(context.get());
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed testAndSend operation"}}));
    runIpCheck(context.get());
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed testAndSend operation"},
                                                    {LOG_ERR, "Failed testAndSend operation"}}));
    runIpCheck();
    EXPECT_EQ(log.lines().size(), 2U);
}

TEST_F(KernelIpMonitorTest, CheckWaitsForARunningHealthPass) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    const unsigned long long passesBefore = completedPasses();
    std::atomic<bool> checkDone{false};
    unsigned long long passesAfterCheck = 0;
    {
        EnumerationGate gate;
        std::thread pass([&] { runPass(); });
        gate.waitUntilEntered();
        std::thread check([&] {
            runIpCheck();
            passesAfterCheck = completedPasses();
            checkDone = true;
        });
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
        EXPECT_FALSE(checkDone);
        gate.open();
        pass.join();
        check.join();
    }
    EXPECT_EQ(passesAfterCheck, passesBefore + 1);
}

TEST_F(KernelIpMonitorTest, RequestsWaitForARunningHealthPass) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    serve({device("CIM_Sensor", "fan0", 20)});
    std::vector<Latched> seen;
    {
        EnumerationGate gate;
        std::thread pass([&] { runPass(); });
        gate.waitUntilEntered();
        std::thread reader([&] { seen = latched(); });
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
        gate.open();
        pass.join();
        reader.join();
    }
    EXPECT_EQ(seen, (std::vector<Latched>{{"1", "CIM_Sensor", "20"}}));
}

}  // namespace
}  // namespace latched
