// The state store: one file per object, replaced atomically; what a crash leaves.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <fstream>

#include "orv/indication/state_store.hpp"

namespace orv::indication {
namespace {

namespace fs = std::filesystem;

class StateStoreTest : public ::testing::Test {
protected:
    void SetUp() override {
        dir_ = fs::temp_directory_path() / ("i13a-store-" + std::to_string(::getpid()) + "-" +
                                            ::testing::UnitTest::GetInstance()->current_test_info()->name());
        fs::remove_all(dir_);
    }
    void TearDown() override { fs::remove_all(dir_); }

    static std::vector<std::string> contents(const StateStore& store) {
        std::vector<std::string> out;
        for (const auto& object : store.loadAll()) {
            out.push_back(object.id + "=" + object.content);
        }
        return out;
    }

    static void writeFile(const fs::path& path, const std::string& text) {
        std::ofstream out(path, std::ios::binary);
        out << text;
    }

    fs::path dir_;
};

using ::testing::ElementsAre;

TEST_F(StateStoreTest, CreatesItsFolderAndReturnsObjectsInIdOrder) {
    StateStore store(dir_ / "nested");
    store.put("b", "second");
    store.put("a", "first\nwith two lines");
    EXPECT_THAT(contents(store), ElementsAre("a=first\nwith two lines", "b=second"));
    EXPECT_THAT(contents(StateStore(dir_ / "nested")), ElementsAre("a=first\nwith two lines", "b=second"));
}

TEST_F(StateStoreTest, PutReplacesAndRemoveForgets) {
    StateStore store(dir_);
    store.put("a", "old");
    store.put("a", "new");
    store.put("b", "kept");
    store.remove("a");
    store.remove("never stored");
    EXPECT_THAT(contents(store), ElementsAre("b=kept"));
    EXPECT_FALSE(fs::exists(store.fileOf("a")));
}

TEST_F(StateStoreTest, CrashBetweenWriteAndRenameKeepsTheOldVersionAndEveryOtherObject) {
    StateStore store(dir_);
    store.put("filter:a", "old a");
    store.put("filter:b", "b");
    // A replacement of "filter:a" was written in full but the process died before its rename,
    // and a first write of "filter:c" died halfway.
    writeFile(store.fileOf("filter:a").string() + ".tmp", "filter:a\nnew a");
    writeFile(store.fileOf("filter:c").string() + ".tmp", "filter:c\nhal");
    StateStore reopened(dir_);
    EXPECT_THAT(contents(reopened), ElementsAre("filter:a=old a", "filter:b=b"));
    EXPECT_FALSE(fs::exists(store.fileOf("filter:a").string() + ".tmp"));
    EXPECT_FALSE(fs::exists(store.fileOf("filter:c").string() + ".tmp"));
    reopened.put("filter:a", "newer a");
    EXPECT_THAT(contents(reopened), ElementsAre("filter:a=newer a", "filter:b=b"));
}

TEST_F(StateStoreTest, FilesThatAreNotTheStoresOwnAreLeftAlone) {
    StateStore store(dir_);
    store.put("a", "1");
    writeFile(dir_ / "README", "notes");
    EXPECT_THAT(contents(store), ElementsAre("a=1"));
    EXPECT_TRUE(fs::exists(dir_ / "README"));
}

TEST_F(StateStoreTest, FolderThatCannotBeCreatedIsNamedInTheError) {
    fs::create_directories(dir_);
    writeFile(dir_ / "plain-file", "x");
    try {
        StateStore store(dir_ / "plain-file" / "state");
        FAIL() << "a folder under a file was accepted";
    } catch (const std::runtime_error& error) {
        EXPECT_THAT(error.what(), ::testing::HasSubstr("cannot create state folder " + (dir_ / "plain-file" / "state").string()));
    }
}

TEST_F(StateStoreTest, IdWithALineEndIsRefused) {
    StateStore store(dir_);
    EXPECT_THROW(store.put("a\nb", "x"), std::runtime_error);
    EXPECT_TRUE(store.loadAll().empty());
}

}  // namespace
}  // namespace orv::indication
