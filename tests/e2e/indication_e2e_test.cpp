// Indications end to end with real processes: orv-cimhost serving the raw test
// provider, subscriptions made with wbemcli (through scripts/orv-subscribe, which
// runs wbemcli ci), and orv-cimlistener receiving what the host exports.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <filesystem>

#include "golden_file.hpp"
#include "host_process.hpp"
#include "listener_process.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;
using listener::test::ListenerProcess;
using ::testing::ElementsAre;
using ::testing::HasSubstr;

class IndicationE2eTest : public ::testing::Test {
protected:
    void SetUp() override {
        base_ = fs::temp_directory_path() /
                ("i13a-e2e-" + std::to_string(getpid()) + "-" +
                 ::testing::UnitTest::GetInstance()->current_test_info()->name());
        fs::remove_all(base_);
        fs::create_directories(base_);
        listener_ = std::make_unique<ListenerProcess>(std::vector<std::string>{"--port", "0"});
        listenerPort_ = listener_->waitListening();
        ASSERT_GT(listenerPort_, 0) << listener_->errorText();
    }

    void TearDown() override {
        host_.reset();
        listener_.reset();
        fs::remove_all(base_);
    }

    void startHost(std::vector<std::string> extra = {}) {
        std::vector<std::string> args = rawProviderArgs();
        args.insert(args.end(), {"--state-dir", (base_ / "state").string()});
        args.insert(args.end(), extra.begin(), extra.end());
        host_ = std::make_unique<HostProcess>(args);
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }

    std::string hostUrl() const { return "http://localhost:" + std::to_string(host_->port()); }
    std::string listenerUrl() const { return "http://127.0.0.1:" + std::to_string(listenerPort_); }

    std::string subscribe(const std::string& name, const std::string& query) {
        return runCommand("timeout 30 " + sourceDir() + "/scripts/orv-subscribe --host " + hostUrl() + " --name " +
                          name + " --query \"" + query + "\" " + listenerUrl());
    }

    // The raw provider delivers Count indications with Sequence, Sequence + 1, ...
    void raise(const std::string& message, int sequence, int count, const std::string& cls = "Raw_Indication") {
        const std::string out =
            runCommand("timeout 30 wbemcli cm '" + hostUrl() + "/root/cimv2:Raw_Element.Name=\"e1\"' 'Raise.Message=" +
                       message + ",Sequence=" + std::to_string(sequence) + ",Count=" + std::to_string(count) +
                       ",IndicationClass=" + cls + "'");
        ASSERT_THAT(out, HasSubstr("Raise: " + std::to_string(count))) << out;
    }

    std::string interop(const std::string& operation, const std::string& path) {
        return runCommand("timeout 30 wbemcli " + operation + " '" + hostUrl() + "/root/interop:" + path + "'");
    }

    fs::path base_;
    std::unique_ptr<ListenerProcess> listener_;
    int listenerPort_ = -1;
    std::unique_ptr<HostProcess> host_;
};

TEST_F(IndicationE2eTest, WbemcliSubscriptionDeliversExactlyTheMatchingIndicationsUntilItIsDeleted) {
    startHost();
    const std::string made = subscribe("seq", "SELECT * FROM Raw_Indication WHERE Sequence > 2 AND NOT Message = 'skip'");
    ASSERT_THAT(made, HasSubstr("CIM_IndicationSubscription.Filter=")) << made;
    raise("hello", 1, 4);
    raise("skip", 10, 1);
    raise("sub", 7, 1, "Raw_SubIndication");
    EXPECT_THAT(listener_->waitLines(3), ElementsAre("Raw_Indication Message=\"hello\" Sequence=3",
                                                     "Raw_Indication Message=\"hello\" Sequence=4",
                                                     "Raw_SubIndication Message=\"sub\" Sequence=7"));
    EXPECT_THAT(interop("ein", "CIM_IndicationSubscription"), HasSubstr("Name=\"seq\""));

    // Deleted with wbemcli di; a second subscription to the same listener then shows,
    // by the order of one destination's queue, that nothing more came for the first.
    const std::string gone = runCommand("timeout 30 " + sourceDir() + "/scripts/orv-subscribe --host " + hostUrl() +
                                        " --name seq --delete");
    ASSERT_EQ(interop("ein", "CIM_IndicationSubscription").find("seq"), std::string::npos) << gone;
    ASSERT_THAT(subscribe("marker", "SELECT Message FROM Raw_SubIndication"), HasSubstr("CIM_IndicationSubscription"));
    raise("late", 20, 1);
    raise("marker", 21, 1, "Raw_SubIndication");
    EXPECT_THAT(listener_->waitLines(4).back(), "Raw_SubIndication Message=\"marker\"");
    EXPECT_EQ(host_->stop(SIGTERM), 0);
    EXPECT_THAT(host_->output(), HasSubstr("indications of subscription marker -> marker: 1 matched, 1 delivered, "
                                           "0 retried, 0 dropped"));
}

