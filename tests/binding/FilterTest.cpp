// Property filters and the two result filters, seen through the broker.
#include "CoreFixture.h"

namespace {

using orv::bindingtest::CoreFixture;

orv::host::CallOptions withProperties(std::vector<std::string> properties) {
    orv::host::CallOptions opts;
    opts.properties = std::move(properties);
    return opts;
}

TEST_F(CoreFixture, PropertyFilterDropsExcludedPropertiesAndKeepsKeys) {
    orv::host::Reply reply = core->enumerateInstances(path("Test_Element"), withProperties({"Label"}));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 2u);
    for (const CMPIInstance* inst : reply.instances()) {
        EXPECT_NE(property(inst, "Label"), "<missing>");
        CMPIStatus st{CMPI_RC_OK, nullptr};
        inst->ft->getProperty(inst, "Count", &st);
        EXPECT_NE(st.rc, CMPI_RC_OK) << "Count was not requested";
    }
    EXPECT_EQ(names(reply), (std::vector<std::string>{"alpha", "beta"}));
}

TEST_F(CoreFixture, NoPropertyListKeepsEveryProperty) {
    orv::host::Reply reply = core->getInstance(path("Test_Element", "beta"));
    ASSERT_EQ(reply.instances().size(), 1u);
    CMPIData count = reply.instances()[0]->ft->getProperty(reply.instances()[0], "Count", nullptr);
    EXPECT_EQ(count.type, CMPI_uint32);
    EXPECT_EQ(count.value.uint32, 4u);
}

TEST_F(CoreFixture, InstanceToPathFilterTurnsEnumeratedInstancesIntoTheirPaths) {
    orv::host::Reply reply = core->enumerateInstanceNames(path("Test_Element"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.instances().empty());
    ASSERT_EQ(reply.objectPaths().size(), 2u);
    EXPECT_EQ(names(reply), (std::vector<std::string>{"alpha", "beta"}));
    EXPECT_EQ(className(reply.objectPaths()[0]), "Test_Element");
    EXPECT_GE(reply.doneCount(), 1u);
}

TEST_F(CoreFixture, PathToInstanceFilterTurnsPathsIntoInstancesCarryingTheKeys) {
    orv::host::Reply reply = core->enumerateInstances(path("Test_Link"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.objectPaths().empty());
    // Test_Link and its subclass Test_StrongLink.
    ASSERT_EQ(reply.instances().size(), 3u);
    std::vector<std::string> ends;
    for (const CMPIInstance* inst : reply.instances()) {
        CMPIData left = inst->ft->getProperty(inst, "Left", nullptr);
        CMPIData right = inst->ft->getProperty(inst, "Right", nullptr);
        ASSERT_EQ(left.type, CMPI_ref);
        ASSERT_EQ(right.type, CMPI_ref);
        ends.push_back(key(left.value.ref, "Name") + "->" + key(right.value.ref, "Name"));
    }
    EXPECT_EQ(ends, (std::vector<std::string>{"alpha->beta", "alpha->gamma", "sub1->alpha"}));
}

}  // namespace
