// Association traversal from either end: the role, result role, result class
// and association class filters from a port, and each far end back to its
// port, through the four operations the association base derives.
#include "EthernetFixture.h"

#include <algorithm>

namespace ethernet {
namespace {

using orv::providertest::classNamesOf;
using orv::providertest::keysOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

std::vector<std::string> assocClassesOf(std::initializer_list<std::size_t> rows) {
    std::vector<std::string> names;
    for (std::size_t i : rows) names.emplace_back(farEnds()[i].assocClass);
    return names;
}

std::vector<std::string> farClassesOf(std::initializer_list<std::size_t> rows) {
    std::vector<std::string> names;
    for (std::size_t i : rows) names.emplace_back(farEnds()[i].className);
    return names;
}

// The broker asks the provider once per association class registered for
// it; the calls that get past the filters end with returnDone.
void expectDoneOnEveryCall(const Reply& reply) { EXPECT_GT(reply.doneCount(), 0u); }

class ReferencesTest : public EthernetTest {
protected:
    void SetUp() override { serve(hostWith({nic("vmnic0")})); }

    Reply names(CMPIObjectPath* source, const char* assocClass, const char* resultClass, const char* role,
                const char* resultRole) {
        return core().associatorNames(source, assocClass, resultClass, role, resultRole);
    }
};

TEST_F(ReferencesTest, PortWithoutFiltersHasSevenAssociationsInTableOrder) {
    Reply reply = core().references(portPath("vmnic0"), nullptr, nullptr);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    expectDoneOnEveryCall(reply);
    EXPECT_EQ(classNamesOf(reply), assocClassesOf({0, 1, 2, 3, 4, 5, 6}));
    for (std::size_t i = 0; i < reply.instances().size(); ++i) {
        const FarEnd& row = farEnds()[i];
        EXPECT_EQ(propertiesOf(reply.instances()[i]),
                  (std::vector<NamedValue>{{row.portRole, CMPI_ref, portRefText("vmnic0")},
                                           {row.farRole, CMPI_ref, farEndRefText(row.className, "vmnic0")}}));
    }
}

TEST_F(ReferencesTest, RoleElementInAnyCaseGivesOnlyTheStatisticsAssociation) {
    for (const char* role : {"element", "ELEMENT", "Element"}) {
        Reply reply = core().references(portPath("vmnic0"), nullptr, role);
        EXPECT_EQ(classNamesOf(reply), assocClassesOf({2})) << role;
        expectDoneOnEveryCall(reply);
    }
}

TEST_F(ReferencesTest, EachPortRoleSelectsItsGroup) {
    EXPECT_EQ(classNamesOf(core().references(portPath("vmnic0"), nullptr, "Dependent")), assocClassesOf({0, 1}));
    EXPECT_EQ(classNamesOf(core().references(portPath("vmnic0"), nullptr, "managedelement")),
              assocClassesOf({3, 4, 5, 6}));
}

TEST_F(ReferencesTest, EachResultRoleNarrowsToItsGroup) {
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, nullptr, nullptr, "Antecedent")),
              farClassesOf({0, 1}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, nullptr, nullptr, "Stats")), farClassesOf({2}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, nullptr, "ManagedElement", "SettingData")),
              farClassesOf({3, 4, 5, 6}));
}

TEST_F(ReferencesTest, RolesThatFitButExcludeEachOtherStillEndWithDone) {
    Reply reply = names(portPath("vmnic0"), nullptr, nullptr, "Dependent", "Stats");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    expectDoneOnEveryCall(reply);
}

TEST_F(ReferencesTest, ExcludingRolesOnAPortWithoutDeviceIdAreAnInvalidParameter) {
    Reply reply = names(portPathWithoutDeviceId(), nullptr, nullptr, "Dependent", "Stats");
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(reply.message(), "DeviceID specified is not valid");
    EXPECT_TRUE(reply.items().empty());
}

