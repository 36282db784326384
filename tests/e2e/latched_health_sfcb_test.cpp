// The latched health family end to end under the stock sfcb: a private sfcbd
// serving the project's library and the companion library (each
// library in a provider process of its own) on a simulated host whose fixture
// the test rewrites. sfcb loads the latched health provider, and so starts its
// monitor threads, with the first request for one of its classes. Label slow:
// the latching waits three real 120 s monitor periods, the IP change up to one
// 30 s check.
#include <gtest/gtest.h>

#include "watched_classes_staging.hpp"
#include "health_fixture.hpp"
#include "ip_change_lines.hpp"
#include "latched_health_scenario.hpp"
#include "listener_process.hpp"
#include "sfcb_broker.hpp"
#include "sfcb_subscription.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

using listener::test::ListenerProcess;

SfcbBroker startSfcb(const HealthFixture& fixture) {
    return SfcbBroker::start(fixture.folder() + "/sfcb", fixture.path(), "", watchedClassesStaging());
}

TEST(LatchedHealthSfcbTest, SfcbLatchesEscalatesAndKeepsTheWorstStateOfEveryWatchedClassOverFourPasses) {
    HealthFixture fixture("sfcb-latched");
    fixture.write(5, 10);
    SfcbBroker sfcb = startSfcb(fixture);
    if (sfcbMissing(sfcb)) {
        GTEST_SKIP() << sfcb.reason();
    }

    expectLatchingOverFourPasses(fixture, sfcb.port(), [&] { return "\n" + sfcb.syslog(); });

    EXPECT_EQ(sfcb.healthProblem(), "");
    EXPECT_EQ(sfcb.stop(), 0);
}

TEST(KernelIpChangeSfcbTest, SfcbDeliversTheIndicationWhenTheFixtureReplacesAnInterfaceAddress) {
    HealthFixture fixture("sfcb-ipchange");
    fixture.write(5, 5);
    SfcbBroker sfcb = startSfcb(fixture);
    if (sfcbMissing(sfcb)) {
        GTEST_SKIP() << sfcb.reason();
    }
    ListenerProcess listener({"--port", "0"});
    ASSERT_EQ(subscribeLocalListenerOnSfcb(sfcb.port(), listener.waitListening(), "ipchange",
                                           "SELECT * FROM Orvane_KernelIPChangedIndication", fixture.folder()),
              "")
        << listener.errorText();
    fixture.write(5, 5, "10.0.0.11");

    const std::vector<std::string> lines = waitForIpChange(listener);
    ASSERT_EQ(lines.size(), 1U) << listener.outputText() << sfcb.syslog();
    expectVif0Replaced(lines[0], "10.0.0.10", "10.0.0.11");
    EXPECT_EQ(sfcb.healthProblem(), "");
    EXPECT_EQ(sfcb.stop(), 0);
}

}  // namespace
}  // namespace orv::e2e
