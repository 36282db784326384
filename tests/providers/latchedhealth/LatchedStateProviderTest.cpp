// "Orvane_LatchedHealthState" and "Orvane_RollupHealthState" as clients see
// them, and the start and stop of the monitor threads.
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <thread>

#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using orv::providertest::classNameOf;
using orv::providertest::keysOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

using LatchedStateProviderTest = LatchedHealthTest;

TEST_F(LatchedStateProviderTest, WithNoRecordsBothEnumerationsReturnNothingAndSignalNoDone) {
    start();
    const orv::host::Reply names = provider().enumerateInstanceNames(kLatchedClass);
    const orv::host::Reply instances = provider().enumerateInstances(kLatchedClass);
    EXPECT_EQ(names.rc(), CMPI_RC_OK);
    EXPECT_EQ(names.items().size(), 0U);
    EXPECT_EQ(names.doneCount(), 0U);
    EXPECT_EQ(instances.rc(), CMPI_RC_OK);
    EXPECT_EQ(instances.items().size(), 0U);
    EXPECT_EQ(instances.doneCount(), 0U);
    const orv::host::Reply rollup = provider().enumerateInstances(kRollupClass);
    EXPECT_EQ(rollup.items().size(), 1U);
    EXPECT_EQ(rollup.doneCount(), 1U);
}

TEST_F(LatchedStateProviderTest, EnumerationsSignalDoneOnceWhenRecordsExist) {
    serve({device("CIM_Sensor", "fan0", 10), device("CIM_PowerSupply", "psu0", 20)});
    start();
    const orv::host::Reply names = provider().enumerateInstanceNames(kLatchedClass);
    ASSERT_EQ(names.objectPaths().size(), 2U);
    EXPECT_EQ(names.doneCount(), 1U);
    EXPECT_EQ(keysOf(names.objectPaths()[1]), (std::vector<NamedValue>{{"EventId", CMPI_string, "1"}}));
    EXPECT_EQ(provider().enumerateInstances(kLatchedClass).doneCount(), 1U);
}

TEST_F(LatchedStateProviderTest, ClassNameInLowerCaseIsServed) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    const orv::host::Reply reply = provider().core().enumerateInstances(
        provider().path("orvane_latchedhealthstate"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.instances().size(), 1U);
    const orv::host::Reply rollup = provider().core().getInstance(
        provider().path("ORVANE_ROLLUPHEALTHSTATE", {{"Name", "anything"}}));
    ASSERT_EQ(rollup.rc(), CMPI_RC_OK) << rollup.message();
    EXPECT_EQ(propertyOf(rollup.instances()[0], "Name")->text, "Orvane Rollup Health State");
}

TEST_F(LatchedStateProviderTest, InstanceCarriesTheRecordInOrder) {
    FixedTime at(1700000000);
    serve({device("Orvane_StorageExtent", "ext0", 25)});
    start();
    const orv::host::Reply reply = provider().enumerateInstances(kLatchedClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]),
              (std::vector<NamedValue>{{"LatchedClassName", CMPI_string, "Orvane_StorageExtent"},
                                       {"LatchedNamespace", CMPI_string, "root/cimv2"},
                                       {"EventId", CMPI_string, "0"},
                                       {"HealthState", CMPI_uint16, "25"},
                                       {"Timestamp", CMPI_dateTime, "20231114221320.000000+000"}}));
}

TEST_F(LatchedStateProviderTest, TimestampOfZeroSecondsIsTheEpochNotAnInterval) {
    FixedTime at(0);
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    const orv::host::Reply reply = provider().getInstance(kLatchedClass, {{"EventId", "0"}});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertyOf(reply.instances()[0], "Timestamp"),
              (NamedValue{"Timestamp", CMPI_dateTime, "19700101000000.000000+000"}));
}

