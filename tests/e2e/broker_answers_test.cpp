// The normalisation of the two-broker comparison: what it forgives and what it does not.
#include "broker_answers.hpp"

#include <gtest/gtest.h>

namespace orv::e2e {
namespace {

orv::repository::ClassRepository testClasses() {
    orv::repository::ClassRepository classes;
    classes.loadText(
        "class Test_Base { [Key] string Id; uint16 State = 5; boolean On = true; string Note; };\n"
        "class Test_Other { [Key] string Id; };\n",
        "test.mof");
    return classes;
}

TEST(BrokerAnswers, KeysAreSortedAlsoInsideReferences) {
    EXPECT_EQ(canonicalPath("root/cimv2:Test_Link.B=root/cimv2:Test_Base.Z=\"1\",A=\"2\",A=root/cimv2:Test_Other.Id=\"x\""),
              "root/cimv2:Test_Link.A=root/cimv2:Test_Other.Id=\"x\",B=root/cimv2:Test_Base.A=\"2\",Z=\"1\"");
}

TEST(BrokerAnswers, ReferenceWithEmptyHostIsTheLocalReference) {
    EXPECT_EQ(canonicalPath("/root/cimv2:Test_Other.Id=\"x\""), "root/cimv2:Test_Other.Id=\"x\"");
}

TEST(BrokerAnswers, QuotedCommasAndEqualSignsStayInTheirValue) {
    EXPECT_EQ(canonicalPath("root/cimv2:Test_Base.Z=\"a,B=c\",A=\"\\\"q\\\"\""),
              "root/cimv2:Test_Base.A=\"\\\"q\\\"\",Z=\"a,B=c\"");
}

TEST(BrokerAnswers, NullFilledPropertiesMofDefaultsAndPropertyOrderAreForgiven) {
    const std::string orv = "h/root/cimv2:Test_Base.Id=\"1\"\n-Id=\"1\"\n";
    const std::string sfcb = "h/root/cimv2:Test_Base.Id=\"1\"\n-Note=\n-State=5\n-On=TRUE\n-Id=\"1\"\n";
    EXPECT_EQ(compareAnswers(orv, sfcb, testClasses()), "");
}

TEST(BrokerAnswers, AValueOtherThanTheMofDefaultIsADifference) {
    const std::string orv = "h/root/cimv2:Test_Base.Id=\"1\"\n-Id=\"1\"\n";
    const std::string sfcb = "h/root/cimv2:Test_Base.Id=\"1\"\n-State=6\n-Id=\"1\"\n";
    const std::string difference = compareAnswers(orv, sfcb, testClasses());
    EXPECT_NE(difference.find("object 1 differs"), std::string::npos) << difference;
    EXPECT_NE(difference.find("--- sfcb answered:\n" + sfcb), std::string::npos) << difference;
}

TEST(BrokerAnswers, APropertyOrvCimhostSendsMustComeFromSfcbWithTheSameValue) {
    const std::string orv = "h/root/cimv2:Test_Base.Id=\"1\"\n-Id=\"1\"\n-Note=\"n\"\n";
    EXPECT_NE(compareAnswers(orv, "h/root/cimv2:Test_Base.Id=\"1\"\n-Id=\"1\"\n-Note=\n", testClasses()), "");
    EXPECT_NE(compareAnswers(orv, "h/root/cimv2:Test_Base.Id=\"1\"\n-Id=\"1\"\n-Note=\"m\"\n", testClasses()), "");
}

TEST(BrokerAnswers, ClassesMayComeInAnotherOrderButObjectsOfOneClassMayNot) {
    const std::string a = "h/root/cimv2:Test_Base.Id=\"1\"\nh/root/cimv2:Test_Base.Id=\"2\"\nh/root/cimv2:Test_Other.Id=\"3\"\n";
    const std::string classesSwapped =
        "h/root/cimv2:Test_Other.Id=\"3\"\nh/root/cimv2:Test_Base.Id=\"1\"\nh/root/cimv2:Test_Base.Id=\"2\"\n";
    const std::string objectsSwapped =
        "h/root/cimv2:Test_Base.Id=\"2\"\nh/root/cimv2:Test_Base.Id=\"1\"\nh/root/cimv2:Test_Other.Id=\"3\"\n";
    EXPECT_EQ(compareAnswers(a, classesSwapped, testClasses()), "");
    EXPECT_NE(compareAnswers(a, objectsSwapped, testClasses()), "");
}

TEST(BrokerAnswers, MissingObjectsAndErrorsAreDifferences) {
    const std::string one = "h/root/cimv2:Test_Base.Id=\"1\"\n";
    EXPECT_NE(compareAnswers(one, "", testClasses()).find("1 objects from orv-cimhost, 0 from sfcb"), std::string::npos);
    EXPECT_NE(compareAnswers("*\n* wbemcli: Cim: (7) CIM_ERR_NOT_SUPPORTED\n*\n", "", testClasses()), "");
}

}  // namespace
}  // namespace orv::e2e
