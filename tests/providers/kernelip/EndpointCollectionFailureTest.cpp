// Every way the kernel walk can fail or skip, injected on the simulated host.
// A failed walk is never reported: the request answers OK with nothing, not
// even returnDone, and nothing is logged.
#include <string>

#include "KernelIPFixture.h"
#include "orv/testsupport/SyslogCapture.h"

namespace kernelip {
namespace {

using Endpoints = std::vector<std::pair<std::string, std::string>>;

class EndpointCollectionFailureTest : public KernelIPTest {
protected:
    // Enumerates every endpoint of threeVnics() with `faults` injected.
    orv::host::Reply enumerateWith(const Json& faults) {
        serve(hostWith(threeVnics(), faults));
        return provider().enumerateInstances(kKernelParent);
    }

    void expectSilentEmptyAnswer(const Json& faults) {
        orv::testsupport::SyslogCapture syslog;
        const orv::host::Reply reply = enumerateWith(faults);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        EXPECT_EQ(reply.message(), "");
        EXPECT_TRUE(reply.items().empty());
        EXPECT_EQ(reply.doneCount(), 0U);
        EXPECT_TRUE(syslog.lines().empty());
    }
};

TEST_F(EndpointCollectionFailureTest, FaultFreeHostReturnsEveryRecord) {
    const orv::host::Reply reply = enumerateWith(Json::array());
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv4Class, "vif1"},
                                             {kIPv6Class, "vif1"},
                                             {kIPv4Class, "vif2"},
                                             {kIPv6Class, "vif2"}}));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EndpointCollectionFailureTest, RefusedSignatureAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_CheckSig")}));
}

TEST_F(EndpointCollectionFailureTest, ParameterListCreationFailureAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_ParamListCreate")}));
}

TEST_F(EndpointCollectionFailureTest, StackNameNotAddedAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_ParamListAddString", "", "defaultTcpipStack")}));
}

TEST_F(EndpointCollectionFailureTest, VnicListFailureAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_GetInstanceListAlloc", kVnicsNode)}));
}

TEST_F(EndpointCollectionFailureTest, FailedIPv4ReadLeavesTheNicWithoutIPv4Record) {
    const orv::host::Reply reply = enumerateWith(Json::array({fault("KSI_Get", kIPv4Node, "vif1")}));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif1"},
                                             {kIPv4Class, "vif2"},
                                             {kIPv6Class, "vif2"}}));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EndpointCollectionFailureTest, FailedNetmaskReadEndsTheWalkAndAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_Get", kNetmaskNode, "vif1")}));
}

TEST_F(EndpointCollectionFailureTest, FailedIPv6ListLeavesTheNicWithoutIPv6Records) {
    const orv::host::Reply reply = enumerateWith(Json::array({fault("KSI_GetInstanceListAlloc", kIPv6ListNode, "vif0")}));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"},
                                             {kIPv4Class, "vif1"},
                                             {kIPv6Class, "vif1"},
                                             {kIPv4Class, "vif2"},
                                             {kIPv6Class, "vif2"}}));
}

TEST_F(EndpointCollectionFailureTest, FailedSummaryReadEndsTheWalkAndAnswersNothing) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_Get", kSummaryNode, "fd02::7")}));
}

TEST_F(EndpointCollectionFailureTest, MiddleNicWhoseNameCannotBeAddedIsSkipped) {
    const orv::host::Reply reply = enumerateWith(Json::array({fault("KSI_ParamListAddString", "", "vif1")}));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv4Class, "vif2"},
                                             {kIPv6Class, "vif2"}}));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EndpointCollectionFailureTest, LastNicWhoseNameCannotBeAddedFailsTheWholeWalk) {
    expectSilentEmptyAnswer(Json::array({fault("KSI_ParamListAddString", "", "vif2")}));
}

TEST_F(EndpointCollectionFailureTest, ListSlotWithoutNameIsSkipped) {
    std::vector<std::optional<Vnic>> vnics = threeVnics();
    vnics[1] = std::nullopt;
    serve(hostWith(vnics));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"}, {kIPv4Class, "vif2"}}));
}

TEST_F(EndpointCollectionFailureTest, FailedWalkAnswersInstanceNamesWithNothing) {
    serve(hostWith(threeVnics(), Json::array({fault("KSI_CheckSig")})));
    const orv::host::Reply reply = provider().enumerateInstanceNames(kKernelParent);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointCollectionFailureTest, FailedWalkAnswersGetInstanceWithNothing) {
    serve(hostWith(threeVnics(), Json::array({fault("KSI_Get", kNetmaskNode, "vif0")})));
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, {{"Name", "vif0"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointCollectionFailureTest, HostChangedBetweenRequestsIsReadAfresh) {
    serve(hostWith(threeVnics()));
    EXPECT_EQ(provider().enumerateInstances(kIPv4Class).instances().size(), 3U);
    serve(hostWith({Vnic{"vif9", {{"10.9.9.9", "255.0.0.0"}}, {}}}));
    EXPECT_EQ(endpointsOf(provider().enumerateInstances(kIPv4Class)), (Endpoints{{kIPv4Class, "vif9"}}));
}

}  // namespace
}  // namespace kernelip
