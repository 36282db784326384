// Every declaration construct of the parser, checked through the repository.
#include <gtest/gtest.h>

#include "test_support.hpp"

namespace orv::repository {
namespace {

using testing::loaded;

constexpr std::string_view kValues = R"(
class V {
    boolean B = true;
    boolean F = FALSE;
    string S = "con" "cat" "enated";
    string N = null;
    char16 C = 'x';
    uint8 U8 = 255;
    sint8 S8 = -128;
    uint16 Hex = 0xFFFF;
    uint32 Bin = 101b;
    uint32 Oct = 0755;
    sint64 Min = -9223372036854775808;
    uint64 Max = 18446744073709551615;
    real32 R = 1.25;
    real64 RI = 3;
    datetime D = "20240101000000.000000+000";
    string Arr[] = {"a", "b" "c"};
    uint16 Fixed[4];
    sint32 Empty[] = {};
    string Plain;
};
)";

const PropertyDecl& prop(const ClassRepository& repo, std::string_view name) {
    const PropertyDecl* p = repo.getClass("root/cimv2", "V")->findProperty(name);
    EXPECT_NE(p, nullptr) << name;
    return *p;
}

TEST(MofValues, LiteralsTakeTheDeclaredType) {
    const auto repo = loaded(kValues);
    EXPECT_EQ(prop(repo, "B").defaultValue, Value::scalar(true));
    EXPECT_EQ(prop(repo, "F").defaultValue, Value::scalar(false));
    EXPECT_EQ(prop(repo, "S").defaultValue, Value::scalar(std::string("concatenated")));
    EXPECT_TRUE(prop(repo, "N").defaultValue.isNull());
    EXPECT_EQ(prop(repo, "C").defaultValue, Value::scalar(u'x'));
    EXPECT_EQ(prop(repo, "U8").defaultValue, Value::scalar(std::uint64_t{255}));
    EXPECT_EQ(prop(repo, "S8").defaultValue, Value::scalar(std::int64_t{-128}));
    EXPECT_EQ(prop(repo, "Hex").defaultValue, Value::scalar(std::uint64_t{0xFFFF}));
    EXPECT_EQ(prop(repo, "Bin").defaultValue, Value::scalar(std::uint64_t{5}));
    EXPECT_EQ(prop(repo, "Oct").defaultValue, Value::scalar(std::uint64_t{0755}));
    EXPECT_EQ(prop(repo, "Min").defaultValue,
              Value::scalar(std::numeric_limits<std::int64_t>::min()));
    EXPECT_EQ(prop(repo, "Max").defaultValue,
              Value::scalar(std::numeric_limits<std::uint64_t>::max()));
    EXPECT_EQ(prop(repo, "R").defaultValue, Value::scalar(1.25));
    EXPECT_EQ(prop(repo, "RI").defaultValue, Value::scalar(3.0));
    EXPECT_EQ(prop(repo, "D").defaultValue,
              Value::scalar(std::string("20240101000000.000000+000")));
    EXPECT_TRUE(prop(repo, "Plain").defaultValue.isNull());
}

TEST(MofValues, ArraysWithValuesFixedSizeAndEmpty) {
    const auto repo = loaded(kValues);
    const auto& arr = prop(repo, "Arr");
    EXPECT_TRUE(arr.type.isArray);
    EXPECT_FALSE(arr.type.arraySize.has_value());
    EXPECT_EQ(arr.defaultValue, Value::array({std::string("a"), std::string("bc")}));
    const auto& fixed = prop(repo, "Fixed");
    EXPECT_TRUE(fixed.type.isArray);
    EXPECT_EQ(fixed.type.arraySize, 4U);
    EXPECT_EQ(fixed.type.type, CimType::Uint16);
    EXPECT_TRUE(prop(repo, "Empty").defaultValue.isArray());
    EXPECT_TRUE(prop(repo, "Empty").defaultValue.elements().empty());
}

TEST(MofValues, ScalarTextMatchesCimXmlForms) {
    EXPECT_EQ(scalarToText(true), "true");
    EXPECT_EQ(scalarToText(std::int64_t{-12}), "-12");
    EXPECT_EQ(scalarToText(std::uint64_t{18446744073709551615ULL}), "18446744073709551615");
    EXPECT_EQ(scalarToText(0.1), "0.1");
    EXPECT_EQ(scalarToText(u'\u00e9'), "\xC3\xA9");
    EXPECT_EQ(scalarToText(std::string("x")), "x");
}

TEST(MofValues, QualifierListsWithValuesArraysAndFlavors) {
    const auto repo = loaded(R"(
        [Abstract, Version("2.28.0"), Description("A " "class")]
        class Q {
              [Key, Description("k"), ValueMap {"0", "1"}, Values {"Zero", "One"},
               MaxLen(256), ArrayType("Indexed"), Weird : DisableOverride Restricted]
            string K;
        };)");
    const ClassDecl* q = repo.getClass("root/cimv2", "Q");
    ASSERT_NE(q, nullptr);
    EXPECT_TRUE(q->isAbstract);
    EXPECT_EQ(q->qualifiers.stringValue("version"), "2.28.0");
    EXPECT_EQ(q->qualifiers.stringValue("Description"), "A class");
    const PropertyDecl* k = q->findProperty("k");
    ASSERT_NE(k, nullptr);
    EXPECT_TRUE(k->key);
    const Qualifier* valueMap = k->qualifiers.find("VALUEMAP");
    ASSERT_NE(valueMap, nullptr);
    EXPECT_TRUE(valueMap->type.isArray);
    EXPECT_EQ(valueMap->value, Value::array({std::string("0"), std::string("1")}));
    EXPECT_EQ(k->qualifiers.find("MaxLen")->value, Value::scalar(std::uint64_t{256}));
    EXPECT_EQ(k->qualifiers.find("MaxLen")->type.type, CimType::Uint64);
    const Qualifier* weird = k->qualifiers.find("weird");
    ASSERT_NE(weird, nullptr);
    EXPECT_EQ(weird->value, Value::scalar(true));
    EXPECT_FALSE(weird->flavors.enableOverride);
    EXPECT_FALSE(weird->flavors.toSubclass);
}

TEST(MofValues, ReferencesAndMethodsWithParameters) {
    const auto repo = loaded(R"(
        class T { [Key] string Id; };
        [Association] class L { [Key] T REF Left; [Key] T ref Right; };
        class S : T {
              [Static]
            uint32 Run([In] string Name, [In, Out] T REF Target, [Out] uint8 Codes[],
                       [In(false), Out] sint16 Fixed[3]);
            T REF Owner();
        };)");
    const ClassDecl* l = repo.getClass("root/cimv2", "l");
    ASSERT_NE(l, nullptr);
    EXPECT_TRUE(l->isAssociation);
    ASSERT_EQ(l->properties.size(), 2U);
    EXPECT_EQ(l->properties[1].type.type, CimType::Reference);
    EXPECT_EQ(l->properties[1].type.referenceClass, "T");
    const MethodDecl* run = repo.getClass("root/cimv2", "S")->findMethod("RUN");
    ASSERT_NE(run, nullptr);
    EXPECT_EQ(run->returnType.type, CimType::Uint32);
    EXPECT_TRUE(run->qualifiers.isTrue("Static"));
    ASSERT_EQ(run->parameters.size(), 4U);
    EXPECT_TRUE(run->parameters[0].isIn());
    EXPECT_FALSE(run->parameters[0].isOut());
    EXPECT_EQ(run->parameters[1].type.referenceClass, "T");
    EXPECT_TRUE(run->parameters[1].isIn());
    EXPECT_TRUE(run->parameters[1].isOut());
    EXPECT_TRUE(run->parameters[2].type.isArray);
    EXPECT_FALSE(run->parameters[3].isIn());
    EXPECT_EQ(run->parameters[3].type.arraySize, 3U);
    EXPECT_EQ(run->findParameter("codes"), &run->parameters[2]);
    const MethodDecl* owner = repo.getClass("root/cimv2", "S")->findMethod("Owner");
    ASSERT_NE(owner, nullptr);
    EXPECT_EQ(owner->returnType.type, CimType::Reference);
    EXPECT_TRUE(owner->parameters.empty());
}

TEST(MofValues, QualifierDeclarationsGiveTypeScopeAndFlavor) {
    const auto repo = loaded(R"(
        Qualifier Key : boolean = false, Scope(property, reference),
            Flavor(DisableOverride, ToSubclass);
        Qualifier ValueMap : string[], Scope(property, method, parameter);
        Qualifier MaxLen : uint32 = null, Scope(property, method, parameter);
        Qualifier Description : string = null, Scope(any),
            Flavor(EnableOverride, ToSubclass, Translatable);
        class D { [Key, MaxLen(16), Description("d")] string K; };)");
    const QualifierDeclaration* key = repo.getQualifierDeclaration("root/cimv2", "KEY");
    ASSERT_NE(key, nullptr);
    EXPECT_EQ(key->type.type, CimType::Boolean);
    EXPECT_EQ(key->defaultValue, Value::scalar(false));
    EXPECT_TRUE(key->allows(Scope::Property));
    EXPECT_TRUE(key->allows(Scope::Reference));
    EXPECT_FALSE(key->allows(Scope::Class));
    EXPECT_FALSE(key->flavors.enableOverride);
    EXPECT_TRUE(key->flavors.toSubclass);
    EXPECT_TRUE(repo.getQualifierDeclaration("root/cimv2", "ValueMap")->type.isArray);
    const auto* desc = repo.getQualifierDeclaration("root/cimv2", "description");
    EXPECT_EQ(desc->scopes, static_cast<std::uint16_t>(Scope::Any));
    EXPECT_TRUE(desc->flavors.translatable);
    EXPECT_EQ(repo.qualifierDeclarations("root/cimv2").size(), 4U);
    const Qualifier* maxLen = repo.getClass("root/cimv2", "D")->findProperty("K")->qualifiers.find("MaxLen");
    EXPECT_EQ(maxLen->type.type, CimType::Uint32);
    EXPECT_EQ(maxLen->value, Value::scalar(std::uint64_t{16}));
}

}  // namespace
}  // namespace orv::repository
