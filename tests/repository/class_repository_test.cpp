// Lookups, inheritance, overrides, keys and class enumeration.
#include <gtest/gtest.h>

#include <atomic>
#include <cctype>
#include <thread>
#include <vector>

#include "test_support.hpp"

namespace orv::repository {
namespace {

using testing::loaded;
using Names = std::vector<std::string>;

constexpr std::string_view kNs = "root/cimv2";

constexpr std::string_view kFamily = R"(
Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);
Qualifier Association : boolean = false, Scope(association), Flavor(DisableOverride, ToSubclass);
Qualifier Indication : boolean = false, Scope(class, indication), Flavor(DisableOverride, ToSubclass);
Qualifier Abstract : boolean = false, Scope(class, association, indication), Flavor(Restricted);
Qualifier Override : string = null, Scope(property, reference, method), Flavor(Restricted);
Qualifier Description : string = null, Scope(any);
Qualifier Secret : string = null, Scope(any), Flavor(Restricted);
Qualifier Write : boolean = false, Scope(property);

[Abstract, Description("root")]
class Base_Element {
    [Key, Description("id")] string InstanceID;
    string Caption = "base caption";
    [Secret("s")] string ElementName;
    uint32 Reset();
};
class Base_Device : Base_Element {
    [Key] string DeviceID;
    [Override("Caption"), Write] string Caption;
    uint16 Speed;
};
class Base_Port : Base_Device {
    [Key] string SystemName;
    [Override("InstanceID")] string InstanceID = "port";
    uint32 Reset();
    string Extra;
};
class Base_Other : Base_Element { };
class Base_Root2 { };
[Association] class Base_Link { [Key] Base_Element REF Left; [Key] Base_Device REF Right; };
class Base_SubLink : Base_Link { uint8 Weight; };
[Indication] class Base_Event { string Text; };
class Base_SubEvent : Base_Event { };
)";

class RepositoryFixture : public ::testing::Test {
protected:
    ClassRepository repo = loaded(kFamily);
    const ClassDecl& cls(std::string_view name) {
        const ClassDecl* c = repo.getClass(kNs, name);
        EXPECT_NE(c, nullptr) << name;
        return *c;
    }
};

Names names(const std::vector<PropertyDecl>& props) {
    Names out;
    for (const auto& p : props) {
        out.push_back(p.name);
    }
    return out;
}

TEST_F(RepositoryFixture, LookupIgnoresCaseAndReturnsDeclaredSpelling) {
    EXPECT_EQ(repo.getClass(kNs, "BASE_PORT")->name, "Base_Port");
    EXPECT_EQ(repo.getClass("ROOT/CIMV2", "base_port")->name, "Base_Port");
    EXPECT_EQ(repo.getClass("/root/cimv2/", "Base_Port")->name, "Base_Port");
    EXPECT_EQ(repo.getClass(kNs, "Base_Nothing"), nullptr);
    EXPECT_EQ(repo.getClass("root/other", "Base_Port"), nullptr);
    EXPECT_TRUE(repo.hasNamespace("Root/CIMV2"));
    EXPECT_FALSE(repo.hasNamespace("root/other"));
    EXPECT_EQ(repo.namespaces(), Names{"root/cimv2"});
    EXPECT_NE(cls("base_port").findProperty("SYSTEMNAME"), nullptr);
}

// Every property is found by its declared spelling, by any other spelling and through a
// copy of the class; a name the class does not declare is not, whatever its hash.
TEST_F(RepositoryFixture, PropertyFoundAsDeclaredInAnyCaseAndInACopy) {
    const ClassDecl copy = cls("Base_Port");
    for (const ClassDecl* port : {&cls("Base_Port"), &copy}) {
        for (const PropertyDecl& p : port->properties) {
            EXPECT_EQ(port->findProperty(p.name), &p) << p.name;
            std::string upper = p.name;
            for (char& c : upper) {
                c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
            }
            EXPECT_EQ(port->findProperty(upper), &p) << upper;
        }
        for (std::string_view absent : {"", "Speed2", "Spee", "Base_Port", "DeviceId_", "x"}) {
            EXPECT_EQ(port->findProperty(absent), nullptr) << absent;
        }
    }
    EXPECT_GT(copy.propertySlots.size(), copy.properties.size());
}

