// Filter activation in sfcb's order: authorizeFilter, mustPoll, activateFilter
// with firstActivation per class, enableIndications once per provider; on the
// way back disableIndications before the last deActivateFilter.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

class FilterActivationTest : public CoreTest {
protected:
    // The provider's indication calls since the last look, one per line.
    std::vector<std::string> newCalls() {
        std::vector<std::string> lines;
        std::istringstream in(providerLog());
        std::string line;
        std::size_t index = 0;
        while (std::getline(in, line)) {
            if (index++ >= seen_ && (line.find("Filter") != std::string::npos || line.find("Poll") != std::string::npos ||
                                     line.find("Indications") != std::string::npos)) {
                lines.push_back(line);
            }
        }
        seen_ = index;
        return lines;
    }

    Reply on(const char* query) { return core_->activateFilter("root/cimv2", query, "WQL", as("bob")); }
    Reply off(const char* query) { return core_->deactivateFilter("root/cimv2", query, "WQL", as("bob")); }

    std::size_t seen_ = 0;
};

using ::testing::ElementsAre;

TEST_F(FilterActivationTest, FirstFilterOnAClassActivatesWithFirstSetAndEnablesIndications) {
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_SubIndication owner=bob",
                                        "mustPoll Raw_SubIndication", "activateFilter Raw_SubIndication first=1",
                                        "enableIndications"));
}

TEST_F(FilterActivationTest, SecondFilterOnTheSameClassIsNotFirstAndDoesNotEnableAgain) {
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    newCalls();
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication WHERE Sequence > 3").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_SubIndication WHERE Sequence > 3 owner=bob",
                                        "mustPoll Raw_SubIndication", "activateFilter Raw_SubIndication first=0"));
}

TEST_F(FilterActivationTest, FilterOnAParentClassReachesTheProvidersOfItsSubclasses) {
    Reply reply = on("SELECT * FROM Raw_Indication");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(reply.providerCalls(), 2U);
    EXPECT_THAT(newCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_Indication owner=bob",
                                        "mustPoll Raw_Indication", "activateFilter Raw_Indication first=1",
                                        "authorizeFilter SELECT * FROM Raw_Indication owner=bob",
                                        "mustPoll Raw_SubIndication", "activateFilter Raw_SubIndication first=1",
                                        "enableIndications"));
}

TEST_F(FilterActivationTest, LastFilterDisablesIndicationsBeforeItsDeactivation) {
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication WHERE Sequence > 3").rc(), CMPI_RC_OK);
    newCalls();
    ASSERT_EQ(off("SELECT * FROM Raw_SubIndication WHERE Sequence > 3").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("deActivateFilter Raw_SubIndication last=0"));
    ASSERT_EQ(off("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("disableIndications", "deActivateFilter Raw_SubIndication last=1"));
}

TEST_F(FilterActivationTest, ProviderKeepsIndicationsWhileAFilterOnAnotherClassIsActive) {
    ASSERT_EQ(on("SELECT * FROM Raw_Indication").rc(), CMPI_RC_OK);
    ASSERT_EQ(on("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    newCalls();
    ASSERT_EQ(off("SELECT * FROM Raw_Indication").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("deActivateFilter Raw_Indication last=1",
                                        "deActivateFilter Raw_SubIndication last=0"));
    ASSERT_EQ(off("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    EXPECT_THAT(newCalls(), ElementsAre("disableIndications", "deActivateFilter Raw_SubIndication last=1"));
}

TEST_F(FilterActivationTest, RefusedAuthorizationEnablesNothing) {
    Reply reply = core_->activateFilter("root/cimv2", "SELECT * FROM Raw_SubIndication", "WQL", as("intruder"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_THAT(newCalls(), ElementsAre("authorizeFilter SELECT * FROM Raw_SubIndication owner=intruder"));
    // Nothing is active, so a deactivation calls nothing.
    ASSERT_EQ(off("SELECT * FROM Raw_SubIndication").rc(), CMPI_RC_OK);
    EXPECT_TRUE(newCalls().empty());
}

TEST_F(FilterActivationTest, UnknownClassAndBadQueryAreRefusedBeforeAnyProviderCall) {
    EXPECT_EQ(on("SELECT * FROM No_Such_Indication").rc(), CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(on("SELECT FROM Raw_Indication").rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_TRUE(newCalls().empty());
}

}  // namespace
}  // namespace orv::host::test
