#include "two_broker_fixture.hpp"

#include <signal.h>
#include <unistd.h>

#include <cstdlib>
#include <regex>

#include "broker_answers.hpp"

namespace orv::e2e {

std::unique_ptr<HostProcess> TwoBrokerTest::orv_;
std::unique_ptr<SfcbBroker> TwoBrokerTest::sfcb_;
std::unique_ptr<orv::repository::ClassRepository> TwoBrokerTest::classes_;

std::string wbemcli(int port, const std::string& command, const std::string& object, const std::string& nameSpace) {
    const std::string where = "localhost:" + std::to_string(port);
    const std::string output =
        runCommand("timeout 30 wbemcli " + command + " 'http://" + where + "/" + nameSpace + ":" + object + "'");
    return std::regex_replace(output, std::regex(where), "localhost:PORT");
}

std::unique_ptr<HostProcess> startOrvCimhost(const std::string& fixture, const std::vector<std::string>& extraArgs) {
    char host[256] = {};
    gethostname(host, sizeof host - 1);
    setenv("ORV_ROOT", (sourceDir() + "/tests/e2e/data/root").c_str(), 1);
    std::vector<std::string> args{
        "--provider-dir", buildDir() + "/lib", "--registration", sourceDir() + "/cim/mof/orvprovider.reg", "--mof",
        sourceDir() + "/cim/mof/orvprovider.mof", "--platform", "sim", "--fixture",
        fixture.empty() ? sourceDir() + "/platform/sim/examples/host.json" : fixture, "--host-name", host};
    args.insert(args.end(), extraArgs.begin(), extraArgs.end());
    auto process = std::make_unique<HostProcess>(args);
    unsetenv("ORV_ROOT");
    return process;
}

bool sfcbMissing(const SfcbBroker& sfcb) {
    if (sfcb.available()) {
        return false;
    }
    const char* ci = std::getenv("CI");
    if (ci != nullptr && std::string(ci) == "true") {
        ADD_FAILURE() << "sfcb is unavailable: " << sfcb.reason();
    }
    return true;
}

void TwoBrokerTest::SetUpTestSuite() {
    sfcb_ = std::make_unique<SfcbBroker>(SfcbBroker::shared());
    classes_ = std::make_unique<orv::repository::ClassRepository>();
    classes_->loadFile(sourceDir() + "/cim/mof/orvprovider.mof");
    orv_ = startOrvCimhost();
    ASSERT_TRUE(orv_->waitReady()) << orv_->output();
}

void TwoBrokerTest::TearDownTestSuite() {
    if (orv_ != nullptr) {
        EXPECT_EQ(orv_->stop(SIGTERM), 0) << orv_->output();
    }
    orv_.reset();
    sfcb_.reset();
    classes_.reset();
}

void TwoBrokerTest::SetUp() {
    ASSERT_NE(orv_, nullptr);
    if (sfcbMissing(*sfcb_)) {
        GTEST_SKIP() << "sfcb is unavailable: " << sfcb_->reason();
    }
    const std::string problem = sfcb_->healthProblem();
    ASSERT_EQ(problem, "") << "sfcb was not healthy before the test";
}

void TwoBrokerTest::TearDown() {
    if (sfcb_ != nullptr && sfcb_->available()) {
        EXPECT_EQ(sfcb_->healthProblem(), "");
    }
}

void TwoBrokerTest::expectSameAnswer(const std::string& command, const std::string& object) {
    // The one value that follows the clock: the hypervisor's last start time,
    // computed from the uptime at each request.
    static const std::regex kLastStartTime("LastStartTime=[0-9]{14}\\.000000\\+000");
    auto masked = [](const std::string& text) { return std::regex_replace(text, kLastStartTime, "LastStartTime=BOOT-TIME"); };
    const std::string orvAnswer = masked(wbemcli(orvPort(), command + " -nl", object));
    const std::string sfcbAnswer = masked(wbemcli(sfcbPort(), command + " -nl", object));
    EXPECT_EQ(compareAnswers(orvAnswer, sfcbAnswer, classes()), "") << "wbemcli " << command << " " << object;
}

}  // namespace orv::e2e
