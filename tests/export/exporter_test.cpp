// The export client against a listener in the test process.
#include "orv/exporter/exporter.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <mutex>
#include <thread>
#include <vector>

#include "test_listener.hpp"

namespace orv::exporter {
namespace {

using test::indicationXml;
using test::TestListener;
using namespace std::chrono_literals;

// Retries without the 20 s default wait between attempts.
DeliveryPolicy quickPolicy(unsigned retries, OnFatalError onFatal = OnFatalError::Ignore) {
    DeliveryPolicy policy;
    policy.retryAttempts = retries;
    policy.retryInterval = 5ms;
    policy.onFatal = onFatal;
    return policy;
}

struct LogLines {
    std::mutex mutex;
    std::vector<std::pair<ExportLogLevel, std::string>> lines;

    std::function<void(ExportLogLevel, std::string_view)> sink() {
        return [this](ExportLogLevel level, std::string_view line) {
            std::lock_guard lock(mutex);
            lines.emplace_back(level, std::string(line));
        };
    }
    std::vector<std::string> at(ExportLogLevel level) {
        std::lock_guard lock(mutex);
        std::vector<std::string> out;
        for (const auto& [lineLevel, text] : lines) {
            if (lineLevel == level) {
                out.push_back(text);
            }
        }
        return out;
    }
};

// Waits up to 10 s for a condition the sender threads make true.
template <typename Predicate>
bool eventually(Predicate predicate) {
    const auto until = std::chrono::steady_clock::now() + 10s;
    while (!predicate()) {
        if (std::chrono::steady_clock::now() > until) {
            return false;
        }
        std::this_thread::sleep_for(1ms);
    }
    return true;
}

TEST(Exporter, PostsAnExportIndicationRequestWithTheExportHeaders) {
    TestListener listener;
    Exporter exporter;
    exporter.submit("s1", listener.url(), indicationXml("CIM_AlertIndication"), quickPolicy(0));
    ASSERT_TRUE(listener.waitForRequests(1));
    const http::Request request = listener.rawRequests().at(0);
    EXPECT_EQ(request.path, "/listener");
    ASSERT_NE(request.header("CIMExport"), nullptr);
    EXPECT_EQ(*request.header("CIMExport"), "MethodRequest");
    ASSERT_NE(request.header("CIMExportMethod"), nullptr);
    EXPECT_EQ(*request.header("CIMExportMethod"), "ExportIndication");
    ASSERT_NE(request.header("CIMProtocolVersion"), nullptr);
    EXPECT_EQ(*request.header("CIMProtocolVersion"), "1.0");
    EXPECT_NE(request.body.find("<EXPPARAMVALUE NAME=\"NewIndication\"><INSTANCE CLASSNAME=\"CIM_AlertIndication\">"),
              std::string::npos);
    EXPECT_TRUE(eventually([&] { return exporter.counts("s1").delivered == 1; }));
}

TEST(Exporter, AConnectionTheListenerClosedWhileIdleIsOpenedAgainWithoutARetry) {
    TestListener listener(1s);
    Exporter exporter;
    DeliveryPolicy policy = quickPolicy(1);
    policy.retryInterval = 60s;
    exporter.submit("s", listener.url(), indicationXml("First"), policy);
    ASSERT_TRUE(eventually([&] { return exporter.counts("s").delivered == 1; }));
    std::this_thread::sleep_for(1500ms);  // the listener drops the idle connection
    exporter.submit("s", listener.url(), indicationXml("Second"), policy);
    ASSERT_TRUE(eventually([&] { return exporter.counts("s").delivered == 2; }));
    EXPECT_EQ(exporter.counts("s").retried, 0U);
}

TEST(Exporter, AnIdleSenderEndsAndANewOneTakesTheNextIndication) {
    TestListener listener;
    ExporterConfig config;
    config.idleTimeout = 20ms;
    Exporter exporter(config);
    for (int round = 0; round < 3; ++round) {
        exporter.submit("s", listener.url(), indicationXml("Round" + std::to_string(round)), quickPolicy(0));
        ASSERT_TRUE(eventually([&] { return exporter.counts("s").delivered == static_cast<unsigned>(round + 1); }));
        std::this_thread::sleep_for(60ms);  // the sender has ended by now
    }
    EXPECT_EQ(listener.accepted(), (std::vector<std::string>{"Round0", "Round1", "Round2"}));
}

TEST(Exporter, KeepsTheOrderOfIndicationsPerDestination) {
    TestListener listener;
    Exporter exporter;
    std::vector<std::string> expected;
    for (int i = 0; i < 50; ++i) {
        expected.push_back("Class" + std::to_string(i));
        exporter.submit(i % 2 == 0 ? "even" : "odd", listener.url(), indicationXml(expected.back()), quickPolicy(0));
    }
    ASSERT_TRUE(listener.waitForRequests(50));
    EXPECT_EQ(listener.accepted(), expected);
    EXPECT_TRUE(eventually([&] { return exporter.counts("even").delivered == 25 && exporter.counts("odd").delivered == 25; }));
}

TEST(Exporter, SubmitDoesNotWaitForASlowListener) {
    TestListener listener;
    listener.hold();
    Exporter exporter;
    exporter.submit("s", listener.url(), indicationXml("First"), quickPolicy(0));
    ASSERT_TRUE(listener.waitForHeld());
    // The listener is holding the first request: these return although nothing can be sent.
    for (int i = 0; i < 10; ++i) {
        exporter.submit("s", listener.url(), indicationXml("Next"), quickPolicy(0));
    }
    EXPECT_EQ(exporter.counts("s").delivered, 0U);
    listener.release();
    EXPECT_TRUE(eventually([&] { return exporter.counts("s").delivered == 11; }));
}

TEST(Exporter, AFullQueueDropsNewIndicationsAndCountsThem) {
    TestListener listener;
    listener.hold();
    LogLines logs;
    ExporterConfig config;
    config.queueLimit = 4;
    config.log = logs.sink();
    Exporter exporter(config);
    exporter.submit("s", listener.url(), indicationXml("InFlight"), quickPolicy(0));
    ASSERT_TRUE(listener.waitForHeld());
    for (int i = 0; i < 20; ++i) {
        exporter.submit("s", listener.url(), indicationXml("Queued" + std::to_string(i)), quickPolicy(0));
    }
    // One is in flight and four wait: the other sixteen are gone at once.
    EXPECT_EQ(exporter.counts("s").dropped, 16U);
    listener.release();
    ASSERT_TRUE(eventually([&] { return exporter.counts("s").delivered == 5; }));
    EXPECT_EQ(listener.accepted(), (std::vector<std::string>{"InFlight", "Queued0", "Queued1", "Queued2", "Queued3"}));
    const auto warnings = logs.at(ExportLogLevel::Warning);
    ASSERT_EQ(warnings.size(), 1U);
    EXPECT_EQ(warnings[0], "queue for " + listener.url() + " is full (4 indications): dropping new indications");
}

TEST(Exporter, AListenerAnsweringHttpErrorsIsRetriedThenTheFatalPolicyApplies) {
    TestListener listener;
    listener.answer(TestListener::Answer::HttpError);
    Exporter exporter;
    std::mutex mutex;
    std::vector<std::pair<std::string, OnFatalError>> fatal;
    exporter.setFatalErrorHandler([&](const std::string& id, OnFatalError policy) {
        std::lock_guard lock(mutex);
        fatal.emplace_back(id, policy);
    });
    exporter.submit("sub", listener.url(), indicationXml("A"), quickPolicy(2, OnFatalError::Disable));
    ASSERT_TRUE(eventually([&] { return exporter.counts("sub").dropped == 1; }));
    EXPECT_EQ(listener.requests(), 3U);
    const SubscriptionCounts counts = exporter.counts("sub");
    EXPECT_EQ(counts.retried, 2U);
    EXPECT_EQ(counts.delivered, 0U);
    std::lock_guard lock(mutex);
    ASSERT_EQ(fatal.size(), 1U);
    EXPECT_EQ(fatal[0].first, "sub");
    EXPECT_EQ(fatal[0].second, OnFatalError::Disable);
}

TEST(Exporter, ACimErrorInTheExportResponseIsAFailedDelivery) {
    TestListener listener;
    listener.answer(TestListener::Answer::CimError);
    Exporter exporter;
    std::atomic<int> fatalCalls{0};
    exporter.setFatalErrorHandler([&](const std::string&, OnFatalError policy) {
        EXPECT_EQ(policy, OnFatalError::Remove);
        ++fatalCalls;
    });
    exporter.submit("sub", listener.url(), indicationXml("A"), quickPolicy(1, OnFatalError::Remove));
    ASSERT_TRUE(eventually([&] { return fatalCalls.load() == 1; }));
    EXPECT_EQ(exporter.counts("sub").retried, 1U);
    EXPECT_EQ(exporter.counts("sub").dropped, 1U);
}

TEST(Exporter, AnAnswerThatIsNotAnExportResponseIsAFailedDelivery) {
    TestListener listener;
    listener.answer(TestListener::Answer::Garbage);
    Exporter exporter;
    exporter.submit("sub", listener.url(), indicationXml("A"), quickPolicy(0));
    EXPECT_TRUE(eventually([&] { return exporter.counts("sub").dropped == 1; }));
    EXPECT_EQ(exporter.counts("sub").delivered, 0U);
}

TEST(Exporter, AnUnreachableListenerIsLoggedOncePerStateChange) {
    LogLines logs;
    ExporterConfig config;
    config.log = logs.sink();
    config.logLevel = ExportLogLevel::Debug;
    auto listener = std::make_unique<TestListener>();
    listener->answer(TestListener::Answer::HttpError);
    const std::string url = listener->url();
    Exporter exporter(config);
    for (int i = 0; i < 5; ++i) {
        exporter.submit("s", url, indicationXml("Lost"), quickPolicy(1));
    }
    ASSERT_TRUE(eventually([&] { return exporter.counts("s").dropped == 5; }));
    listener->answer(TestListener::Answer::Accept);
    for (int i = 0; i < 3; ++i) {
        exporter.submit("s", url, indicationXml("Kept"), quickPolicy(1));
    }
    ASSERT_TRUE(eventually([&] { return exporter.counts("s").delivered == 3; }));
    EXPECT_EQ(logs.at(ExportLogLevel::Warning),
              std::vector<std::string>{"cannot deliver indications to " + url + ": HTTP status 500"});
    EXPECT_EQ(logs.at(ExportLogLevel::Info), std::vector<std::string>{"delivering indications to " + url + " again"});
    const auto debug = logs.at(ExportLogLevel::Debug);
    ASSERT_EQ(debug.size(), 3U);
    EXPECT_NE(debug[0].find("of subscription s to " + url + " (attempt 1)"), std::string::npos) << debug[0];
}

TEST(Exporter, AListenerThatIsDownCostsOnlyTheQueue) {
    // A port that was free a moment ago: connections are refused.
    std::string url;
    {
        TestListener listener;
        url = listener.url();
    }
    ExporterConfig config;
    config.queueLimit = 3;
    Exporter exporter(config);
    DeliveryPolicy policy = quickPolicy(3);
    policy.retryInterval = 10s;  // the first indication stays in its retries
    for (int i = 0; i < 100; ++i) {
        exporter.submit("s", url, indicationXml("X"), policy);
    }
    // At most one in retry and three queued: everything else was dropped on submit.
    EXPECT_GE(exporter.counts("s").dropped, 96U);
    exporter.shutdown(0ms);
    EXPECT_EQ(exporter.counts("s").dropped, 100U);
    EXPECT_EQ(exporter.counts("s").delivered, 0U);
}

TEST(Exporter, ShutdownFlushesWhatIsQueuedWithinTheBudget) {
    TestListener listener;
    listener.hold();
    Exporter exporter;
    for (int i = 0; i < 10; ++i) {
        exporter.submit("s", listener.url(), indicationXml("C" + std::to_string(i)), quickPolicy(0));
    }
    ASSERT_TRUE(listener.waitForHeld());
    std::thread releaser([&] {
        std::this_thread::sleep_for(50ms);
        listener.release();
    });
    exporter.shutdown(10s);
    releaser.join();
    EXPECT_EQ(exporter.counts("s").delivered, 10U);
    EXPECT_EQ(listener.accepted().size(), 10U);
}

TEST(Exporter, ShutdownDropsWhatTheBudgetDoesNotAllow) {
    TestListener listener;
    listener.hold();
    ExporterConfig config;
    config.readTimeout = 60s;  // the held request would keep the sender for a minute
    Exporter exporter(config);
    for (int i = 0; i < 10; ++i) {
        exporter.submit("s", listener.url(), indicationXml("C"), quickPolicy(3));
    }
    ASSERT_TRUE(listener.waitForHeld());
    const auto started = std::chrono::steady_clock::now();
    exporter.shutdown(100ms);
    // The held request was broken off rather than waited out.
    EXPECT_LT(std::chrono::steady_clock::now() - started, 30s);
    EXPECT_EQ(exporter.counts("s").dropped, 10U);
    EXPECT_EQ(exporter.counts("s").delivered, 0U);
}

TEST(Exporter, ShutdownCutsARetryWaitShort) {
    TestListener listener;
    listener.answer(TestListener::Answer::HttpError);
    Exporter exporter;
    std::atomic<int> fatalCalls{0};
    exporter.setFatalErrorHandler([&](const std::string&, OnFatalError) { ++fatalCalls; });
    DeliveryPolicy policy = quickPolicy(3);
    policy.retryInterval = 60s;
    exporter.submit("s", listener.url(), indicationXml("C"), policy);
    ASSERT_TRUE(listener.waitForRequests(1));
    exporter.shutdown(50ms);
    EXPECT_EQ(exporter.counts("s").dropped, 1U);
    // Dropped by the shutdown, not failed for good: the subscription keeps its state.
    EXPECT_EQ(fatalCalls.load(), 0);
}

TEST(Exporter, IndicationsSubmittedAfterShutdownAreDropped) {
    TestListener listener;
    Exporter exporter;
    exporter.shutdown(0ms);
    exporter.submit("s", listener.url(), indicationXml("Late"), quickPolicy(0));
    EXPECT_EQ(exporter.counts("s").dropped, 1U);
    EXPECT_EQ(listener.requests(), 0U);
    exporter.shutdown(0ms);  // again: nothing left to do
}

TEST(Exporter, ADestinationThatIsNotAUrlDropsItsIndicationsAndIsLoggedOnce) {
    LogLines logs;
    ExporterConfig config;
    config.log = logs.sink();
    Exporter exporter(config);
    exporter.submit("s", "ftp://example/x", indicationXml("A"), quickPolicy(0));
    exporter.submit("s", "ftp://example/x", indicationXml("B"), quickPolicy(0));
    EXPECT_EQ(exporter.counts("s").dropped, 2U);
    EXPECT_EQ(logs.at(ExportLogLevel::Error),
              std::vector<std::string>{
                  "cannot deliver indications to ftp://example/x: the URL does not start with http:// or https://"});
}

TEST(Exporter, ABlockedDestinationDoesNotHoldBackAnother) {
    TestListener blocked;
    TestListener open;
    blocked.hold();
    Exporter exporter;
    exporter.submit("a", blocked.url(), indicationXml("A"), quickPolicy(0));
    ASSERT_TRUE(blocked.waitForHeld());
    exporter.submit("b", open.url(), indicationXml("B"), quickPolicy(0));
    EXPECT_TRUE(eventually([&] { return exporter.counts("b").delivered == 1; }));
    EXPECT_EQ(exporter.counts("a").delivered, 0U);
    blocked.release();
}

TEST(Exporter, CountsAreKeptPerSubscriptionAndCanBeForgotten) {
    TestListener listener;
    Exporter exporter;
    exporter.submit("one", listener.url(), indicationXml("A"), quickPolicy(0));
    exporter.submit("two", listener.url(), indicationXml("A"), quickPolicy(0));
    exporter.submit("two", listener.url(), indicationXml("A"), quickPolicy(0));
    ASSERT_TRUE(eventually([&] { return exporter.counts("two").delivered == 2; }));
    EXPECT_EQ(exporter.counts("one").delivered, 1U);
    const auto all = exporter.allCounts();
    ASSERT_EQ(all.size(), 2U);
    EXPECT_EQ(all[0].first, "one");
    EXPECT_EQ(all[0].second.delivered, 1U);
    EXPECT_EQ(all[1].first, "two");
    EXPECT_EQ(all[1].second.delivered, 2U);
    exporter.forget("two");
    EXPECT_EQ(exporter.counts("two").delivered, 0U);
    EXPECT_EQ(exporter.counts("unknown").dropped, 0U);
}

TEST(Exporter, ConcurrentSubmittersAllGetCounted) {
    TestListener listener;
    Exporter exporter;
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&, t] {
            for (int i = 0; i < 25; ++i) {
                exporter.submit("s" + std::to_string(t), listener.url(), indicationXml("A"), quickPolicy(0));
                (void)exporter.counts("s" + std::to_string(t));
            }
        });
    }
    for (auto& thread : threads) {
        thread.join();
    }
    exporter.shutdown(10s);
    for (int t = 0; t < 4; ++t) {
        EXPECT_EQ(exporter.counts("s" + std::to_string(t)).delivered, 25U);
    }
}

}  // namespace
}  // namespace orv::exporter