// A class built by hand (never indexed) or changed after indexing is still searched.
TEST(ClassDeclLookup, UnindexedOrOutdatedClassIsScanned) {
    ClassDecl cls;
    cls.properties.push_back(PropertyDecl{});
    cls.properties.back().name = "First";
    EXPECT_EQ(cls.findProperty("first"), &cls.properties.back());
    cls.indexProperties();
    for (int i = 0; i < 8; ++i) {
        cls.properties.push_back(PropertyDecl{});
        cls.properties.back().name = "Added" + std::to_string(i);
    }
    EXPECT_EQ(cls.findProperty("Added7"), &cls.properties.back());
    EXPECT_EQ(cls.findProperty("First"), &cls.properties.front());
    EXPECT_EQ(cls.findProperty("Other"), nullptr);
}

TEST_F(RepositoryFixture, EffectivePropertiesInheritedFirstInParentOrder) {
    EXPECT_EQ(names(cls("Base_Port").properties),
              (Names{"InstanceID", "Caption", "ElementName", "DeviceID", "Speed", "SystemName", "Extra"}));
    EXPECT_EQ(names(cls("Base_Port").ownProperties), (Names{"SystemName", "InstanceID", "Extra"}));
}

TEST_F(RepositoryFixture, OverrideReplacesInPlaceWithNewOriginAndInheritedDefault) {
    const ClassDecl& port = cls("Base_Port");
    const PropertyDecl* id = port.findProperty("InstanceID");
    EXPECT_EQ(id->classOrigin, "Base_Port");
    EXPECT_FALSE(id->propagated);
    EXPECT_EQ(id->defaultValue, Value::scalar(std::string("port")));
    const PropertyDecl* caption = port.findProperty("Caption");
    EXPECT_EQ(caption->classOrigin, "Base_Device");
    EXPECT_TRUE(caption->propagated);
    EXPECT_TRUE(caption->qualifiers.isTrue("Write"));
    // Base_Device overrode Caption without a default: the parent's stays.
    EXPECT_EQ(cls("Base_Device").findProperty("Caption")->defaultValue,
              Value::scalar(std::string("base caption")));
    const PropertyDecl* speed = port.findProperty("Speed");
    EXPECT_EQ(speed->classOrigin, "Base_Device");
    EXPECT_TRUE(speed->propagated);
}

TEST_F(RepositoryFixture, QualifiersPropagateByFlavor) {
    const ClassDecl& device = cls("Base_Device");
    EXPECT_EQ(device.qualifiers.stringValue("Description"), "root");
    EXPECT_TRUE(device.qualifiers.find("Description")->propagated);
    EXPECT_EQ(device.qualifiers.find("Abstract"), nullptr);
    EXPECT_TRUE(cls("Base_Element").isAbstract);
    EXPECT_FALSE(device.isAbstract);
    EXPECT_EQ(device.findProperty("ElementName")->qualifiers.find("Secret"), nullptr);
    EXPECT_NE(cls("Base_Element").findProperty("ElementName")->qualifiers.find("Secret"), nullptr);
    EXPECT_EQ(device.findProperty("InstanceID")->qualifiers.stringValue("Description"), "id");
    // Override is Restricted: the overriding class has it, its heirs do not.
    EXPECT_NE(device.findProperty("Caption")->qualifiers.find("Override"), nullptr);
    EXPECT_EQ(cls("Base_Port").findProperty("Caption")->qualifiers.find("Override"), nullptr);
}

TEST_F(RepositoryFixture, KeysIncludeInheritedOnesInSchemaOrder) {
    EXPECT_EQ(repo.keyNames(kNs, "base_port"), (Names{"InstanceID", "DeviceID", "SystemName"}));
    EXPECT_EQ(repo.keyNames(kNs, "Base_Element"), Names{"InstanceID"});
    EXPECT_TRUE(cls("Base_Port").findProperty("InstanceID")->key);
    EXPECT_FALSE(cls("Base_Port").findProperty("Extra")->key);
    EXPECT_EQ(repo.keyNames(kNs, "Base_Link"), (Names{"Left", "Right"}));
    EXPECT_TRUE(repo.keyNames(kNs, "Nope").empty());
}

TEST_F(RepositoryFixture, MethodsInheritAndOverride) {
    const ClassDecl& port = cls("Base_Port");
    ASSERT_EQ(port.methods.size(), 1U);
    EXPECT_EQ(port.methods[0].classOrigin, "Base_Port");
    EXPECT_FALSE(port.methods[0].propagated);
    const MethodDecl* inherited = cls("Base_Device").findMethod("reset");
    ASSERT_NE(inherited, nullptr);
    EXPECT_EQ(inherited->classOrigin, "Base_Element");
    EXPECT_TRUE(inherited->propagated);
}

