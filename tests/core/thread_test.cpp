// Indications: filter activation, the enable switch, and delivery from a
// provider thread that attaches to the broker.
#include <atomic>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using IndicationTest = CoreTest;
using ::testing::HasSubstr;

TEST_F(IndicationTest, ActivationAuthorizesPollsAndActivatesWithFirstSet) {
    Reply reply = core_->activateFilter("root/cimv2", "SELECT * FROM Raw_Indication", "WQL", as("bob"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.providerCalls(), 2U);  // Raw_Indication and its subclass Raw_SubIndication
    std::string log = providerLog();
    std::size_t authorize = log.find("authorizeFilter SELECT * FROM Raw_Indication owner=bob");
    std::size_t poll = log.find("mustPoll Raw_Indication");
    std::size_t activate = log.find("activateFilter Raw_Indication first=1");
    ASSERT_NE(authorize, std::string::npos) << log;
    ASSERT_NE(poll, std::string::npos);
    ASSERT_NE(activate, std::string::npos);
    EXPECT_LT(authorize, poll);
    EXPECT_LT(poll, activate);
    ASSERT_EQ(core_->deactivateFilter("root/cimv2", "SELECT * FROM Raw_Indication").rc(), CMPI_RC_OK);
    EXPECT_THAT(providerLog(), HasSubstr("deActivateFilter Raw_Indication last=1"));
}

TEST_F(IndicationTest, RefusedAuthorizationStopsActivation) {
    Reply reply = core_->activateFilter("root/cimv2", "SELECT * FROM Raw_Indication", "WQL", as("intruder"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(reply.message(), "filter refused");
    EXPECT_EQ(providerLog().find("activateFilter"), std::string::npos);
}

TEST_F(IndicationTest, EnableIsCalledOncePerProvider) {
    EXPECT_EQ(core_->enableIndications("root/cimv2", "Raw_Indication").providerCalls(), 1U);
    EXPECT_EQ(core_->enableIndications("root/cimv2", "raw_indication").providerCalls(), 0U);
    EXPECT_EQ(core_->disableIndications("root/cimv2", "Raw_Indication").providerCalls(), 1U);
    std::string log = providerLog();
    EXPECT_EQ(log.find("enableIndications", log.find("enableIndications") + 1), std::string::npos);
}

TEST_F(IndicationTest, AttachedProviderThreadDeliversToSubscribers) {
    std::atomic<int> received{0};
    std::string message;
    std::string ns;
    std::uint64_t id = core_->addIndicationSubscriber([&](std::string_view where, const CMPIInstance* ind) {
        ns = where;
        message = stringProperty(ind, "Message");
        ++received;
    });
    Reply reply = core_->invokeMethod(path("Raw_Element", "m"), "StartThread", nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.items()[0].data.value.uint32, 1U);  // the thread's deliverIndication answered OK
    EXPECT_EQ(received.load(), 1);
    EXPECT_EQ(ns, "root/cimv2");
    EXPECT_EQ(message, "from a provider thread");
    core_->removeIndicationSubscriber(id);
    core_->invokeMethod(path("Raw_Element", "m"), "StartThread", nullptr);
    EXPECT_EQ(received.load(), 1);
}

TEST_F(IndicationTest, DeliverIndicationRefusesAnythingButAnInstance) {
    CMPIContext* ctx = mb()->bft->prepareAttachThread(mb(), nullptr);
    EXPECT_EQ(ctx, nullptr);  // nothing to copy from
    CMPIStatus st = mb()->bft->deliverIndication(mb(), nullptr, "root/cimv2",
                                                 reinterpret_cast<const CMPIInstance*>(path("Raw_Indication")));
    EXPECT_EQ(st.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

}  // namespace
}  // namespace orv::host::test