TEST_F(IndicationE2eTest, HostRestartKeepsTheSubscriptionAndDeliveryResumes) {
    startHost();
    ASSERT_THAT(subscribe("kept", "SELECT Sequence FROM Raw_Indication"), HasSubstr("CIM_IndicationSubscription"));
    raise("before", 1, 1);
    EXPECT_THAT(listener_->waitLines(1), ElementsAre("Raw_Indication Sequence=1"));
    ASSERT_EQ(host_->stop(SIGTERM), 0);
    EXPECT_THAT(host_->output(), HasSubstr("indications of subscription kept -> kept: 1 matched, 1 delivered"));
    startHost();
    EXPECT_THAT(host_->output(), HasSubstr("subscription kept -> kept restored"));
    raise("after", 2, 1);
    EXPECT_THAT(listener_->waitLines(2), ElementsAre("Raw_Indication Sequence=1", "Raw_Indication Sequence=2"));
}

TEST_F(IndicationE2eTest, BrokerChecksAnswerWbemcliWithTheirCodes) {
    startHost();
    const std::string keys = "SystemCreationClassName=\"CIM_ComputerSystem\",SystemName=\"x\",CreationClassName=";
    const std::string bad = runCommand("timeout 30 wbemcli ci '" + hostUrl() + "/root/interop:CIM_IndicationFilter." +
                                       keys + "\"CIM_IndicationFilter\",Name=\"f\"' 'Name=\"f\",Query=\"SELECT * FROM Raw_Element\"'");
    EXPECT_THAT(bad, HasSubstr("CIM_ERR_INVALID_QUERY: class Raw_Element is not an indication class"));
    ASSERT_THAT(subscribe("dup", "SELECT * FROM Raw_Indication"), HasSubstr("CIM_IndicationSubscription"));
    EXPECT_THAT(subscribe("dup", "SELECT * FROM Raw_Indication"), HasSubstr("CIM_ERR_ALREADY_EXISTS"));
    EXPECT_THAT(interop("di", "CIM_IndicationFilter.Name=\"dup\""), HasSubstr("CIM_ERR_FAILED: Filter in use"));
    EXPECT_THAT(interop("ein", "CIM_Namespace"), HasSubstr("Name=\"root/interop\""));
    EXPECT_THAT(interop("ein", "CIM_RegisteredProfile"), HasSubstr("InstanceID=\"DMTF+Indications+1.1.0\""));
}

TEST_F(IndicationE2eTest, PreloadCreatesEveryProviderBeforeTheFirstRequest) {
    const fs::path log = base_ / "provider.log";
    setenv("RAW_PROVIDER_LOG", log.c_str(), 1);
    startHost({"--preload"});
    unsetenv("RAW_PROVIDER_LOG");
    const std::string text = readFile(log.string());
    EXPECT_THAT(text, HasSubstr("factory RawElementProvider Instance"));
    EXPECT_THAT(text, HasSubstr("factory RawIndicationProvider Indication"));
    EXPECT_THAT(text, HasSubstr("factory RawAssocProvider Association"));
}

}  // namespace
}  // namespace orv::e2e