TEST_F(ReferencesTest, UnknownRoleOrResultRoleAnswersOkWithNothingAndNoDone) {
    for (const auto& [role, resultRole] : std::vector<std::pair<const char*, const char*>>{
             {"Antecedent", nullptr}, {nullptr, "Dependent"}, {"Bogus", nullptr}, {"Element", "Bogus"}}) {
        Reply reply = names(portPath("vmnic0"), nullptr, nullptr, role, resultRole);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK);
        EXPECT_TRUE(reply.items().empty());
        EXPECT_EQ(reply.doneCount(), 0u) << (role ? role : "-") << " " << (resultRole ? resultRole : "-");
    }
}

TEST_F(ReferencesTest, ResultClassKeepsFarEndsOfThatClassOrItsSubclasses) {
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, "CIM_SettingData", nullptr, nullptr)),
              farClassesOf({3, 4, 5, 6}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, "CIM_SoftwareIdentity", nullptr, nullptr)),
              farClassesOf({0, 1}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), nullptr, "Orvane_EPRingPresetSettingData", nullptr, nullptr)),
              farClassesOf({6}));
    Reply none = names(portPath("vmnic0"), nullptr, "CIM_EthernetPort", nullptr, nullptr);
    EXPECT_TRUE(none.items().empty());
    expectDoneOnEveryCall(none);
}

TEST_F(ReferencesTest, AssociationClassKeepsAssociationsOfThatClassOrItsSubclasses) {
    EXPECT_EQ(classNamesOf(core().references(portPath("vmnic0"), "CIM_ElementSettingData", nullptr)),
              assocClassesOf({3, 4, 5, 6}));
    EXPECT_EQ(classNamesOf(core().references(portPath("vmnic0"), "CIM_Statistics", nullptr)), assocClassesOf({2}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), "CIM_ElementSoftwareIdentity", nullptr, "Dependent", nullptr)),
              farClassesOf({0, 1}));
    EXPECT_EQ(classNamesOf(names(portPath("vmnic0"), "Orvane_EPStatistics", "CIM_SettingData", nullptr, nullptr)),
              std::vector<std::string>{});
}

TEST_F(ReferencesTest, PortThatDoesNotExistStillHasItsAssociations) {
    EXPECT_EQ(classNamesOf(core().referenceNames(portPath("vmnic7"), nullptr, nullptr)),
              assocClassesOf({0, 1, 2, 3, 4, 5, 6}));
}

TEST_F(ReferencesTest, EachFarEndLinksBackToItsPortOnly) {
    for (std::size_t i = 0; i < farEnds().size(); ++i) {
        const FarEnd& row = farEnds()[i];
        CMPIObjectPath* source = farEndPath(row.className, instanceId(row.className, "vmnic0"));
        Reply reply = core().references(source, nullptr, nullptr);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK);
        expectDoneOnEveryCall(reply);
        ASSERT_EQ(reply.instances().size(), 1u) << row.className;
        EXPECT_EQ(propertiesOf(reply.instances()[0]),
                  (std::vector<NamedValue>{{row.portRole, CMPI_ref, portRefText("vmnic0")},
                                           {row.farRole, CMPI_ref, farEndRefText(row.className, "vmnic0")}}));
        EXPECT_EQ(classNamesOf(core().references(source, nullptr, row.farRole)), assocClassesOf({i}));
        EXPECT_EQ(classNamesOf(names(source, nullptr, "CIM_EthernetPort", row.farRole, row.portRole)),
                  std::vector<std::string>{kPort});
    }
}

TEST_F(ReferencesTest, FarEndFiltersThatDoNotFitAnswerOkWithNothingAndNoDone) {
    for (const FarEnd& row : farEnds()) {
        CMPIObjectPath* source = farEndPath(row.className, instanceId(row.className, "vmnic0"));
        std::vector<Reply> replies;
        replies.push_back(names(source, nullptr, nullptr, row.portRole, nullptr));
        replies.push_back(names(source, nullptr, nullptr, nullptr, row.farRole));
        replies.push_back(names(source, nullptr, "CIM_SettingData", nullptr, nullptr));
        for (const Reply& reply : replies) {
            EXPECT_EQ(reply.rc(), CMPI_RC_OK) << row.className;
            EXPECT_TRUE(reply.items().empty()) << row.className;
            EXPECT_EQ(reply.doneCount(), 0u) << row.className;
        }
    }
}

