// Stored records: every field comes back, and damaged text is reported.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "orv/indication/records.hpp"

namespace orv::indication {
namespace {

TEST(StoredRecords, EveryFieldRoundTripsWithLineEndsAndBackslashes) {
    FilterRecord f;
    f.name = "heart\\beat\nfilter";
    f.systemName = "host";
    f.systemCreationClassName = "CIM_ComputerSystem";
    f.query = "SELECT * FROM Raw_Indication WHERE Message = 'a\\nb'";
    f.sourceNamespace = "root/other";
    ParsedRecord parsed = parseStored(storedText(f), nullptr);
    ASSERT_TRUE(parsed.filter);
    EXPECT_EQ(parsed.filter->name, f.name);
    EXPECT_EQ(parsed.filter->query, f.query);
    EXPECT_EQ(parsed.filter->sourceNamespace, "root/other");
    EXPECT_EQ(parsed.filter->systemName, "host");

    DestinationRecord d;
    d.name = "d";
    d.creationClassName = "CIM_IndicationHandlerCIMXML";
    d.destination = "http://127.0.0.1:5990";
    d.persistenceType = 3;
    ParsedRecord back = parseStored(storedText(d), nullptr);
    ASSERT_TRUE(back.destination);
    EXPECT_EQ(back.destination->creationClassName, "CIM_IndicationHandlerCIMXML");
    EXPECT_EQ(back.destination->persistenceType, 3);
    EXPECT_EQ(back.destination->destination, d.destination);

    SubscriptionRecord s;
    s.filterName = "f";
    s.handlerName = "d";
    s.state = 4;
    s.onFatalErrorPolicy = 3;
    s.startTime = "20260101000000.000000+000";
    ParsedRecord sub = parseStored(storedText(s), nullptr);
    ASSERT_TRUE(sub.subscription);
    EXPECT_EQ(sub.subscription->id(), "f -> d");
    EXPECT_EQ(sub.subscription->state, 4);
    EXPECT_EQ(sub.subscription->onFatalErrorPolicy, 3);
    EXPECT_EQ(sub.subscription->startTime, s.startTime);
}

TEST(StoredRecords, DamagedTextSaysWhatIsWrong) {
    std::string error;
    EXPECT_FALSE(parseStored("filter\nName=f\n", &error).filter);
    EXPECT_EQ(error, "missing Query");
    EXPECT_FALSE(parseStored("destination\nName=d\nDestination=http://x\nProtocol=two\n", &error).destination);
    EXPECT_EQ(error, "Protocol is not a number: two");
    EXPECT_FALSE(parseStored("gadget\n", &error).filter);
    EXPECT_EQ(error, "unknown kind 'gadget'");
}

TEST(StoredRecords, StoreIdsIgnoreCaseAndKeepPairsApart) {
    FilterRecord a;
    a.name = "Beat";
    FilterRecord b;
    b.name = "bEAT";
    EXPECT_EQ(storeId(a), storeId(b));
    SubscriptionRecord x;
    x.filterName = "ab";
    x.handlerName = "c";
    SubscriptionRecord y;
    y.filterName = "a";
    y.handlerName = "bc";
    EXPECT_NE(storeId(x), storeId(y));
}

}  // namespace
}  // namespace orv::indication
