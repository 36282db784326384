// Latched records: host names, long class names and event numbers read from
// requests.
#include <signal.h>
#include <syslog.h>

#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using orv::providertest::propertyOf;

std::string dependentOf(const orv::host::Reply& reply) {
    if (reply.instances().size() != 1) {
        return "<" + std::to_string(reply.instances().size()) + " instances>";
    }
    return propertyOf(reply.instances()[0], "Dependent").value_or(NamedValue{}).text;
}

using HealthRecordTest = LatchedHealthTest;
using HealthRecordDeathTest = LatchedHealthTest;

TEST_F(HealthRecordTest, ElementWithoutHostNameIsRebuiltWithoutHostName) {
    serve({element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10)});
    start();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "CIM_Sensor", "10"}}));
    // The serving library adds the computer system's keys the element left out.
    EXPECT_EQ(dependentOf(references(latchedPath("0"))),
              "root/cimv2:CIM_Sensor.SystemCreationClassName=OMC_UnitaryComputerSystem,"
              "SystemName=simhost.providers.test,DeviceID=fan0");
}

TEST_F(HealthRecordTest, ElementWithHostNameIsRebuiltWithIt) {
    Json fan = element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10);
    fan["hostName"] = "simhost";
    serve({fan});
    start();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", "CIM_Sensor", "10"}}));
    const orv::host::Reply reply = references(latchedPath("0"));
    ASSERT_EQ(reply.instances().size(), 1U);
    const CMPIData dependent = reply.instances()[0]->ft->getProperty(reply.instances()[0], "Dependent", nullptr);
    ASSERT_EQ(dependent.type, CMPI_ref);
    CMPIString* host = dependent.value.ref->ft->getHostname(dependent.value.ref, nullptr);
    ASSERT_NE(host, nullptr);
    EXPECT_STREQ(host->ft->getCharPtr(host, nullptr), "simhost");
}

// A host name that begins with "NULL" is dropped from the rebuilt path like an
// absent one, so the copy of such an element does not round-trip: fatal.
TEST_F(HealthRecordDeathTest, ElementWhoseHostNameBeginsWithNullEndsTheProcess) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    Json fan = element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10);
    fan["hostName"] = "NULLhost";
    serve({fan});
    EXPECT_EXIT(start(), ::testing::KilledBySignal(SIGABRT), "");
}

TEST_F(HealthRecordTest, ClassNameOf79CharactersIsKeptWhole) {
    const std::string name = "Orvane_" + std::string(72, 'S');
    Json sensor = element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10);
    sensor["class"] = name;
    serve({sensor});
    start();
    runPass();
    EXPECT_EQ(latched(), (std::vector<Latched>{{"0", name, "10"}}));
}

// The record keeps 79 characters of a longer class name; the path rebuilt from
// it names another class, and a copy that does not round-trip is fatal.
TEST_F(HealthRecordDeathTest, ClassNameOf80CharactersIsTruncatedAndEndsTheProcess) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    Json sensor = element("CIM_Sensor", {{"DeviceID", "fan0"}}, 10);
    sensor["class"] = "Orvane_" + std::string(73, 'S');
    serve({sensor});
    EXPECT_EXIT(start(), ::testing::KilledBySignal(SIGABRT), "");
}

TEST_F(HealthRecordTest, EventIdReadsItsLeadingDigits) {
    serve({device("CIM_Sensor", "fan0", 10), device("CIM_PowerSupply", "psu0", 20)});
    start();
    const orv::host::Reply second = provider().getInstance(kLatchedClass, {{"EventId", "1abc"}});
    ASSERT_EQ(second.rc(), CMPI_RC_OK) << second.message();
    ASSERT_EQ(second.instances().size(), 1U);
    EXPECT_EQ(propertyOf(second.instances()[0], "LatchedClassName")->text, "CIM_PowerSupply");
}

TEST_F(HealthRecordTest, EventIdWithoutDigitsFindsTheFirstRecordEverLatched) {
    serve({device("CIM_Sensor", "fan0", 10), device("CIM_PowerSupply", "psu0", 20)});
    start();
    const orv::host::Reply first = provider().getInstance(kLatchedClass, {{"EventId", "abc"}});
    ASSERT_EQ(first.rc(), CMPI_RC_OK) << first.message();
    ASSERT_EQ(first.instances().size(), 1U);
    EXPECT_EQ(propertyOf(first.instances()[0], "EventId")->text, "0");
    EXPECT_EQ(propertyOf(first.instances()[0], "LatchedClassName")->text, "CIM_Sensor");
}

TEST_F(HealthRecordTest, EventIdWithoutDigitsFindsNothingBeforeAnyLatch) {
    start();
    const orv::host::Reply reply = provider().getInstance(kLatchedClass, {{"EventId", "abc"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "failed to get instances");
}

}  // namespace
}  // namespace latched