TEST_F(RepositoryFixture, IsAAndSuperclassChain) {
    EXPECT_TRUE(repo.isA(kNs, "base_port", "BASE_ELEMENT"));
    EXPECT_TRUE(repo.isA(kNs, "Base_Port", "Base_Port"));
    EXPECT_FALSE(repo.isA(kNs, "Base_Element", "Base_Port"));
    EXPECT_FALSE(repo.isA(kNs, "Base_Other", "Base_Device"));
    EXPECT_FALSE(repo.isA(kNs, "Base_Port", "Unknown"));
    EXPECT_FALSE(repo.isA(kNs, "Unknown", "Base_Element"));
    EXPECT_EQ(repo.superclassChain(kNs, "base_port"), (Names{"Base_Device", "Base_Element"}));
    EXPECT_TRUE(repo.superclassChain(kNs, "Base_Element").empty());
}

TEST_F(RepositoryFixture, SubclassesDirectAndDeep) {
    EXPECT_EQ(repo.subclasses(kNs, "base_element", false), (Names{"Base_Device", "Base_Other"}));
    EXPECT_EQ(repo.subclasses(kNs, "Base_Element", true), (Names{"Base_Device", "Base_Port", "Base_Other"}));
    EXPECT_TRUE(repo.subclasses(kNs, "Base_Port", true).empty());
    EXPECT_TRUE(repo.subclasses(kNs, "Unknown", true).empty());
}

TEST_F(RepositoryFixture, ClassNamesFollowEnumerateClassNames) {
    EXPECT_EQ(repo.classNames(kNs, "", false), (Names{"Base_Element", "Base_Root2", "Base_Link", "Base_Event"}));
    EXPECT_EQ(repo.classNames(kNs, "", true),
              (Names{"Base_Element", "Base_Device", "Base_Port", "Base_Other", "Base_Root2", "Base_Link",
                     "Base_SubLink", "Base_Event", "Base_SubEvent"}));
    EXPECT_EQ(repo.classNames(kNs, "Base_Device", false), Names{"Base_Port"});
    EXPECT_TRUE(repo.classNames("root/none", "", true).empty());
}

TEST_F(RepositoryFixture, AssociationsIndicationsAndTheirReferences) {
    EXPECT_TRUE(repo.isAssociation(kNs, "BASE_LINK"));
    EXPECT_TRUE(repo.isAssociation(kNs, "Base_SubLink"));
    EXPECT_FALSE(repo.isAssociation(kNs, "Base_Port"));
    EXPECT_TRUE(repo.isIndication(kNs, "base_subevent"));
    EXPECT_FALSE(repo.isIndication(kNs, "Base_Link"));
    const auto refs = repo.referenceProperties(kNs, "Base_SubLink");
    ASSERT_EQ(refs.size(), 2U);
    EXPECT_EQ(refs[0]->name, "Left");
    EXPECT_EQ(refs[0]->type.referenceClass, "Base_Element");
    EXPECT_EQ(refs[1]->type.referenceClass, "Base_Device");
    EXPECT_TRUE(repo.referenceProperties(kNs, "Base_Port").empty());
}

TEST_F(RepositoryFixture, ClassRemembersWhereItWasDeclared) {
    EXPECT_EQ(cls("Base_Device").file, "t.mof");
    EXPECT_EQ(cls("Base_Device").line, 18);
}

TEST_F(RepositoryFixture, ConcurrentReadersSeeTheSameAnswers) {
    std::atomic<int> mismatches{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < 8; ++t) {
        threads.emplace_back([&] {
            for (int i = 0; i < 2000; ++i) {
                if (!repo.isA(kNs, "base_port", "Base_Element") ||
                    repo.keyNames(kNs, "Base_Port").size() != 3 ||
                    repo.classNames(kNs, "", true).size() != 9) {
                    ++mismatches;
                }
            }
        });
    }
    for (auto& th : threads) {
        th.join();
    }
    EXPECT_EQ(mismatches.load(), 0);
}

TEST(ClassRepositoryWithoutDeclarations, InheritsAssociationAndKeyFromParent) {
    const auto repo = loaded("[Association] class L { [Key] L REF Self; };\nclass M : L { };");
    EXPECT_TRUE(repo.isAssociation(kNs, "M"));
    EXPECT_EQ(repo.keyNames(kNs, "M"), Names{"Self"});
    EXPECT_EQ(repo.getClass(kNs, "L")->findProperty("Self")->qualifiers.find("Key")->type.type,
              CimType::Boolean);
}

TEST(ClassRepositoryMove, MovedRepositoryKeepsItsClasses) {
    ClassRepository a = loaded("class A { };");
    ClassRepository b = std::move(a);
    EXPECT_NE(b.getClass(kNs, "a"), nullptr);
}

}  // namespace
}  // namespace orv::repository
