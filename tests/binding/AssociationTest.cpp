// The four association operations OMC::SimpleAssociationMI derives from the
// test link provider's doReferences. Links (Left -> Right): alpha -> beta,
// alpha -> gamma (Test_Link), sub1 -> alpha (Test_StrongLink, sub1 a
// Test_SubElement).
#include "CoreFixture.h"

namespace {

using orv::bindingtest::CoreFixture;
using Names = std::vector<std::string>;

class AssociationTest : public CoreFixture {
protected:
    Names associatorNames(const char* assocClass, const char* resultClass, const char* role,
                          const char* resultRole) {
        orv::host::Reply reply =
            core->associatorNames(path("Test_Element", "alpha"), assocClass, resultClass, role, resultRole);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK);
        EXPECT_TRUE(reply.instances().empty());
        return names(reply);
    }
    // The Note of each returned association (the name of its Right end).
    static Names notes(const orv::host::Reply& reply) {
        Names result;
        for (const CMPIInstance* inst : reply.instances()) result.push_back(property(inst, "Note"));
        return result;
    }
};

TEST_F(AssociationTest, AssociatorNamesWithoutFiltersYieldEveryFarEnd) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, nullptr, nullptr), (Names{"beta", "gamma", "sub1"}));
}

TEST_F(AssociationTest, RoleSelectsAssociationsWhereTheSourcePlaysIt) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, "Left", nullptr), (Names{"beta", "gamma"}));
    EXPECT_EQ(associatorNames(nullptr, nullptr, "Right", nullptr), (Names{"sub1"}));
}

TEST_F(AssociationTest, RoleComparesIgnoringCase) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, "left", nullptr), (Names{"beta", "gamma"}));
}

TEST_F(AssociationTest, ResultRolePicksTheFarEnd) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, nullptr, "Left"), (Names{"sub1"}));
    EXPECT_EQ(associatorNames(nullptr, nullptr, nullptr, "Right"), (Names{"beta", "gamma"}));
}

TEST_F(AssociationTest, RoleAndResultRoleTogether) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, "Left", "Right"), (Names{"beta", "gamma"}));
    EXPECT_EQ(associatorNames(nullptr, nullptr, "Left", "Left"), Names{});
}

TEST_F(AssociationTest, ResultClassKeepsFarEndsOfThatClassOrASubclass) {
    EXPECT_EQ(associatorNames(nullptr, "Test_SubElement", nullptr, nullptr), (Names{"sub1"}));
    EXPECT_EQ(associatorNames(nullptr, "Test_Element", nullptr, nullptr), (Names{"beta", "gamma", "sub1"}));
}

TEST_F(AssociationTest, MismatchedRoleAnswersOkWithNothing) {
    EXPECT_EQ(associatorNames(nullptr, nullptr, "Nobody", nullptr), Names{});
    EXPECT_EQ(associatorNames(nullptr, nullptr, nullptr, "Nobody"), Names{});
}

TEST_F(AssociationTest, AssocClassKeepsAssociationsOfThatClass) {
    EXPECT_EQ(associatorNames("Test_StrongLink", nullptr, nullptr, nullptr), (Names{"sub1"}));
}

TEST_F(AssociationTest, AssociatorsFetchFarEndInstancesWithThePropertyList) {
    orv::host::CallOptions opts;
    opts.properties = std::vector<std::string>{"Label"};
    orv::host::Reply reply =
        core->associators(path("Test_Element", "alpha"), nullptr, "Test_SubElement", nullptr, nullptr, opts);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 1u);
    const CMPIInstance* inst = reply.instances()[0];
    EXPECT_EQ(property(inst, "Label"), "Label of sub1");
    CMPIStatus st{CMPI_RC_OK, nullptr};
    inst->ft->getProperty(inst, "Count", &st);
    EXPECT_NE(st.rc, CMPI_RC_OK);
}

TEST_F(AssociationTest, AssociatorsWithoutFiltersDeliverEveryFarEndInstance) {
    orv::host::Reply reply = core->associators(path("Test_Element", "alpha"), nullptr, nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(names(reply), (Names{"beta", "gamma", "sub1"}));
    ASSERT_EQ(reply.instances().size(), 3u);
    EXPECT_EQ(property(reply.instances()[0], "Label"), "Label of beta");
}

TEST_F(AssociationTest, ReferencesDeliverEveryAssociationInstance) {
    orv::host::Reply reply = core->references(path("Test_Element", "alpha"), nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(notes(reply), (Names{"beta", "gamma", "alpha"}));
}

TEST_F(AssociationTest, ReferencesFilterByRoleAndAssociationClass) {
    EXPECT_EQ(notes(core->references(path("Test_Element", "alpha"), nullptr, "Right")), (Names{"alpha"}));
    EXPECT_EQ(notes(core->references(path("Test_Element", "alpha"), nullptr, "left")), (Names{"beta", "gamma"}));
    EXPECT_EQ(notes(core->references(path("Test_Element", "alpha"), "Test_StrongLink", nullptr)), (Names{"alpha"}));
    EXPECT_EQ(notes(core->references(path("Test_Element", "alpha"), nullptr, "Nobody")), Names{});
}

TEST_F(AssociationTest, ReferencesApplyThePropertyListAndKeepTheReferences) {
    orv::host::CallOptions opts;
    opts.properties = std::vector<std::string>{"Note"};
    orv::host::Reply reply = core->references(path("Test_Element", "alpha"), nullptr, "Left", opts);
    ASSERT_EQ(reply.instances().size(), 2u);
    for (const CMPIInstance* inst : reply.instances()) {
        EXPECT_NE(property(inst, "Note"), "<missing>");
        CMPIStatus st{CMPI_RC_OK, nullptr};
        inst->ft->getProperty(inst, "Weight", &st);
        EXPECT_NE(st.rc, CMPI_RC_OK) << "Weight was not requested";
        CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
        ASSERT_NE(op, nullptr);
        EXPECT_EQ(op->ft->getKeyCount(op, nullptr), 2u);
    }
}

TEST_F(AssociationTest, ReferenceNamesDeliverTheAssociationsPaths) {
    orv::host::Reply reply = core->referenceNames(path("Test_Element", "alpha"), nullptr, "Left");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.instances().empty());
    ASSERT_EQ(reply.objectPaths().size(), 2u);
    for (const CMPIObjectPath* op : reply.objectPaths()) {
        EXPECT_EQ(className(op), "Test_Link");
        CMPIData left = op->ft->getKey(op, "Left", nullptr);
        ASSERT_EQ(left.type, CMPI_ref);
        EXPECT_EQ(key(left.value.ref, "Name"), "alpha");
    }
    CMPIData right = reply.objectPaths()[1]->ft->getKey(reply.objectPaths()[1], "Right", nullptr);
    EXPECT_EQ(key(right.value.ref, "Name"), "gamma");
}

TEST_F(AssociationTest, ReferenceNamesFilterByAssociationClass) {
    orv::host::Reply reply = core->referenceNames(path("Test_Element", "alpha"), "Test_StrongLink", nullptr);
    ASSERT_EQ(reply.objectPaths().size(), 1u);
    EXPECT_EQ(className(reply.objectPaths()[0]), "Test_StrongLink");
}

}  // namespace
