// The provider registration reader: good files and every refusal.
#include <gtest/gtest.h>

#include "orv/repository/registration.hpp"
#include "test_support.hpp"

namespace orv::repository {
namespace {

using Names = std::vector<std::string>;

std::string regError(std::string_view text) {
    try {
        RegistrationSet::parseText(text, "orv.reg");
    } catch (const RegistrationError& e) {
        return e.what();
    }
    return "no error";
}

constexpr std::string_view kGood = R"(# Providers of the library
[CIM_EthernetPort]
   provider: EthernetPort-Provider
   location: orvprovider
   type: instance method
   namespace: root/cimv2 root/interop
   group: orv
   unload: never
   parameters: verbose=1 mode=a
   user: root

  # blank lines and comments between blocks

[Orvane_HostedDependency]
provider:Assoc-Provider
location:   orvprovider
TYPE: association instance
[cim_ethernetport]
   provider: Second
   location: other
   type: indication property class qualifier
)";

TEST(Registration, ReadsEveryKeyInFileOrder) {
    const auto set = RegistrationSet::parseText(kGood, "orv.reg");
    ASSERT_EQ(set.all().size(), 3U);
    const ProviderRegistration& port = set.all()[0];
    EXPECT_EQ(port.className, "CIM_EthernetPort");
    EXPECT_EQ(port.provider, "EthernetPort-Provider");
    EXPECT_EQ(port.location, "orvprovider");
    EXPECT_TRUE(port.has(ProviderKind::Instance));
    EXPECT_TRUE(port.has(ProviderKind::Method));
    EXPECT_FALSE(port.has(ProviderKind::Association));
    EXPECT_EQ(port.namespaces, (Names{"root/cimv2", "root/interop"}));
    EXPECT_EQ(port.group, "orv");
    EXPECT_TRUE(port.unloadNever);
    EXPECT_EQ(port.parameters, "verbose=1 mode=a");
    EXPECT_EQ(port.user, "root");
    EXPECT_EQ(port.file, "orv.reg");
    EXPECT_EQ(port.line, 2);
    const ProviderRegistration& assoc = set.all()[1];
    EXPECT_EQ(assoc.provider, "Assoc-Provider");
    EXPECT_EQ(assoc.location, "orvprovider");
    EXPECT_EQ(assoc.kinds, static_cast<std::uint8_t>(ProviderKind::Association) |
                               static_cast<std::uint8_t>(ProviderKind::Instance));
    EXPECT_EQ(assoc.namespaces, Names{"root/cimv2"});
    EXPECT_FALSE(assoc.unloadNever);
    EXPECT_EQ(assoc.line, 14);
    const ProviderRegistration& last = set.all()[2];
    EXPECT_TRUE(last.has(ProviderKind::Indication));
    EXPECT_TRUE(last.has(ProviderKind::Property));
    EXPECT_TRUE(last.has(ProviderKind::Class));
    EXPECT_TRUE(last.has(ProviderKind::Qualifier));
}

TEST(Registration, LookupByClassIgnoresCase) {
    const auto set = RegistrationSet::parseText(kGood, "orv.reg");
    const auto ports = set.forClass("CIM_ETHERNETPORT");
    ASSERT_EQ(ports.size(), 2U);
    EXPECT_EQ(ports[0]->provider, "EthernetPort-Provider");
    EXPECT_EQ(ports[1]->provider, "Second");
    EXPECT_TRUE(set.forClass("CIM_Nothing").empty());
}

TEST(Registration, EmptyAndCommentOnlyFilesHaveNoEntries) {
    EXPECT_TRUE(RegistrationSet::parseText("", "e.reg").all().empty());
    EXPECT_TRUE(RegistrationSet::parseText("# only\n\n   \n", "e.reg").all().empty());
}

TEST(Registration, KeyBeforeAnyClassLine) {
    EXPECT_EQ(regError("# c\nprovider: P\n"), "orv.reg:2: expected '[ClassName]' before 'provider'");
}

TEST(Registration, UnknownKey) {
    EXPECT_EQ(regError("[A]\nprovider: P\nlocation: L\ntype: instance\ncolour: red\n"),
              "orv.reg:5: unknown key 'colour' (expected provider, location, type, namespace, group, "
              "unload, parameters or user)");
}

TEST(Registration, MissingRequiredKeysNameTheBlock) {
    EXPECT_EQ(regError("[A]\nlocation: L\ntype: instance\n"), "orv.reg:1: expected 'provider:' in block [A]");
    EXPECT_EQ(regError("\n[A]\nprovider: P\ntype: instance\n[B]\n"), "orv.reg:2: expected 'location:' in block [A]");
    EXPECT_EQ(regError("[A]\nprovider: P\nlocation: L\n"), "orv.reg:1: expected 'type:' in block [A]");
}

TEST(Registration, UnknownTypeWord) {
    EXPECT_EQ(regError("[A]\nprovider: P\nlocation: L\ntype: instance teleport\n"),
              "orv.reg:4: unknown provider type 'teleport' (expected instance, association, method, "
              "indication, property, class or qualifier)");
}

TEST(Registration, UnloadAcceptsOnlyNever) {
    EXPECT_EQ(regError("[A]\nprovider: P\nlocation: L\ntype: instance\nunload: sometimes\n"),
              "orv.reg:5: expected 'never' as unload value, not 'sometimes'");
}

TEST(Registration, MalformedLines) {
    EXPECT_EQ(regError("[A\n"), "orv.reg:1: expected ']' after class name");
    EXPECT_EQ(regError("[]\n"), "orv.reg:1: expected a class name between '[' and ']'");
    EXPECT_EQ(regError("[A]\njust words\n"), "orv.reg:2: expected 'key: value' or '[ClassName]'");
    EXPECT_EQ(regError("[A]\nprovider:\n"), "orv.reg:2: expected a value after 'provider:'");
    EXPECT_EQ(regError("[A]\nprovider: P\nprovider: Q\n"), "orv.reg:3: duplicate key 'provider' in block [A]");
}

TEST(Registration, ErrorCarriesFileAndLine) {
    try {
        RegistrationSet::parseText("[A]\n\ncolour: x\n", "x.reg");
        FAIL() << "no error";
    } catch (const RegistrationError& e) {
        EXPECT_EQ(e.file(), "x.reg");
        EXPECT_EQ(e.line(), 3);
    }
}

TEST(Registration, ParseFileReadsTheProjectFileAndReportsMissingOnes) {
    const auto missing = testing::sourceDir() / "tests/repository/data/absent.reg";
    try {
        RegistrationSet::parseFile(missing);
        FAIL() << "no error";
    } catch (const RegistrationError& e) {
        EXPECT_EQ(std::string(e.what()), missing.string() + ":0: cannot open file");
    }
    const auto corpus = testing::sourceDir() / "fuzz/mof/corpus/registration/good.reg";
    const auto set = RegistrationSet::parseFile(corpus);
    ASSERT_EQ(set.all().size(), 2U);
    EXPECT_EQ(set.all()[1].className, "CIM_Dependency");
    EXPECT_EQ(set.all()[1].file, corpus.string());
}

}  // namespace
}  // namespace orv::repository
