// Select expressions: the query, its conditions and evaluation.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using QueryTest = CoreTest;

TEST_F(QueryTest, SelectExpressionKeepsTheQueryAndProjection) {
    CMPIArray* projection = nullptr;
    CMPIStatus rc{};
    CMPISelectExp* se = mb()->eft->newSelectExp(mb(), "SELECT Name, Text FROM Raw_Element", "WQL", &projection, &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(text(se->ft->getString(se, nullptr)), "SELECT Name, Text FROM Raw_Element");
    ASSERT_NE(projection, nullptr);
    EXPECT_EQ(projection->ft->getSize(projection, nullptr), 2U);
    EXPECT_EQ(text(projection->ft->getElementAt(projection, 1, nullptr).value.string), "Text");
    EXPECT_EQ(mb()->eft->newSelectExp(mb(), "SELECT * FROM X", "XPath", nullptr, &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED);
    EXPECT_EQ(mb()->eft->newSelectExp(mb(), "SELECT * WHERE", "WQL", nullptr, &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_NE(rc.msg, nullptr);
}

TEST_F(QueryTest, EvaluateChecksClassAndWhereClause) {
    CMPISelectExp* se = mb()->eft->newSelectExp(
        mb(), "SELECT * FROM Raw_Base WHERE Counter > 3 AND Text LIKE 'ab%' OR Name = 'special'", "WQL", nullptr,
        nullptr);
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_SubElement", "n"), nullptr);
    CMPIUint32 counter = 4;
    inst->ft->setProperty(inst, "Counter", reinterpret_cast<const CMPIValue*>(&counter), CMPI_uint32);
    inst->ft->setProperty(inst, "Text", reinterpret_cast<const CMPIValue*>("abc"), CMPI_chars);
    EXPECT_TRUE(se->ft->evaluate(se, inst, nullptr));
    counter = 2;
    inst->ft->setProperty(inst, "Counter", reinterpret_cast<const CMPIValue*>(&counter), CMPI_uint32);
    EXPECT_FALSE(se->ft->evaluate(se, inst, nullptr));
    inst->ft->setProperty(inst, "Name", reinterpret_cast<const CMPIValue*>("special"), CMPI_chars);
    EXPECT_TRUE(se->ft->evaluate(se, inst, nullptr));
    CMPIInstance* other = mb()->eft->newInstance(mb(), path("Raw_Assoc"), nullptr);
    EXPECT_FALSE(se->ft->evaluate(se, other, nullptr));
}

TEST_F(QueryTest, ConditionsInDisjunctiveNormalForm) {
    CMPISelectExp* se = mb()->eft->newSelectExp(mb(), "SELECT * FROM Raw_Base WHERE A = 1 AND B <> 'x' OR C IS NULL",
                                                "WQL", nullptr, nullptr);
    CMPISelectCond* doc = se->ft->getDOC(se, nullptr);
    int type = -1;
    EXPECT_EQ(doc->ft->getCountAndType(doc, &type, nullptr), 2U);
    EXPECT_EQ(type, CMPI_COND_DOC);
    CMPISubCond* first = doc->ft->getSubCondAt(doc, 0, nullptr);
    EXPECT_EQ(first->ft->getCount(first, nullptr), 2U);
    CMPIPredicate* b = first->ft->getPredicate(first, "B", nullptr);
    CMPIType ptype = 0;
    CMPIPredOp op{};
    CMPIString* lhs = nullptr;
    CMPIString* rhs = nullptr;
    ASSERT_EQ(b->ft->getData(b, &ptype, &op, &lhs, &rhs).rc, CMPI_RC_OK);
    EXPECT_EQ(op, CMPI_PredOp_NotEquals);
    EXPECT_EQ(ptype, CMPI_charString);
    EXPECT_EQ(text(lhs), "B");
    EXPECT_EQ(text(rhs), "x");
    CMPIPredicate* a = first->ft->getPredicateAt(first, 0, nullptr);
    a->ft->getData(a, &ptype, &op, nullptr, nullptr);
    EXPECT_EQ(ptype, CMPI_numericString);
    CMPIStatus rc{};
    EXPECT_EQ(se->ft->getCOD(se, &rc), nullptr);  // not expressible exactly here
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    CMPISelectExp* single = mb()->eft->newSelectExp(mb(), "SELECT * FROM Raw_Base WHERE A = 1 AND B = 2", "WQL",
                                                    nullptr, nullptr);
    CMPISelectCond* cod = single->ft->getCOD(single, nullptr);
    EXPECT_EQ(cod->ft->getCountAndType(cod, &type, nullptr), 2U);
    EXPECT_EQ(type, CMPI_COND_COD);
}

CMPIData counterAccessor(const char* name, void* parm) {
    CMPIData data{};
    if (std::string(name) == "Counter") {
        data.type = CMPI_uint32;
        data.value.uint32 = *static_cast<CMPIUint32*>(parm);
    } else {
        data.state = CMPI_notFound;
    }
    return data;
}

TEST_F(QueryTest, EvaluationThroughAnAccessor) {
    CMPISelectExp* se = mb()->eft->newSelectExp(mb(), "SELECT * FROM Raw_Base WHERE Counter = 7", "WQL", nullptr,
                                                nullptr);
    CMPIUint32 value = 7;
    EXPECT_TRUE(se->ft->evaluateUsingAccessor(se, counterAccessor, &value, nullptr));
    value = 8;
    EXPECT_FALSE(se->ft->evaluateUsingAccessor(se, counterAccessor, &value, nullptr));
    CMPISelectCond* doc = se->ft->getDOC(se, nullptr);
    CMPISubCond* sub = doc->ft->getSubCondAt(doc, 0, nullptr);
    CMPIPredicate* predicate = sub->ft->getPredicateAt(sub, 0, nullptr);
    value = 7;
    EXPECT_TRUE(predicate->ft->evaluateUsingAccessor(predicate, counterAccessor, &value, nullptr));
    CMPIPredicate* copy = predicate->ft->clone(predicate, nullptr);
    EXPECT_EQ(copy->ft->release(copy).rc, CMPI_RC_OK);
}

}  // namespace
}  // namespace orv::host::test
