// Every failing kernel call fails the whole collection with result 1.
#include "CollectionTest.h"

namespace processortest {
namespace {

class CollectionFailureTest : public CollectionTest, public ::testing::WithParamInterface<CollectionFault> {};

TEST_F(CollectionTest, FaultTargetHostCollectsWithoutFaults) {
    const Collected collected = collect(faultTargetHost());
    EXPECT_EQ(collected.result, 0U);
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
}

TEST_P(CollectionFailureTest, FailsTheCollection) {
    CpuHost host = faultTargetHost();
    host.faults = Json::array({GetParam().rule});
    EXPECT_EQ(collect(host).result, 1U);
}

INSTANTIATE_TEST_SUITE_P(EachKernelCall, CollectionFailureTest, ::testing::ValuesIn(collectionFaults()),
                         FaultName());

TEST_F(CollectionTest, RecordsAppendedBeforeAFailureStay) {
    CpuHost host = faultTargetHost();
    host.faults = Json::array({fault("KSI_Get", kCpuListNode, "103")});
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 1U);
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_STREQ(collected.records[0].Stepping, "4");
    EXPECT_STREQ(collected.records[1].Stepping, "");
}

TEST_F(CollectionTest, SchedulerReadFailureOfAnyCoreFailsTheWholeCollection) {
    for (const char* core : {"100", "101", "102", "103", "104", "105"}) {
        CpuHost host = faultTargetHost();
        host.faults = Json::array({fault("KSI_Get", kStatsNode, core)});
        EXPECT_EQ(collect(host).result, 1U) << "core " << core;
    }
}

}  // namespace
}  // namespace processortest
