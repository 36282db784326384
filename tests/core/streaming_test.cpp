// Streaming requests (CallOptions::onItem): every returned object reaches the
// consumer as it arrives and is not kept in the reply.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using StreamingTest = CoreTest;

std::string nameOf(const ReturnedItem& item) {
    const CMPIInstance* instance = item.data.value.inst;
    return stringProperty(instance, "Name");
}

TEST_F(StreamingTest, EveryInstanceReachesTheConsumerInOrderAndTheReplyKeepsNone) {
    std::vector<std::string> names;
    CallOptions opts = as("many");
    opts.onItem = [&names](const ReturnedItem& item) {
        EXPECT_EQ(item.kind, ReturnedItem::Kind::Instance);
        names.push_back(nameOf(item));
        return true;
    };
    Reply reply = core_->enumerateInstances(path("Raw_Element"), opts);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    Reply kept = core_->enumerateInstances(path("Raw_Element"), as("many"));
    std::vector<std::string> keptNames;
    for (const CMPIInstance* instance : kept.instances()) {
        keptNames.push_back(stringProperty(instance, "Name"));
    }
    EXPECT_EQ(reply.doneCount(), kept.doneCount());
    EXPECT_GE(names.size(), 5u);
    EXPECT_EQ(names, keptNames);
}

TEST_F(StreamingTest, PathsHandedToAnInstanceRequestReachTheConsumerAsInstances) {
    std::vector<std::string> names;
    CallOptions opts = as("paths");
    opts.onItem = [&names](const ReturnedItem& item) {
        EXPECT_EQ(item.kind, ReturnedItem::Kind::Instance);
        names.push_back(nameOf(item));
        return true;
    };
    Reply reply = core_->getInstance(path("Raw_Element", "wanted"), opts);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(names, (std::vector<std::string>{"path-0", "path-1"}));
    EXPECT_TRUE(reply.items().empty());
}

TEST_F(StreamingTest, ObjectPathsStreamToo) {
    std::vector<std::string> classes;
    CallOptions opts = as("");
    opts.onItem = [&classes](const ReturnedItem& item) {
        EXPECT_EQ(item.kind, ReturnedItem::Kind::ObjectPath);
        classes.push_back(className(item.data.value.ref));
        return true;
    };
    Reply reply = core_->enumerateInstanceNames(path("Raw_Element"), opts);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    std::vector<std::string> keptClasses;
    Reply kept = core_->enumerateInstanceNames(path("Raw_Element"), as(""));
    for (const CMPIObjectPath* op : kept.objectPaths()) {
        keptClasses.push_back(className(op));
    }
    EXPECT_EQ(classes.size(), 4u);
    EXPECT_EQ(classes, keptClasses);
}

TEST_F(StreamingTest, RefusedObjectsAreNotKeptAndLaterOnesAreStillOffered) {
    int calls = 0;
    CallOptions opts = as("many");
    opts.onItem = [&calls](const ReturnedItem&) { return ++calls < 2; };
    Reply reply = core_->enumerateInstances(path("Raw_Element"), opts);
    // The raw provider ignores what returnInstance answers, so it goes on; each
    // further object is offered and refused, and nothing is kept.
    EXPECT_EQ(static_cast<std::size_t>(calls), core_->enumerateInstances(path("Raw_Element"), as("many")).items().size());
    EXPECT_TRUE(reply.items().empty());
}

}  // namespace
}  // namespace orv::host::test
