// What the dispatchers hand the broker for each way an operation can end.
#include "CoreFixture.h"

#include <orv/testsupport/SyslogCapture.h>

#include <syslog.h>

namespace {

using orv::bindingtest::CoreFixture;
using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

class DispatchTest : public CoreFixture {
protected:
    orv::host::Reply get(const char* name) { return core->getInstance(path("Test_Element", name)); }
};

TEST_F(DispatchTest, ThrownStatusWithMessageIsTheAnswer) {
    orv::host::Reply reply = get("throw-status");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "no such element");
    EXPECT_TRUE(reply.items().empty());
}

TEST_F(DispatchTest, ThrownStatusWithoutMessageIsTheAnswer) {
    orv::host::Reply reply = get("throw-status-bare");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(reply.message(), "");
    EXPECT_EQ(reply.status().msg, nullptr);
}

TEST_F(DispatchTest, ReturnedStatusWithMessageIsTheAnswer) {
    orv::host::Reply reply = get("return-status");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(reply.message(), "returned failure");
}

TEST_F(DispatchTest, ReturnedStatusWithoutMessageIsTheAnswer) {
    orv::host::Reply reply = get("return-status-bare");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.status().msg, nullptr);
}

TEST_F(DispatchTest, StandardExceptionIsAnsweredAsFailedWithItsTextAndLogged) {
    SyslogCapture log;
    orv::host::Reply reply = get("std-exception");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "element lookup exploded");
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "instanceTestElementProvider: getInstance failed: element lookup exploded"}}));
}

TEST_F(DispatchTest, ForeignExceptionIsAnsweredAsFailedAndLogged) {
    SyslogCapture log;
    orv::host::Reply reply = get("foreign-exception");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.message(), "unknown exception");
    EXPECT_EQ(log.lines(), (std::vector<SyslogLine>{
                               {LOG_ERR, "instanceTestElementProvider: getInstance failed: unknown exception"}}));
}

TEST_F(DispatchTest, SuccessfulOperationLogsNothing) {
    SyslogCapture log;
    orv::host::Reply reply = get("alpha");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(property(reply.instances()[0], "Label"), "Label of alpha");
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DispatchTest, CreateInstanceOnAnyProviderIsNotSupported) {
    const CMPIBroker* b = core->broker();
    for (const char* cls : {"Test_Element", "Test_Link"}) {
        CMPIInstance* inst = b->eft->newInstance(b, path(cls), nullptr);
        orv::host::Reply reply = core->createInstance(path(cls), inst);
        EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED) << cls;
        EXPECT_TRUE(reply.items().empty()) << cls;
    }
}

TEST_F(DispatchTest, ProviderObjectIsInitializedOnceAndSharedByLaterRequests) {
    orv::host::Reply first = get("self");
    orv::host::Reply second = get("self");
    ASSERT_EQ(first.instances().size(), 1u);
    ASSERT_EQ(second.instances().size(), 1u);
    CMPIData calls = second.instances()[0]->ft->getProperty(second.instances()[0], "InitializeCalls", nullptr);
    EXPECT_EQ(calls.value.uint32, 1u);
    CMPIData serial1 = first.instances()[0]->ft->getProperty(first.instances()[0], "Serial", nullptr);
    CMPIData serial2 = second.instances()[0]->ft->getProperty(second.instances()[0], "Serial", nullptr);
    EXPECT_EQ(serial1.value.uint32, serial2.value.uint32);
}

TEST_F(DispatchTest, TwinProviderNameServesItsOwnObjectOfTheSameClass) {
    orv::host::Reply element = get("self");
    orv::host::Reply twin = core->getInstance(path("Test_Twin", "self"));
    ASSERT_EQ(element.instances().size(), 1u);
    ASSERT_EQ(twin.instances().size(), 1u);
    CMPIData a = element.instances()[0]->ft->getProperty(element.instances()[0], "Serial", nullptr);
    CMPIData b = twin.instances()[0]->ft->getProperty(twin.instances()[0], "Serial", nullptr);
    EXPECT_NE(a.value.uint32, b.value.uint32);
}

}  // namespace
