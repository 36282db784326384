// "#pragma include", "#pragma namespace" and "#pragma locale" over files on disk.
#include <gtest/gtest.h>

#include "test_support.hpp"

namespace orv::repository {
namespace {

using Names = std::vector<std::string>;

std::filesystem::path data(std::string_view name) {
    return testing::sourceDir() / "tests/repository/data" / name;
}

std::string fileError(const std::filesystem::path& file) {
    ClassRepository repo;
    try {
        repo.loadFile(file);
    } catch (const MofError& e) {
        return e.what();
    }
    return "no error";
}

TEST(MofPragmas, IncludeIsRelativeToTheIncludingFile) {
    ClassRepository repo;
    repo.loadFile(data("top.mof"));
    EXPECT_EQ(repo.superclassChain("root/cimv2", "Top_Child"), (Names{"Nested_Parent", "Nested_Leaf"}));
    EXPECT_EQ(repo.keyNames("root/cimv2", "top_child"), (Names{"LeafID", "Name"}));
    EXPECT_EQ(repo.getClass("root/cimv2", "Nested_Leaf")->file, data("nested/leaf.mof").string());
}

TEST(MofPragmas, NamespacePragmaSwitchesTheTargetNamespace) {
    ClassRepository repo;
    repo.loadFile(data("top.mof"));
    EXPECT_EQ(repo.namespaces(), (Names{"root/cimv2", "root/interop"}));
    EXPECT_NE(repo.getClass("root/interop", "Interop_Only"), nullptr);
    EXPECT_EQ(repo.getClass("root/cimv2", "Interop_Only"), nullptr);
    EXPECT_NE(repo.getClass("root/interop", "Nested_Parent"), nullptr);
    EXPECT_EQ(repo.getClass("root/interop", "Top_Child"), nullptr);
}

TEST(MofPragmas, LoadFileIntoAChosenNamespace) {
    ClassRepository repo;
    repo.loadFile(data("nested/leaf.mof"), "root/test");
    EXPECT_NE(repo.getClass("root/test", "Nested_Leaf"), nullptr);
    EXPECT_FALSE(repo.hasNamespace("root/cimv2"));
}

TEST(MofPragmas, MissingIncludeNamesTheIncludingFileAndLine) {
    EXPECT_EQ(fileError(data("missing_include.mof")),
              data("missing_include.mof").string() + ":3: cannot open included file '" +
                  (data("") / "no/such/file.mof").string() + "'");
}

TEST(MofPragmas, MissingTopFileIsReported) {
    EXPECT_EQ(fileError(data("absent.mof")), data("absent.mof").string() + ":0: cannot open file");
}

TEST(MofPragmas, IncludeCycleIsRefused) {
    const std::string a = data("cycle_a.mof").string();
    EXPECT_EQ(fileError(data("cycle_a.mof")), a + ":1: include cycle: " + a + " includes itself");
}

TEST(MofPragmas, ErrorsInsideIncludedFilesNameThatFile) {
    EXPECT_EQ(fileError(data("bad_included.mof")),
              (data("") / "nested/broken.mof").string() + ":2: expected a uint8 value for property Broken.Value");
}

TEST(MofPragmas, UnknownPragmasAreIgnored) {
    const auto repo = testing::loaded("#pragma locale(\"en_US\")\n#pragma source(\"x\")\nclass A { };");
    EXPECT_NE(repo.getClass("root/cimv2", "A"), nullptr);
}

TEST(MofPragmas, MalformedPragma) {
    EXPECT_EQ(testing::mofError("#pragma include \"x.mof\""), "t.mof:1: expected '(' after pragma name");
    EXPECT_EQ(testing::mofError("#include (\"x.mof\")"), "t.mof:1: expected 'pragma' after '#'");
}

}  // namespace
}  // namespace orv::repository
