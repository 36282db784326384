// The heartbeat provider end to end under orv-cimhost: the project's library on
// the simulated host, the interval (30 s, the minimum) read from
// $ORV_ROOT/etc/sfcb/sfcb.cfg, a subscription made with wbemcli (through
// scripts/orv-subscribe) and orv-cimlistener receiving the heartbeats. Label
// slow: it waits one real interval.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>

#include "heartbeat_lines.hpp"
#include "host_process.hpp"
#include "listener_process.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;
using listener::test::ListenerProcess;
using ::testing::HasSubstr;

constexpr std::chrono::seconds kInterval{30};

TEST(HeartbeatE2eTest, OrvCimhostSendsIncreasingStampsOneIntervalApartAndSigtermJoinsTheThreadAtOnce) {
    const fs::path base = fs::temp_directory_path() / ("i14e-heartbeat-" + std::to_string(getpid()));
    fs::remove_all(base);
    fs::create_directories(base / "root/etc/sfcb");
    std::ofstream(base / "root/etc/sfcb/sfcb.cfg") << "heartbeatInterval: 30\n";

    ListenerProcess listener({"--port", "0"});
    const int listenerPort = listener.waitListening();
    ASSERT_GT(listenerPort, 0) << listener.errorText();

    setenv("ORV_ROOT", (base / "root").c_str(), 1);
    HostProcess host({"--provider-dir", buildDir() + "/lib", "--registration", sourceDir() + "/cim/mof/orvprovider.reg",
                      "--mof", sourceDir() + "/cim/mof/orvprovider.mof", "--platform", "sim", "--fixture",
                      sourceDir() + "/platform/sim/examples/host.json", "--state-dir", (base / "state").string()});
    unsetenv("ORV_ROOT");
    ASSERT_TRUE(host.waitReady()) << host.output();

    const std::string made =
        runCommand("timeout 30 " + sourceDir() + "/scripts/orv-subscribe --host http://localhost:" +
                   std::to_string(host.port()) + " --name heartbeat --query \"SELECT * FROM Orvane_CIMHeartbeat\" " +
                   "http://127.0.0.1:" + std::to_string(listenerPort));
    ASSERT_THAT(made, HasSubstr("CIM_IndicationSubscription.Filter=")) << made;
    const std::time_t subscribed = std::time(nullptr);

    const std::vector<std::string> lines = listener.waitLines(2, kInterval + std::chrono::seconds(15));
    ASSERT_GE(lines.size(), 2U) << listener.outputText() << host.output();
    expectFirstTwoHeartbeats(lines, subscribed);

    // The thread waits for the next interval now; SIGTERM's terminating cleanup
    // wakes and joins it, so the host exits long before the interval ends.
    const auto signalled = std::chrono::steady_clock::now();
    const int status = host.stop(SIGTERM);
    const auto took = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - signalled);
    std::cout << "SIGTERM to exit with the heartbeat thread running: " << took.count() << " ms" << std::endl;
    EXPECT_EQ(status, 0) << host.output();
    EXPECT_LT(took, std::chrono::seconds(1)) << host.output();
    fs::remove_all(base);
}

}  // namespace
}  // namespace orv::e2e
