// The latched health family end to end under orv-cimhost --preload: the
// project's library and the companion library on a simulated host
// whose fixture the test rewrites. Label slow: the latching waits three real
// 120 s monitor periods, the IP change up to one 30 s check.
#include <gtest/gtest.h>
#include <signal.h>

#include "health_fixture.hpp"
#include "ip_change_lines.hpp"
#include "latched_health_scenario.hpp"
#include "listener_process.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

using listener::test::ListenerProcess;

// With --preload the latched health provider, and with it both monitor threads,
// starts with the host: the first pass runs before the first request.
std::unique_ptr<HostProcess> startHost(const HealthFixture& fixture) {
    return startOrvCimhost(fixture.path(), {"--preload", "--state-dir", fixture.folder() + "/state"});
}

TEST(LatchedHealthE2eTest, OrvCimhostLatchesEscalatesAndKeepsTheWorstStateOfEveryWatchedClassOverFourPasses) {
    HealthFixture fixture("latched");
    fixture.write(5, 10);
    std::unique_ptr<HostProcess> host = startHost(fixture);
    ASSERT_TRUE(host->waitReady()) << host->output();

    expectLatchingOverFourPasses(fixture, host->port(), [&] { return host->output(); });

    EXPECT_EQ(host->stop(SIGTERM), 0) << host->output();
}

TEST(KernelIpChangeE2eTest, OrvCimhostSendsTheIndicationWhenTheFixtureReplacesAnInterfaceAddress) {
    HealthFixture fixture("ipchange");
    fixture.write(5, 5);
    ListenerProcess listener({"--port", "0"});
    const int listenerPort = listener.waitListening();
    ASSERT_GT(listenerPort, 0) << listener.errorText();
    std::unique_ptr<HostProcess> host = startHost(fixture);
    ASSERT_TRUE(host->waitReady()) << host->output();

    const std::string made = runCommand(
        "timeout 30 " + sourceDir() + "/scripts/orv-subscribe --host http://localhost:" +
        std::to_string(host->port()) + " --name ipchange --query \"SELECT * FROM Orvane_KernelIPChangedIndication\" " +
        "http://127.0.0.1:" + std::to_string(listenerPort));
    ASSERT_NE(made.find("CIM_IndicationSubscription.Filter="), std::string::npos) << made;
    fixture.write(5, 5, "10.0.0.11");

    const std::vector<std::string> lines = waitForIpChange(listener);
    ASSERT_EQ(lines.size(), 1U) << listener.outputText() << host->output();
    expectVif0Replaced(lines[0], "10.0.0.10", "10.0.0.11");
    EXPECT_EQ(host->stop(SIGTERM), 0) << host->output();
}

}  // namespace
}  // namespace orv::e2e
