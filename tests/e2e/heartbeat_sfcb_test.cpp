// The heartbeat provider under the stock sfcb: a private sfcbd serving the
// project's library with ORV_ROOT in its environment (sfcb refuses the
// heartbeatInterval key in its own sfcb.cfg, so the provider's file lives under
// ORV_ROOT), a subscription made as sfcb_subscription.hpp says, and
// orv-cimlistener receiving the heartbeats. Label slow: it waits one 30 s interval.
#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>

#include "heartbeat_lines.hpp"
#include "host_process.hpp"
#include "listener_process.hpp"
#include "sfcb_broker.hpp"
#include "sfcb_subscription.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;
using listener::test::ListenerProcess;

TEST(HeartbeatSfcbTest, SfcbDeliversIncreasingStampsOneIntervalApartAndStaysUp) {
    const fs::path base = fs::temp_directory_path() / ("i14e-heartbeat-sfcb-" + std::to_string(getpid()));
    fs::remove_all(base);
    fs::create_directories(base / "root/etc/sfcb");
    std::ofstream(base / "root/etc/sfcb/sfcb.cfg") << "heartbeatInterval: 30\n";
    SfcbBroker sfcb = SfcbBroker::start((base / "sfcb").string(), "", (base / "root").string());
    if (sfcbMissing(sfcb)) {
        GTEST_SKIP() << sfcb.reason();
    }
    ListenerProcess listener({"--port", "0"});
    ASSERT_EQ(subscribeLocalListenerOnSfcb(sfcb.port(), listener.waitListening(), "heartbeat",
                                           "SELECT * FROM Orvane_CIMHeartbeat", base.string()),
              "")
        << listener.errorText();
    const std::time_t subscribed = std::time(nullptr);

    const std::vector<std::string> lines = listener.waitLines(2, std::chrono::seconds(45));
    ASSERT_GE(lines.size(), 2U) << listener.outputText() << sfcb.syslog();
    expectFirstTwoHeartbeats(lines, subscribed);
    EXPECT_EQ(sfcb.healthProblem(), "");
    sfcb.stop();
    fs::remove_all(base);
}

}  // namespace
}  // namespace orv::e2e