// The broker names each instance by its key property; the class name stays
// the request's, in the request's letter case.
TEST_F(LatchedStateProviderTest, EnumeratedInstancesCarryTheRequestPath) {
    serve({device("CIM_Sensor", "fan0", 10), device("CIM_Sensor", "fan1", 10)});
    start();
    const orv::host::Reply reply =
        provider().core().enumerateInstances(provider().path("orvane_LATCHEDhealthstate"));
    ASSERT_EQ(reply.instances().size(), 2U);
    for (const CMPIInstance* instance : reply.instances()) {
        CMPIObjectPath* path = instance->ft->getObjectPath(instance, nullptr);
        EXPECT_EQ(classNameOf(path), "orvane_LATCHEDhealthstate");
    }
    EXPECT_EQ(propertyOf(reply.instances()[1], "EventId")->text, "1");
}

TEST_F(LatchedStateProviderTest, PropertyListKeepsTheKey) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    const orv::host::Reply reply =
        provider().enumerateInstances(kLatchedClass, std::vector<std::string>{"HealthState"});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(orv::providertest::propertyNamesOf(reply.instances()[0]),
              (std::vector<std::string>{"EventId", "HealthState"}));
}

TEST_F(LatchedStateProviderTest, GetInstanceOfAnEventNumberReplacedByEscalationFails) {
    serve({device("CIM_Sensor", "fan0", 10)});
    start();
    serve({device("CIM_Sensor", "fan0", 20)});
    runPass();
    const orv::host::Reply old = provider().getInstance(kLatchedClass, {{"EventId", "0"}});
    EXPECT_EQ(old.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(old.message(), "failed to get instances");
    const orv::host::Reply current = provider().getInstance(kLatchedClass, {{"EventId", "1"}});
    ASSERT_EQ(current.rc(), CMPI_RC_OK);
    EXPECT_EQ(current.doneCount(), 1U);
}

TEST_F(LatchedStateProviderTest, GetInstanceWithoutEventIdFails) {
    start();
    const orv::host::Reply reply = provider().getInstance(kLatchedClass, {{"Other", "0"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "failed to get instances");
}

TEST_F(LatchedStateProviderTest, RollupIgnoresTheRequestedKey) {
    serve({device("CIM_Sensor", "fan0", 15)});
    start();
    const orv::host::Reply reply = provider().getInstance(kRollupClass, {{"Name", "not this one"}});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]),
              (std::vector<NamedValue>{{"Name", CMPI_string, "Orvane Rollup Health State"},
                                       {"HealthState", CMPI_uint16, "15"}}));
    const orv::host::Reply names = provider().enumerateInstanceNames(kRollupClass);
    ASSERT_EQ(names.objectPaths().size(), 1U);
    EXPECT_EQ(keysOf(names.objectPaths()[0]),
              (std::vector<NamedValue>{{"Name", CMPI_string, "Orvane Rollup Health State"}}));
}

TEST_F(LatchedStateProviderTest, NoClientCanCreateALatchedRecord) {
    start();
    const CMPIBroker* mb = broker();
    CMPIObjectPath* path = latchedPath("9");
    CMPIInstance* instance = mb->eft->newInstance(mb, path, nullptr);
    const orv::host::Reply reply = provider().core().createInstance(path, instance);
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
}

void waitForTwoThreads(LatchedHealthTest& test) {
    for (int i = 0; i < 5000 && test.threadsRunningNow() < 2; ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
}

TEST_F(LatchedStateProviderTest, BothMonitorThreadsRunAndATerminatingCleanupJoinsThem) {
    start();
    waitForTwoThreads(*this);
    EXPECT_EQ(threadsRunning(), 2U);
    const auto begin = std::chrono::steady_clock::now();
    stop();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(10));
}

TEST_F(LatchedStateProviderTest, IdleUnloadIsRefused) {
    start();
    waitForTwoThreads(*this);
    (void)provider().core().unloadIdleProviders();
    const std::vector<std::string> loaded = provider().core().loadedLibraries();
    EXPECT_NE(std::find(loaded.begin(), loaded.end(), "latchedhealthundertest"), loaded.end());
    EXPECT_EQ(threadsRunning(), 2U);
    EXPECT_EQ(rollup(), "0");
}

}  // namespace
}  // namespace latched
