// The subscription manager: the checks a broker makes, activation at the
// providers, matching of delivered indications, the store across restarts, and
// the fatal-error policies.
#include <atomic>
#include <thread>

#include "indication_fixture.hpp"

namespace orv::indication::test {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;

using SubscriptionManagerTest = IndicationTest;

TEST_F(SubscriptionManagerTest, FilterQueryMustParseAndNameAnIndicationClassOfItsNamespace) {
    SubscriptionManager& m = startManager();
    EXPECT_EQ(m.createFilter(filter("", "SELECT * FROM Raw_Indication")).rc, CMPI_RC_ERR_INVALID_PARAMETER);
    Status bad = m.createFilter(filter("f", "SELECT * FROM"));
    EXPECT_EQ(bad.rc, CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(bad.message, "query does not parse: expected a class name after FROM at the end");
    Status unknown = m.createFilter(filter("f", "SELECT * FROM No_Such"));
    EXPECT_EQ(unknown.rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(unknown.message, "class No_Such does not exist in root/cimv2");
    Status notIndication = m.createFilter(filter("f", "SELECT * FROM Raw_Element"));
    EXPECT_EQ(notIndication.rc, CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(notIndication.message, "class Raw_Element is not an indication class");
    FilterRecord otherLanguage = filter("f", "SELECT * FROM Raw_Indication");
    otherLanguage.queryLanguage = "XPath";
    EXPECT_EQ(m.createFilter(otherLanguage).rc, CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED);
    FilterRecord elsewhere = filter("f", "SELECT * FROM Raw_Indication");
    elsewhere.sourceNamespace = "root/nowhere";
    EXPECT_EQ(m.createFilter(elsewhere).rc, CMPI_RC_ERR_INVALID_NAMESPACE);
    EXPECT_TRUE(m.filters().empty());
    EXPECT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication")).ok());
    EXPECT_EQ(m.filter("F")->systemName, "testhost");
}

TEST_F(SubscriptionManagerTest, DestinationNeedsAnHttpUrl) {
    SubscriptionManager& m = startManager();
    Status status = m.createDestination(destination("d", "mailto:root@localhost"));
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(status.message, "Destination must be an http:// or https:// URL, not 'mailto:root@localhost'");
    EXPECT_TRUE(m.createDestination(destination("d", "https://listener.example:5991/path")).ok());
}

TEST_F(SubscriptionManagerTest, DuplicateNamesAnswerAlreadyExistsWithoutRegardToCase) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("Beat", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createDestination(destination("Here")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("Beat", "Here")).ok());
    EXPECT_EQ(m.createFilter(filter("bEAT", "SELECT * FROM Raw_SubIndication")).rc, CMPI_RC_ERR_ALREADY_EXISTS);
    EXPECT_EQ(m.createDestination(destination("HERE")).rc, CMPI_RC_ERR_ALREADY_EXISTS);
    EXPECT_EQ(m.createSubscription(subscription("beat", "here")).rc, CMPI_RC_ERR_ALREADY_EXISTS);
    EXPECT_EQ(m.filter("beat")->query, "SELECT * FROM Raw_Indication");
}

TEST_F(SubscriptionManagerTest, SubscriptionNeedsAnExistingFilterAndDestination) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    Status noFilter = m.createSubscription(subscription("nope", "d"));
    EXPECT_EQ(noFilter.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(noFilter.message, "Filter not found: nope");
    Status noHandler = m.createSubscription(subscription("f", "nope"));
    EXPECT_EQ(noHandler.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(noHandler.message, "Handler not found: nope");
    EXPECT_TRUE(m.subscriptions().empty());
    EXPECT_TRUE(providerCalls().empty());
}

TEST_F(SubscriptionManagerTest, FilterOrDestinationInUseCannotBeDeleted) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("f", "d")).ok());
    Status filterInUse = m.deleteFilter("f");
    EXPECT_EQ(filterInUse.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(filterInUse.message, "Filter in use");
    Status handlerInUse = m.deleteDestination("D");
    EXPECT_EQ(handlerInUse.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(handlerInUse.message, "Handler in use");
    EXPECT_TRUE(m.deleteSubscription("F", "d").ok());
    EXPECT_TRUE(m.deleteFilter("f").ok());
    EXPECT_TRUE(m.deleteDestination("d").ok());
    EXPECT_EQ(m.deleteFilter("f").rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(m.deleteSubscription("f", "d").rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(SubscriptionManagerTest, FirstSubscriptionOfAFilterActivatesItAndTheLastDeactivatesIt) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_SubIndication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d1")).ok());
    ASSERT_TRUE(m.createDestination(destination("d2", "http://127.0.0.1:5991")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("f", "d1"), "alice").ok());
    EXPECT_THAT(providerCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_SubIndication owner=alice",
                                             "activateFilter Raw_SubIndication first=1", "enableIndications"));
    ASSERT_TRUE(m.createSubscription(subscription("f", "d2")).ok());
    EXPECT_TRUE(providerCalls().empty());  // the filter is active already
    ASSERT_TRUE(m.deleteSubscription("f", "d1").ok());
    EXPECT_TRUE(providerCalls().empty());
    ASSERT_TRUE(m.deleteSubscription("f", "d2").ok());
    EXPECT_THAT(providerCalls(), ElementsAre("disableIndications", "deActivateFilter Raw_SubIndication last=1"));
}

TEST_F(SubscriptionManagerTest, ProviderRefusalRefusesTheSubscriptionAndStoresNothing) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_SubIndication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    Status refused = m.createSubscription(subscription("f", "d"), "intruder");
    EXPECT_EQ(refused.rc, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(refused.message, "filter refused");
    EXPECT_TRUE(m.subscriptions().empty());
    restart();
    SubscriptionManager& again = startManager();
    EXPECT_TRUE(again.restore().empty());
    EXPECT_TRUE(again.subscriptions().empty());
    EXPECT_EQ(again.filters().size(), 1U);
}

TEST_F(SubscriptionManagerTest, MatchingIndicationsReachTheSinkWithTheSelectListApplied) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT Message FROM Raw_Indication WHERE Sequence > 1")).ok());
    ASSERT_TRUE(m.createDestination(destination("d", "http://127.0.0.1:6000")).ok());
    SubscriptionRecord s = subscription("f", "d");
    s.onFatalErrorPolicy = 3;
    ASSERT_TRUE(m.createSubscription(s).ok());
    ASSERT_EQ(raise("Raw_Indication", 1).rc, CMPI_RC_OK);
    ASSERT_EQ(raise("Raw_Indication", 2, "second").rc, CMPI_RC_OK);
    auto items = sink_.items();
    ASSERT_EQ(items.size(), 1U);
    EXPECT_EQ(items[0].subscriptionId, "f -> d");
    EXPECT_EQ(items[0].url, "http://127.0.0.1:6000");
    EXPECT_THAT(items[0].xml, HasSubstr("<INSTANCE CLASSNAME=\"Raw_Indication\">"));
    EXPECT_THAT(items[0].xml, HasSubstr("<PROPERTY NAME=\"Message\" TYPE=\"string\"><VALUE>second</VALUE>"));
    EXPECT_THAT(items[0].xml, Not(HasSubstr("Sequence")));
    EXPECT_EQ(items[0].policy.retryAttempts, 3U);
    EXPECT_EQ(items[0].policy.retryInterval, std::chrono::milliseconds(20000));
    EXPECT_EQ(items[0].policy.onFatal, exporter::OnFatalError::Disable);
    EXPECT_EQ(m.matchCounts().at("f -> d"), 1U);
}

TEST_F(SubscriptionManagerTest, IndicationRaisedWhileTheFilterIsActivatedReachesTheNewSubscription) {
    setenv("RAW_PROVIDER_RAISE_ON_ACTIVATE", "1", 1);
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_SubIndication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    const Status made = m.createSubscription(subscription("f", "d"));
    unsetenv("RAW_PROVIDER_RAISE_ON_ACTIVATE");
    ASSERT_TRUE(made.ok()) << made.message;
    auto items = sink_.items();
    ASSERT_EQ(items.size(), 1U);
    EXPECT_EQ(items[0].subscriptionId, "f -> d");
    EXPECT_THAT(items[0].xml, HasSubstr("<PROPERTY NAME=\"Message\" TYPE=\"string\"><VALUE>activated</VALUE>"));
}

TEST_F(SubscriptionManagerTest, EachSubscriptionGetsTheIndicationWithItsOwnSelectList) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("all", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createFilter(filter("seq", "SELECT Sequence FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createFilter(filter("all2", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    for (const char* name : {"all", "seq", "all2"}) {
        ASSERT_TRUE(m.createSubscription(subscription(name, "d")).ok());
    }
    raise("Raw_Indication", 7, "text");
    auto items = sink_.items();
    ASSERT_EQ(items.size(), 3U);
    for (const auto& item : items) {
        EXPECT_THAT(item.xml, HasSubstr("<VALUE>7</VALUE>"));
        if (item.subscriptionId == "seq -> d") {
            EXPECT_THAT(item.xml, Not(HasSubstr("Message")));
        } else {
            EXPECT_THAT(item.xml, HasSubstr("<VALUE>text</VALUE>")) << item.subscriptionId;
        }
    }
}

TEST_F(SubscriptionManagerTest, FilterOnAParentClassMatchesSubclassIndicationsOfItsNamespaceOnly) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("all", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createFilter(filter("sub", "SELECT * FROM Raw_SubIndication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("all", "d")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("sub", "d")).ok());
    raise("Raw_SubIndication", 1);
    raise("Raw_Indication", 2);
    raise("Raw_Indication", 3, "m", "root/interop");
    std::vector<std::string> ids;
    for (const auto& item : sink_.items()) {
        ids.push_back(item.subscriptionId);
    }
    EXPECT_THAT(ids, ElementsAre("all -> d", "sub -> d", "all -> d"));
}

TEST_F(SubscriptionManagerTest, DeletingTheSubscriptionStopsDeliveryAndDisabledOnesGetNothing) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    ASSERT_TRUE(m.createDestination(destination("off")).ok());
    SubscriptionRecord disabled = subscription("f", "off");
    disabled.state = 4;
    ASSERT_TRUE(m.createSubscription(disabled).ok());
    EXPECT_TRUE(providerCalls().empty());  // a disabled subscription activates nothing
    ASSERT_TRUE(m.createSubscription(subscription("f", "d")).ok());
    raise("Raw_Indication", 1);
    ASSERT_TRUE(m.deleteSubscription("f", "d").ok());
    raise("Raw_Indication", 2);
    ASSERT_EQ(sink_.items().size(), 1U);
    EXPECT_EQ(sink_.items()[0].subscriptionId, "f -> d");
}

TEST_F(SubscriptionManagerTest, RestartRestoresAndReactivatesTheStoredSubscriptions) {
    {
        SubscriptionManager& m = startManager();
        ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_SubIndication WHERE Sequence >= 2")).ok());
        ASSERT_TRUE(m.createDestination(destination("d")).ok());
        ASSERT_TRUE(m.createSubscription(subscription("f", "d")).ok());
    }
    const std::string startTime = manager_->subscription("f", "d")->startTime;
    restart();
    providerCalls();
    SubscriptionManager& m = startManager();
    EXPECT_TRUE(m.restore().empty());
    EXPECT_THAT(providerCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_SubIndication WHERE Sequence >= 2 owner=",
                                             "activateFilter Raw_SubIndication first=1", "enableIndications"));
    ASSERT_EQ(m.subscriptions().size(), 1U);
    EXPECT_EQ(m.subscriptions()[0].startTime, startTime);
    raise("Raw_SubIndication", 1);
    raise("Raw_SubIndication", 2);
    ASSERT_EQ(sink_.items().size(), 1U);
    EXPECT_THAT(sink_.items()[0].xml, HasSubstr("<VALUE>2</VALUE>"));
}

TEST_F(SubscriptionManagerTest, StoredSubscriptionWithoutItsFilterIsReportedAndTheRestRestored) {
    {
        SubscriptionManager& m = startManager();
        ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication")).ok());
        ASSERT_TRUE(m.createFilter(filter("g", "SELECT * FROM Raw_Indication")).ok());
        ASSERT_TRUE(m.createDestination(destination("d")).ok());
        ASSERT_TRUE(m.createSubscription(subscription("f", "d")).ok());
        ASSERT_TRUE(m.createSubscription(subscription("g", "d")).ok());
    }
    restart();
    StateStore(stateDir_).remove(storeId(filter("g", "")));
    SubscriptionManager& m = startManager();
    EXPECT_THAT(m.restore(), ElementsAre("stored subscription g -> d: its filter or destination is missing"));
    ASSERT_EQ(m.subscriptions().size(), 1U);
    EXPECT_EQ(m.subscriptions()[0].id(), "f -> d");
}

TEST_F(SubscriptionManagerTest, FatalErrorPoliciesDisableOrRemoveTheSubscription) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_SubIndication")).ok());
    ASSERT_TRUE(m.createDestination(destination("a")).ok());
    ASSERT_TRUE(m.createDestination(destination("b")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("f", "a")).ok());
    ASSERT_TRUE(m.createSubscription(subscription("f", "b")).ok());
    providerCalls();
    m.onFatalError("f -> a", exporter::OnFatalError::Ignore);
    EXPECT_EQ(m.subscription("f", "a")->state, 2);
    m.onFatalError("f -> a", exporter::OnFatalError::Disable);
    EXPECT_EQ(m.subscription("f", "a")->state, 4);
    m.onFatalError("f -> b", exporter::OnFatalError::Remove);
    EXPECT_FALSE(m.subscription("f", "b"));
    EXPECT_THAT(providerCalls(), ElementsAre("disableIndications", "deActivateFilter Raw_SubIndication last=1"));
    raise("Raw_SubIndication", 1);
    EXPECT_TRUE(sink_.items().empty());
    restart();
    SubscriptionManager& again = startManager();
    again.restore();
    ASSERT_EQ(again.subscriptions().size(), 1U);
    EXPECT_EQ(again.subscriptions()[0].state, 4);  // kept disabled across the restart
}

TEST_F(SubscriptionManagerTest, DeliveriesFromProviderThreadsWhileSubscriptionsChange) {
    SubscriptionManager& m = startManager();
    ASSERT_TRUE(m.createFilter(filter("f", "SELECT * FROM Raw_Indication WHERE Sequence >= 0")).ok());
    ASSERT_TRUE(m.createDestination(destination("d")).ok());
    std::atomic<bool> stop{false};
    std::vector<std::thread> providers;
    for (int t = 0; t < 3; ++t) {
        providers.emplace_back([this, &stop] {
            for (CMPIUint32 n = 0; !stop.load(); ++n) {
                host::ObjectScope scope;
                EXPECT_EQ(raise("Raw_Indication", n).rc, CMPI_RC_OK);
            }
        });
    }
    for (int round = 0; round < 20; ++round) {
        ASSERT_TRUE(m.createSubscription(subscription("f", "d")).ok());
        ASSERT_TRUE(m.deleteSubscription("f", "d").ok());
    }
    stop.store(true);
    for (auto& thread : providers) {
        thread.join();
    }
    for (const auto& item : sink_.items()) {
        EXPECT_EQ(item.subscriptionId, "f -> d");
    }
}

}  // namespace
}  // namespace orv::indication::test