// From a far end the association class filter is not looked at by the
// provider; the association base still passes over what does not match.
TEST_F(ReferencesTest, FarEndIgnoresTheAssociationClassButTheBaseFiltersIt) {
    CMPIObjectPath* source = farEndPath("Orvane_EPStatisticalInformation", "a:b:vmnic0");
    Reply reply = names(source, "CIM_ElementSettingData", nullptr, nullptr, nullptr);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    expectDoneOnEveryCall(reply);
}

TEST_F(ReferencesTest, StatisticsWithAnyPrefixLinkToThePortAfterTheLastColon) {
    Reply reply = core().referenceNames(farEndPath("Orvane_EPStatisticalInformation", "x:y:port7"), nullptr, nullptr);
    ASSERT_EQ(reply.objectPaths().size(), 1u);
    const std::vector<NamedValue> keys = keysOf(reply.objectPaths()[0]);
    EXPECT_NE(std::find(keys.begin(), keys.end(), NamedValue{"Element", CMPI_ref, portRefText("port7")}), keys.end());
}

TEST_F(ReferencesTest, InstanceIdEndingInColonLinksToAnEmptyDeviceId) {
    Reply reply = core().referenceNames(farEndPath("Orvane_EPCoalesceSettingData", "Orvane:x:"), nullptr, nullptr);
    ASSERT_EQ(reply.objectPaths().size(), 1u);
    EXPECT_EQ(keysOf(reply.objectPaths()[0])[0], (NamedValue{"ManagedElement", CMPI_ref, portRefText("")}));
}

TEST_F(ReferencesTest, InstanceIdWithoutColonIsAnInvalidParameter) {
    for (const FarEnd& row : farEnds()) {
        Reply reply = core().references(farEndPath(row.className, "vmnic0"), nullptr, nullptr);
        EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_PARAMETER) << row.className;
        EXPECT_EQ(reply.message(), "DeviceID specified is not valid");
        EXPECT_TRUE(reply.items().empty());
    }
}

TEST_F(ReferencesTest, AssociatorsFetchEachFarEndInstanceFromThePort) {
    Reply reply = core().associators(portPath("vmnic0"), nullptr, nullptr, nullptr, nullptr);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(classNamesOf(reply), farClassesOf({0, 1, 2, 3, 4, 5, 6}));
    ASSERT_EQ(reply.instances().size(), 7u);
    EXPECT_EQ(propertyOf(reply.instances()[0], "VersionString")->text, "e1000e driver 3.2");
    EXPECT_EQ(propertyOf(reply.instances()[6], "rx")->text, "4096");
}

TEST_F(ReferencesTest, AssociatorsFromAFarEndFetchThePort) {
    Reply reply = core().associators(farEndPath("Orvane_EPRingCurrentSettingData", "Orvane:q:vmnic0"), nullptr,
                                     nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyOf(reply.instances()[0], "PermanentAddress")->text, "0A1B2C3D4E5F");
}

TEST_F(ReferencesTest, AssociatorNamesAndReferenceNamesArePaths) {
    Reply farNames = names(portPath("vmnic0"), nullptr, nullptr, nullptr, nullptr);
    ASSERT_EQ(farNames.objectPaths().size(), 7u);
    EXPECT_EQ(keysOf(farNames.objectPaths()[2]),
              (std::vector<NamedValue>{
                  {"InstanceID", CMPI_string, instanceId("Orvane_EPStatisticalInformation", "vmnic0")}}));
    Reply refNames = core().referenceNames(portPath("vmnic0"), nullptr, "ManagedElement");
    ASSERT_EQ(refNames.objectPaths().size(), 4u);
    EXPECT_EQ(keysOf(refNames.objectPaths()[0]),
              (std::vector<NamedValue>{{"ManagedElement", CMPI_ref, portRefText("vmnic0")},
                                       {"SettingData", CMPI_ref,
                                        farEndRefText("Orvane_EPCoalesceSettingData", "vmnic0")}}));
}

}  // namespace
}  // namespace ethernet
