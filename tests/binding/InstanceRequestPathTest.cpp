// The binding's rule for instance requests: an object path a provider hands to
// the result of enumInstances or getInstance reaches the broker as an instance
// made from that path; enumInstanceNames is left alone.
#include "CoreFixture.h"

#include <orv/testsupport/SyslogCapture.h>

namespace {

using orv::bindingtest::CoreFixture;
using orv::testsupport::SyslogCapture;

class InstanceRequestPathTest : public CoreFixture {
protected:
    // The instance's own path must be the delivered one: class and key.
    void expectInstanceOnPath(const CMPIInstance* inst, const std::string& name) {
        EXPECT_EQ(property(inst, "Name"), name);
        CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
        ASSERT_NE(op, nullptr);
        EXPECT_EQ(className(op), "Test_PathElement");
        EXPECT_EQ(key(op, "Name"), name);
        EXPECT_EQ(inst->ft->getPropertyCount(inst, nullptr), 1u);
    }
};

TEST_F(InstanceRequestPathTest, PathsHandedToEnumInstancesArriveAsInstancesOnThosePaths) {
    SyslogCapture log;
    orv::host::Reply reply = core->enumerateInstances(path("Test_PathElement"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.objectPaths().empty());
    ASSERT_EQ(reply.instances().size(), 2u);
    expectInstanceOnPath(reply.instances()[0], "first");
    // The second was handed over as a reference value.
    expectInstanceOnPath(reply.instances()[1], "second");
    EXPECT_EQ(reply.doneCount(), 1u);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(InstanceRequestPathTest, PathHandedToGetInstanceArrivesAsTheInstance) {
    orv::host::Reply reply = core->getInstance(path("Test_PathElement", "gamma"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.items().size(), 1u);
    ASSERT_EQ(reply.instances().size(), 1u);
    expectInstanceOnPath(reply.instances()[0], "gamma");
}

TEST_F(InstanceRequestPathTest, PathsHandedToEnumInstanceNamesStayPaths) {
    orv::host::Reply reply = core->enumerateInstanceNames(path("Test_PathElement"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(names(reply), (std::vector<std::string>{"first", "second"}));
}

}  // namespace
