// WQL queries: parsing, FROM with inheritance, WHERE with AND, OR, NOT,
// parentheses, NULL tests and ISA on embedded instances.
#include "core_fixture.hpp"
#include "orv/host/wql.hpp"

namespace orv::host::test {
namespace {

class WqlTest : public CoreTest {
protected:
    CMPIInstance* element(const char* cls = "Raw_Element") {
        return mb()->eft->newInstance(mb(), path(cls, "n"), nullptr);
    }
    static void setUint(CMPIInstance* inst, const char* name, CMPIUint32 value) {
        inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint32);
    }
    static void setText(CMPIInstance* inst, const char* name, const char* value) {
        inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
    }
    static bool matches(const char* query, const CMPIInstance* inst) { return WqlQuery::parse(query).matches(inst); }
};

TEST_F(WqlTest, FromClassMatchesTheClassAndItsSubclassesOnly) {
    EXPECT_TRUE(matches("SELECT * FROM Raw_Base", element("Raw_SubElement")));
    EXPECT_TRUE(matches("select * from raw_element", element("Raw_Element")));
    EXPECT_FALSE(matches("SELECT * FROM Raw_SubElement", element("Raw_Element")));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element", element("Raw_OtherSub")));
}

TEST_F(WqlTest, SelectListAndFromClassAreKept) {
    WqlQuery query = WqlQuery::parse("SELECT Name, Counter FROM Raw_Element WHERE Counter > 1");
    EXPECT_EQ(query.fromClass(), "Raw_Element");
    EXPECT_THAT(query.selectList(), ::testing::ElementsAre("Name", "Counter"));
    EXPECT_EQ(query.text(), "SELECT Name, Counter FROM Raw_Element WHERE Counter > 1");
    EXPECT_TRUE(WqlQuery::parse("SELECT * FROM Raw_Element").selectList().empty());
}

TEST_F(WqlTest, AndBindsTighterThanOrAndParenthesesRegroup) {
    CMPIInstance* inst = element();
    setUint(inst, "Counter", 1);
    setText(inst, "Text", "b");
    // Counter = 2 AND Text = 'a' OR Text = 'b' is (Counter = 2 AND Text = 'a') OR Text = 'b'.
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Counter = 2 AND Text = 'a' OR Text = 'b'", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE Counter = 2 AND (Text = 'a' OR Text = 'b')", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE (Counter = 1 OR Counter = 2) AND (Text = 'a' OR Text = 'b')",
                        inst));
}

TEST_F(WqlTest, LiteralBeforeThePropertyComparesTheOtherWayRound) {
    CMPIInstance* inst = element();
    setUint(inst, "Counter", 5);
    setText(inst, "Text", "m");
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE 3 < Counter", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE 5 > Counter", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE 5 >= Counter AND 5 <= Counter AND 5 = Counter", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE 'z' > Text AND NOT 'a' > Text", inst));
    EXPECT_THROW(WqlQuery::parse("SELECT * FROM Raw_Element WHERE 'm%' LIKE Text"), WqlError);
    EXPECT_THROW(WqlQuery::parse("SELECT * FROM Raw_Element WHERE 3 < 4"), WqlError);
}

TEST_F(WqlTest, NotNegatesComparisonsGroupsAndNullTests) {
    CMPIInstance* inst = element();
    setUint(inst, "Counter", 5);
    setText(inst, "Text", "abc");
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE NOT Counter < 5", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE NOT Counter >= 5", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE NOT (Counter = 1 OR Text LIKE 'x%')", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE NOT (Counter = 5 AND Text LIKE 'a%')", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE NOT NOT Counter = 5", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE NOT Ratio IS NOT NULL", inst));
}

TEST_F(WqlTest, ComparisonWithANullPropertyIsFalseAndSoIsItsNegation) {
    CMPIInstance* inst = element();
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE Counter = 3", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE NOT Counter = 3", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Counter IS NULL", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE Counter IS NOT NULL", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Name IS NOT NULL", inst));  // the key from the path
}

TEST_F(WqlTest, NumbersCompareNumericallyAndBooleansIgnoreCase) {
    CMPIInstance* inst = element();
    setUint(inst, "Counter", 10);
    CMPIBoolean yes = 1;
    inst->ft->setProperty(inst, "Flag", reinterpret_cast<const CMPIValue*>(&yes), CMPI_boolean);
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Counter > 9", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Counter <> 9.5", inst));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Element WHERE Flag = TRUE", inst));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Element WHERE Flag = false", inst));
}

TEST_F(WqlTest, IsaTestsTheClassOfAnEmbeddedInstance) {
    CMPIInstance* indication = mb()->eft->newInstance(mb(), path("Raw_Indication"), nullptr);
    CMPIInstance* source = element("Raw_SubElement");
    indication->ft->setProperty(indication, "Message", reinterpret_cast<const CMPIValue*>(&source), CMPI_instance);
    EXPECT_TRUE(matches("SELECT * FROM Raw_Indication WHERE Message ISA Raw_Base", indication));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Indication WHERE Message ISA Raw_SubElement", indication));
    EXPECT_FALSE(matches("SELECT * FROM Raw_Indication WHERE Message ISA Raw_OtherSub", indication));
    EXPECT_TRUE(matches("SELECT * FROM Raw_Indication WHERE NOT Message ISA Raw_OtherSub", indication));
    // A property that holds no embedded instance is of no class.
    EXPECT_FALSE(matches("SELECT * FROM Raw_Indication WHERE Sequence ISA Raw_Base", indication));
}

TEST_F(WqlTest, BadQueriesSayWhatWasExpected) {
    auto error = [](const char* query) {
        try {
            WqlQuery::parse(query);
        } catch (const WqlError& e) {
            return std::string(e.what());
        }
        return std::string("parsed");
    };
    EXPECT_EQ(error("SELECT * FROM"), "expected a class name after FROM at the end");
    EXPECT_EQ(error("SELECT * FROM X WHERE (A = 1"), "expected ')' at the end");
    EXPECT_EQ(error("SELECT * FROM X WHERE A = 1 B"), "expected the end of the query before 'B'");
    EXPECT_EQ(error("SELECT * FROM X WHERE NOT"), "expected a property name at the end");
    EXPECT_EQ(error("DELETE FROM X"), "expected SELECT before 'DELETE'");
}

TEST_F(WqlTest, ConditionWithTooManyAlternativesIsRefused) {
    std::string query = "SELECT * FROM X WHERE A = 0";
    for (int i = 1; i < 10; ++i) {
        query += " AND (B" + std::to_string(i) + " = 1 OR C" + std::to_string(i) + " = 2)";
    }
    EXPECT_THROW(WqlQuery::parse(query), WqlError);  // 2^9 alternatives
    EXPECT_NO_THROW(WqlQuery::parse("SELECT * FROM X WHERE (A = 1 OR B = 2) AND (C = 3 OR D = 4)"));
}

}  // namespace
}  // namespace orv::host::test
