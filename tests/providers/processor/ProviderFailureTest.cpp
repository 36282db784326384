// A failed collection through the provider: enumeration answers OK with
// nothing (not even returnDone), getInstance answers not found without a
// message, and nothing is logged.
#include "ProcessorFixture.h"
#include "orv/testsupport/SyslogCapture.h"

namespace processortest {
namespace {

class ProviderFailureTest : public ProcessorTest, public ::testing::WithParamInterface<CollectionFault> {
protected:
    void serveWithFault() {
        CpuHost host = faultTargetHost();
        host.faults = Json::array({GetParam().rule});
        serve(host);  // written afresh per request: counted faults start again
    }
};

TEST_P(ProviderFailureTest, EnumerationAnswersOkWithNothing) {
    orv::testsupport::SyslogCapture syslog;
    serveWithFault();
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.message(), "");
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
    EXPECT_TRUE(syslog.lines().empty());
}

TEST_P(ProviderFailureTest, InstanceNamesAnswerOkWithNothing) {
    serveWithFault();
    const orv::host::Reply reply = provider().enumerateInstanceNames(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_P(ProviderFailureTest, GetInstanceIsNotFound) {
    orv::testsupport::SyslogCapture syslog;
    serveWithFault();
    const orv::host::Reply reply = getPackage("cpu-0");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "");
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
    EXPECT_TRUE(syslog.lines().empty());
}

INSTANTIATE_TEST_SUITE_P(EachKernelCall, ProviderFailureTest, ::testing::ValuesIn(collectionFaults()),
                         FaultName());

class FaultFreeTest : public ProcessorTest {};

TEST_F(FaultFreeTest, FaultTargetHostIsServedWithoutFaults) {
    serve(faultTargetHost());
    EXPECT_EQ(deviceIdsOf(provider().enumerateInstances(kProcessorClass)),
              (std::vector<std::string>{"cpu-0", "cpu-1"}));
    EXPECT_EQ(provider().getInstance(kProcessorClass, processorKeys("cpu-1")).rc(), CMPI_RC_OK);
}

}  // namespace
}  // namespace processortest
