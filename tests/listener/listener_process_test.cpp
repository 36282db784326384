// orv-cimlistener as administrators and end-to-end tests run it, fed by the export client.
#include <signal.h>

#include <gtest/gtest.h>

#include "listener_process.hpp"
#include "orv/exporter/exporter.hpp"

namespace orv::listener {
namespace {

using test::ListenerProcess;

std::string alert(int number) {
    return "<INSTANCE CLASSNAME=\"CIM_AlertIndication\"><PROPERTY NAME=\"Number\" TYPE=\"uint32\"><VALUE>" +
           std::to_string(number) + "</VALUE></PROPERTY></INSTANCE>";
}

exporter::DeliveryPolicy once() {
    exporter::DeliveryPolicy policy;
    policy.retryAttempts = 0;
    return policy;
}

TEST(CimListenerCommand, PrintsTheIndicationsItReceivesAndExitsAfterCount) {
    ListenerProcess listener({"--port", "0", "--count", "3"});
    const int port = listener.waitListening();
    ASSERT_GT(port, 0) << listener.errorText();
    const std::string url = "http://127.0.0.1:" + std::to_string(port);
    exporter::Exporter exporter;
    for (int i = 1; i <= 3; ++i) {
        exporter.submit("s", url, alert(i), once());
    }
    EXPECT_EQ(listener.waitExit(), 0) << listener.errorText();
    EXPECT_EQ(listener.outputText(),
              "CIM_AlertIndication Number=1\nCIM_AlertIndication Number=2\nCIM_AlertIndication Number=3\n");
    exporter.shutdown(std::chrono::seconds(5));
    EXPECT_EQ(exporter.counts("s").delivered, 3U);
}

TEST(CimListenerCommand, PrintsJsonWhenAsked) {
    ListenerProcess listener({"--port", "0", "--json", "--count", "1"});
    const int port = listener.waitListening();
    ASSERT_GT(port, 0) << listener.errorText();
    exporter::Exporter exporter;
    exporter.submit("s", "http://127.0.0.1:" + std::to_string(port) + "/any/path", alert(5), once());
    EXPECT_EQ(listener.waitExit(), 0) << listener.errorText();
    EXPECT_EQ(listener.outputText(), "{\"class\":\"CIM_AlertIndication\",\"properties\":{\"Number\":5}}\n");
}

TEST(CimListenerCommand, StopsCleanlyOnSigterm) {
    ListenerProcess listener({"--port", "0"});
    ASSERT_GT(listener.waitListening(), 0) << listener.errorText();
    listener.signal(SIGTERM);
    EXPECT_EQ(listener.waitExit(), 0) << listener.errorText();
    EXPECT_EQ(listener.outputText(), "");
}

TEST(CimListenerCommand, TimesOutWithStatusOneWhenTheCountIsNotReached) {
    ListenerProcess listener({"--port", "0", "--count", "2", "--timeout", "1"});
    ASSERT_GT(listener.waitListening(), 0) << listener.errorText();
    EXPECT_EQ(listener.waitExit(), 1);
    EXPECT_NE(listener.errorText().find("orv-cimlistener: timed out with 0 of 2 indications\n"), std::string::npos)
        << listener.errorText();
}

TEST(CimListenerCommand, BadArgumentsExitWithStatusTwo) {
    ListenerProcess listener({"--count", "zero"});
    EXPECT_EQ(listener.waitExit(), 2);
    EXPECT_EQ(listener.errorText().rfind("orv-cimlistener: --count: 'zero' is not a number from 0 to", 0), 0U)
        << listener.errorText();
}

TEST(CimListenerCommand, APortInUseIsReportedWithStatusOne) {
    ListenerProcess first({"--port", "0"});
    const int port = first.waitListening();
    ASSERT_GT(port, 0);
    ListenerProcess second({"--port", std::to_string(port)});
    EXPECT_EQ(second.waitExit(), 1);
    EXPECT_EQ(second.errorText(),
              "orv-cimlistener: cannot listen on 127.0.0.1:" + std::to_string(port) + ": Address already in use\n");
}

}  // namespace
}  // namespace orv::listener
