// A caller that takes each returned instance as it arrives (the CIM-XML front end
// streaming a response): the instances reach its listener in order, during the
// provider's call, and the Reply keeps none of them.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

class InstanceListenerTest : public CoreTest {
protected:
    CallOptions listening(const char* principal) {
        CallOptions options = as(principal);
        options.onInstance = [this](const CMPIInstance* instance) {
            heard_.push_back(stringProperty(instance, "Name"));
            return true;
        };
        return options;
    }

    std::vector<std::string> heard_;
};

TEST_F(InstanceListenerTest, EnumeratedInstancesReachTheListenerInOrderAndStayOutOfTheReply) {
    Reply reply = core_->enumerateInstances(path("Raw_SubElement"), listening("many"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(heard_, (std::vector<std::string>{"Raw_SubElement-0", "Raw_SubElement-1", "Raw_SubElement-2",
                                                "Raw_SubElement-3", "Raw_SubElement-4"}));
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(InstanceListenerTest, PathsHandedToAnInstanceRequestReachTheListenerAsInstances) {
    Reply reply = core_->getInstance(path("Raw_Element", "wanted"), listening("paths"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(heard_, (std::vector<std::string>{"path-0", "path-1"}));
    EXPECT_TRUE(reply.instances().empty());
}

TEST_F(InstanceListenerTest, NamesRequestsIgnoreTheListener) {
    Reply reply = core_->enumerateInstanceNames(path("Raw_SubElement"), listening("many"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(heard_.empty());
    EXPECT_EQ(reply.objectPaths().size(), 5U);
}

}  // namespace
}  // namespace orv::host::test
