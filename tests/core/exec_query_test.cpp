// ExecQuery of a provider that refuses execQuery: the host answers from the
// provider's enumeration, filtered by the query's WHERE clause and cut to its
// SELECT list.
#include <atomic>
#include <thread>
#include <vector>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using ::testing::ElementsAre;
using ::testing::UnorderedElementsAre;

class ExecQueryTest : public CoreTest {
protected:
    Reply query(const char* text, const char* language = "WQL", const char* principal = "noquery") {
        return core_->execQuery(path(""), text, language, as(principal));
    }

    static std::vector<std::string> names(const Reply& reply) {
        std::vector<std::string> out;
        for (const CMPIInstance* inst : reply.instances()) {
            out.push_back(stringProperty(inst, "Name"));
        }
        return out;
    }
};

TEST_F(ExecQueryTest, ProviderRefusingExecQueryIsAnsweredFromItsEnumeration) {
    Reply reply = query("SELECT * FROM Raw_Element WHERE Counter = 1");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_THAT(names(reply), UnorderedElementsAre("Raw_Element-1", "Raw_SubElement-1"));
    EXPECT_EQ(propertyNames(reply.instances().front()).size(), 8U);  // every property
}

TEST_F(ExecQueryTest, ProviderAnsweringExecQueryItselfIsNotOverridden) {
    Reply reply = query("SELECT * FROM Raw_Element WHERE Counter >= 3", "WQL", "user");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_THAT(names(reply), ElementsAre("q-3", "q-4", "q-3", "q-4"));  // its own five, per class
}

TEST_F(ExecQueryTest, SelectListKeepsOnlyItsPropertiesAndTheKeys) {
    Reply reply = query("SELECT Counter, Text FROM Raw_Element WHERE Name = 'Raw_Element-0'");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_THAT(propertyNames(reply.instances().front()), UnorderedElementsAre("Name", "Counter", "Text"));
}

TEST_F(ExecQueryTest, FromClassTakesItsSubclassesAndIsaTestsEmbeddedClasses) {
    EXPECT_THAT(names(query("SELECT * FROM Raw_SubElement")), UnorderedElementsAre("Raw_SubElement-0", "Raw_SubElement-1"));
    EXPECT_THAT(names(query("SELECT * FROM Raw_Base WHERE Counter = 0")),
                UnorderedElementsAre("Raw_Element-0", "Raw_SubElement-0", "Raw_OtherSub-0"));
    // Text holds no embedded instance: ISA is false, its negation too.
    EXPECT_TRUE(names(query("SELECT * FROM Raw_Element WHERE Text ISA Raw_Base")).empty());
}

TEST_F(ExecQueryTest, WhereCombinesComparisonsWithAndOrNotAndNullTests) {
    EXPECT_THAT(names(query("SELECT * FROM Raw_Element WHERE NOT (Counter = 0) AND Text IS NOT NULL")),
                UnorderedElementsAre("Raw_Element-1", "Raw_SubElement-1"));
    EXPECT_THAT(names(query("SELECT * FROM Raw_Element WHERE Name = 'Raw_Element-0' OR Ratio < 0.1")),
                ElementsAre("Raw_Element-0"));
    EXPECT_TRUE(names(query("SELECT * FROM Raw_Element WHERE Text IS NULL")).empty());
    EXPECT_THAT(names(query("SELECT * FROM Raw_Element WHERE Extra IS NULL AND Flag = TRUE AND Big < -5")),
                UnorderedElementsAre("Raw_Element-0", "Raw_Element-1", "Raw_SubElement-0", "Raw_SubElement-1"));
}

TEST_F(ExecQueryTest, CqlQueriesOfTheWqlSubsetAreAnswered) {
    EXPECT_THAT(names(query("SELECT * FROM Raw_Element WHERE Counter = 1", "DMTF:CQL")),
                UnorderedElementsAre("Raw_Element-1", "Raw_SubElement-1"));
    EXPECT_EQ(query("select * from Raw_Element", "cql").rc(), CMPI_RC_OK);
}

TEST_F(ExecQueryTest, UnknownQueryLanguageIsRefused) {
    Reply reply = query("SELECT * FROM Raw_Element", "XPath");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED);
    EXPECT_EQ(reply.message(), "query language XPath is not supported: use WQL or DMTF:CQL");
}

TEST_F(ExecQueryTest, MalformedQueriesAreInvalid) {
    EXPECT_EQ(query("SELECT * FROM").rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(query("SELECT * FROM Raw_Element WHERE Counter = ").rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(query("SELECT * FROM Raw_Element WHERE (Counter = 1").rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(query("DELETE FROM Raw_Element").rc(), CMPI_RC_ERR_INVALID_QUERY);
}

TEST_F(ExecQueryTest, UnknownClassOrSelectedPropertyIsAnInvalidQuery) {
    Reply unknownClass = query("SELECT * FROM No_Such");
    EXPECT_EQ(unknownClass.rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(unknownClass.message(), "class No_Such not found in root/cimv2");
    Reply unknownProperty = query("SELECT Colour FROM Raw_Element");
    EXPECT_EQ(unknownProperty.rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(unknownProperty.message(), "class Raw_Element has no property Colour");
}

TEST_F(ExecQueryTest, ConcurrentQueriesEachKeepTheirOwnSelection) {
    std::atomic<int> wrong{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([this, t, &wrong] {
            ObjectScope scope;
            const std::string text = "SELECT Counter FROM Raw_Element WHERE Counter = " + std::to_string(t % 2);
            for (int i = 0; i < 25; ++i) {
                Reply reply = query(text.c_str());
                const auto instances = reply.instances();
                if (reply.rc() != CMPI_RC_OK || instances.size() != 2 ||
                    instances.front()->ft->getProperty(instances.front(), "Counter", nullptr).value.uint32 !=
                        static_cast<CMPIUint32>(t % 2)) {
                    ++wrong;
                }
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(wrong.load(), 0);
}

}  // namespace
}  // namespace orv::host::test
