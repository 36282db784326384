// Malformed and unacceptable MOF: every error names file, line and what was expected.
#include <gtest/gtest.h>

#include "test_support.hpp"

namespace orv::repository {
namespace {

using testing::loaded;
using testing::mofError;

TEST(MofErrors, MissingSemicolonAfterPropertyNamesTheLine) {
    EXPECT_EQ(mofError("class A {\n  string Name\n};\n", "orv.mof"),
              "orv.mof:2: expected ';' after property declaration");
}

TEST(MofErrors, MissingSemicolonAfterClassAndReference) {
    EXPECT_EQ(mofError("class A {\n}\n"), "t.mof:2: expected ';' after class declaration");
    EXPECT_EQ(mofError("class A { A REF Self };"), "t.mof:1: expected ';' after reference declaration");
    EXPECT_EQ(mofError("class A { uint32 M() };"), "t.mof:1: expected ';' after method declaration");
}

TEST(MofErrors, UnterminatedClassBodyAndLists) {
    EXPECT_EQ(mofError("class A {\n string S;\n"), "t.mof:3: expected '}' at end of class A");
    EXPECT_EQ(mofError("[Key class A {};"), "t.mof:1: expected ']' at end of qualifier list");
    EXPECT_EQ(mofError("class A { uint32 M(string a; };"), "t.mof:1: expected ')' at end of parameter list");
    EXPECT_EQ(mofError("class A { string S[] = {\"a\" \"b\"; };"), "t.mof:1: expected '}' at end of array value");
    EXPECT_EQ(mofError("class A : { };"), "t.mof:1: expected superclass name after ':'");
    EXPECT_EQ(mofError("class { };"), "t.mof:1: expected class name after 'class'");
}

TEST(MofErrors, UnknownDataTypeAndTopLevelGarbage) {
    EXPECT_EQ(mofError("class A {\n strin X;\n};"),
              "t.mof:2: unknown data type 'strin' in property, reference or method declaration");
    EXPECT_EQ(mofError("\nclas A {};"), "t.mof:2: expected 'class', 'qualifier', 'instance of' or '#pragma'");
    EXPECT_EQ(mofError("class A { string S = ; };"), "t.mof:1: expected a value");
}

TEST(MofErrors, InstanceDeclarationsAreRejected) {
    EXPECT_EQ(mofError("class A { string S; };\ninstance of A { S = \"x\"; };"),
              "t.mof:2: instance declarations are not supported (instance of A)");
}

TEST(MofErrors, UnknownSuperclassDuplicateClassAndUnknownReference) {
    EXPECT_EQ(mofError("class B : Nowhere { };"), "t.mof:1: unknown superclass Nowhere of class B");
    EXPECT_EQ(mofError("class A { };\nclass a { };"),
              "t.mof:2: duplicate class a (first declared at t.mof:1)");
    EXPECT_EQ(mofError("class L {\n Ghost REF G; };"), "t.mof:2: unknown class Ghost referenced by reference L.G");
    EXPECT_EQ(mofError("class M { uint32 F(Ghost REF G); };"),
              "t.mof:1: unknown class Ghost referenced by parameter G of method M.F");
}

TEST(MofErrors, UnknownQualifierOnlyWhenQualifiersAreDeclared) {
    EXPECT_EQ(mofError("Qualifier Key : boolean = false, Scope(property);\n"
                       "class A {\n [Bogus] string P; };"),
              "t.mof:3: unknown qualifier Bogus on property A.P");
    EXPECT_NO_THROW(loaded("class A { [Bogus] string P; };"));
}

TEST(MofErrors, ValuesThatDoNotFitTheirType) {
    EXPECT_EQ(mofError("class A { uint8 P = 256; };"), "t.mof:1: expected a uint8 value for property A.P");
    EXPECT_EQ(mofError("class A { sint8 P = -129; };"), "t.mof:1: expected a sint8 value for property A.P");
    EXPECT_EQ(mofError("class A { uint32 P = -1; };"), "t.mof:1: expected a uint32 value for property A.P");
    EXPECT_EQ(mofError("class A { boolean P = \"yes\"; };"), "t.mof:1: expected a boolean value for property A.P");
    EXPECT_EQ(mofError("class A { string P = {\"x\"}; };"), "t.mof:1: unexpected array value for property A.P");
    EXPECT_EQ(mofError("class A { string P[] = {\"x\", null}; };"),
              "t.mof:1: unexpected null inside array value for property A.P");
    EXPECT_EQ(mofError("Qualifier MaxLen : uint32 = null, Scope(property);\n"
                       "class A { [MaxLen(\"long\")] string P; };"),
              "t.mof:2: expected a uint32 value for qualifier MaxLen");
}

TEST(MofErrors, DuplicatesInsideAClass) {
    EXPECT_EQ(mofError("class A {\n string P;\n uint8 p; };"), "t.mof:3: duplicate property p in class A");
    EXPECT_EQ(mofError("class A { [Key, key] string P; };"), "t.mof:1: duplicate qualifier key on property A.P");
    EXPECT_EQ(mofError("class A { uint32 M(string x, string X); };"),
              "t.mof:1: duplicate parameter X of method A.M");
}

TEST(MofErrors, OverrideOfAPropertyTheParentDoesNotHave) {
    EXPECT_EQ(mofError("class A { string P; };\nclass B : A {\n [Override(\"Nope\")] string P2; };"),
              "t.mof:3: Override(\"Nope\") on property P2 names no property of A");
}

TEST(MofErrors, MalformedQualifierDeclarations) {
    EXPECT_EQ(mofError("Qualifier Key : boolean = false, Scope(proprety);"),
              "t.mof:1: expected a scope (class, association, indication, property, reference, "
              "method, parameter, qualifier, any)");
    EXPECT_EQ(mofError("Qualifier Key : boolean;"), "t.mof:1: expected ',' before Scope in qualifier declaration");
    EXPECT_EQ(mofError("Qualifier Key : boolean, Scope(any), Flavor(Sticky);"),
              "t.mof:1: expected a flavor (EnableOverride, DisableOverride, ToSubclass, Restricted, Translatable)");
    EXPECT_EQ(mofError("Qualifier Key : boolean, Scope(any);\nQualifier KEY : boolean, Scope(any);"),
              "t.mof:2: duplicate qualifier declaration KEY");
}

TEST(MofErrors, ErrorCarriesFileLineAndMessageSeparately) {
    try {
        loaded("class A {\n\n string Name\n};", "dir/x.mof");
        FAIL() << "no error";
    } catch (const MofError& e) {
        EXPECT_EQ(e.file(), "dir/x.mof");
        EXPECT_EQ(e.line(), 3);
        EXPECT_EQ(e.message(), "expected ';' after property declaration");
    }
}

TEST(MofErrors, FailedLoadLeavesTheRepositoryUnchanged) {
    ClassRepository repo;
    repo.loadText("class A { };", "a.mof");
    EXPECT_THROW(repo.loadText("class B : A { };\nclass C : Missing { };", "b.mof"), MofError);
    EXPECT_NE(repo.getClass("root/cimv2", "A"), nullptr);
    EXPECT_EQ(repo.getClass("root/cimv2", "B"), nullptr);
    repo.loadText("class B : A { };", "b.mof");
    EXPECT_NE(repo.getClass("root/cimv2", "B"), nullptr);
}

}  // namespace
}  // namespace orv::repository
