// A property declared again in a subclass with another type than the one it
// inherits: accepted (the subclass's type wins), and reported as a warning.
#include <gtest/gtest.h>

#include "test_support.hpp"

namespace orv::repository {
namespace {

using testing::loaded;

constexpr std::string_view kParent = "class P {\n  [Key] string Name;\n  boolean AutoSense;\n  P REF Peer;\n};\n";

TEST(InheritedPropertyType, TypeChangeIsAWarningAndTheSubclassTypeWins) {
    const ClassRepository repo =
        loaded(std::string(kParent) + "class C : P {\n  uint16 AutoSense;\n};\n", "x.mof");
    ASSERT_EQ(repo.warnings().size(), 1u);
    EXPECT_EQ(repo.warnings().front(),
              "x.mof:7: property C.AutoSense is uint16 but overrides AutoSense of P, which is boolean; "
              "an inherited property cannot change its type");
    const PropertyDecl* property = repo.getClass(kDefaultNamespace, "C")->findProperty("AutoSense");
    ASSERT_NE(property, nullptr);
    EXPECT_EQ(property->type.type, CimType::Uint16);
    EXPECT_EQ(property->classOrigin, "C");
}

TEST(InheritedPropertyType, ScalarToArrayIsATypeChange) {
    const ClassRepository repo = loaded(std::string(kParent) + "class C : P {\n  boolean AutoSense[];\n};\n");
    ASSERT_EQ(repo.warnings().size(), 1u);
    EXPECT_NE(repo.warnings().front().find("is boolean[] but overrides AutoSense of P, which is boolean;"),
              std::string::npos)
        << repo.warnings().front();
}

TEST(InheritedPropertyType, SameTypeAndNarrowedReferenceAreNoWarning) {
    const ClassRepository repo = loaded(std::string(kParent) +
                                        "class C : P {\n  [Description(\"again\")] boolean AutoSense;\n"
                                        "  C REF Peer;\n};\n");
    EXPECT_TRUE(repo.warnings().empty());
}

TEST(InheritedPropertyType, OverrideQualifierNamingAnotherTypedPropertyWarns) {
    const ClassRepository repo =
        loaded(std::string(kParent) + "class C : P {\n  [Override(\"AutoSense\")] string Sense;\n};\n");
    ASSERT_EQ(repo.warnings().size(), 1u);
    EXPECT_EQ(repo.warnings().front(),
              "t.mof:7: property C.Sense is string but overrides AutoSense of P, which is boolean; "
              "an inherited property cannot change its type");
}

TEST(InheritedPropertyType, AFailedLoadKeepsNoWarningOfIt) {
    ClassRepository repo;
    EXPECT_THROW(repo.loadText(std::string(kParent) + "class C : P {\n  uint16 AutoSense;\n};\nclass C {};\n", "t.mof"),
                 MofError);
    EXPECT_TRUE(repo.warnings().empty());
}

// The one known deviation of the shipped classes: Orvane_EthernetPort.AutoSense is
// uint16 (its provider serves numbers) where CIM_NetworkPort declares a boolean.
TEST(InheritedPropertyType, ShippedClassesHaveExactlyTheKnownAutoSenseDeviation) {
    ClassRepository repo;
    repo.loadFile(testing::sourceDir() / "cim/mof/orvprovider.mof");
    ASSERT_EQ(repo.warnings().size(), 1u);
    const std::string& line = repo.warnings().front();
    EXPECT_NE(line.find("EthernetPort.mof:24: property Orvane_EthernetPort.AutoSense is uint16 but overrides "
                        "AutoSense of CIM_NetworkPort, which is boolean;"),
              std::string::npos)
        << line;
}

}  // namespace
}  // namespace orv::repository
