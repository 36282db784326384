// A test fixture for end-to-end tests that run in both brokers: orv-cimhost
// (started per test suite) and the stock sfcb that the CTest fixture "sfcb"
// started (label sfcb), both serving the project's provider library on the
// same simulated host. After every test sfcb must still be up, with no
// SIGSEGV in its logs.
//
//   class MyTest : public TwoBrokerTest {};
//   TEST_F(MyTest, Something) {
//       expectSameAnswer("ei", "Orvane_EthernetPort");           // both brokers, compared
//       std::string text = wbemcli(sfcbPort(), "ei", "...");      // one broker
//   }
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "host_process.hpp"
#include "orv/repository/class_repository.hpp"
#include "sfcb_broker.hpp"

namespace orv::e2e {

// wbemcli `command` (operation and options) on `object` (after "<ns>:") at
// the broker on `port`; its output with "localhost:<port>" as "localhost:PORT".
std::string wbemcli(int port, const std::string& command, const std::string& object,
                    const std::string& nameSpace = "root/cimv2");

// orv-cimhost serving the project's library as the shared sfcb does: the
// shipped simulated host, the test alternate boot bank and this machine's
// host name (sfcb names it in the paths of association answers); `extraArgs`
// follow (more providers, --preload).
std::unique_ptr<HostProcess> startOrvCimhost(const std::string& fixture = "",
                                             const std::vector<std::string>& extraArgs = {});

// True when a test must stop because `sfcb` is unavailable: it then skips
// (GTEST_SKIP with sfcb.reason()) outside CI; with CI=true this also fails it.
//   if (sfcbMissing(broker)) GTEST_SKIP() << broker.reason();
bool sfcbMissing(const SfcbBroker& sfcb);

class TwoBrokerTest : public ::testing::Test {
protected:
    static void SetUpTestSuite();
    static void TearDownTestSuite();
    // Skips the test when sfcb is unavailable outside CI (CI makes the fixture fail instead).
    void SetUp() override;
    // Fails the test when sfcb went down or reports a SIGSEGV.
    void TearDown() override;

    static int orvPort() { return orv_->port(); }
    static int sfcbPort() { return sfcb_->port(); }
    static SfcbBroker& sfcb() { return *sfcb_; }
    // The classes orv-cimhost serves (for the MOF defaults sfcb fills in).
    static const orv::repository::ClassRepository& classes() { return *classes_; }

    // Runs the wbemcli operation in "-nl" form on both brokers and expects the
    // same answer after normalising the documented broker conventions; the
    // hypervisor's LastStartTime, which follows the clock, is masked in both.
    static void expectSameAnswer(const std::string& command, const std::string& object);

private:
    static std::unique_ptr<HostProcess> orv_;
    static std::unique_ptr<SfcbBroker> sfcb_;
    static std::unique_ptr<orv::repository::ClassRepository> classes_;
};

}  // namespace orv::e2e
