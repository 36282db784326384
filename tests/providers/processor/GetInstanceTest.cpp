// getInstance of "Orvane_Processor": the package is found by the number after
// the last "-" of its DeviceID alone.
#include "ProcessorFixture.h"

namespace processortest {
namespace {

using orv::providertest::propertiesOf;

class GetInstanceTest : public ProcessorTest {
protected:
    // Two packages of two and three cores: cpu-0 and cpu-1 differ in their core count.
    void serveTwoPackages() {
        CpuHost host = uniformHost(2, 3);
        (*host.packages)[0].cores = 2;
        serve(host);
    }

    void expectNotFound(const orv::host::Reply& reply) {
        EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
        EXPECT_EQ(reply.message(), "");
        EXPECT_TRUE(reply.items().empty());
        EXPECT_EQ(reply.doneCount(), 0U);
    }

    // The core count of the one package the reply returned.
    std::string coresOfFoundPackage(const orv::host::Reply& reply) {
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        EXPECT_EQ(reply.doneCount(), 1U);
        if (reply.instances().size() != 1U) {
            return "<" + std::to_string(reply.instances().size()) + " instances>";
        }
        return textOf(reply.instances()[0], "NumberOfEnabledCores");
    }
};

TEST_F(GetInstanceTest, FirstPackageHasEveryProperty) {
    serve(uniformHost(2, 2));
    const orv::host::Reply reply = getPackage("cpu-0");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), uniformPackageProperties("cpu-0", 2));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(GetInstanceTest, CpuOneOnATwoPackageHostIsTheSecondPackage) {
    serveTwoPackages();
    const orv::host::Reply reply = getPackage("cpu-1");
    EXPECT_EQ(coresOfFoundPackage(reply), "3");
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "DeviceID"), "cpu-1");
    EXPECT_EQ(textOf(reply.instances()[0], "ElementName"), "cpu-1");
}

TEST_F(GetInstanceTest, CpuZeroOneIsAlsoTheSecondPackage) {
    serveTwoPackages();
    const orv::host::Reply reply = getPackage("cpu-01");
    EXPECT_EQ(coresOfFoundPackage(reply), "3");
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "DeviceID"), "cpu-1");
}

TEST_F(GetInstanceTest, OnlyTheNumberAfterTheLastDashCounts) {
    serveTwoPackages();
    EXPECT_EQ(coresOfFoundPackage(getPackage("package-1")), "3");
    EXPECT_EQ(coresOfFoundPackage(getPackage("cpu-7-0")), "2");
    EXPECT_EQ(coresOfFoundPackage(getPackage("-1")), "3");
}

TEST_F(GetInstanceTest, TextThatIsNoNumberReadsAsTheFirstPackage) {
    serveTwoPackages();
    EXPECT_EQ(coresOfFoundPackage(getPackage("cpu-x")), "2");
    EXPECT_EQ(coresOfFoundPackage(getPackage("cpu-")), "2");
}

TEST_F(GetInstanceTest, DeviceIdWithoutDashIsNotFound) {
    serveTwoPackages();
    expectNotFound(getPackage("cpu1"));
    expectNotFound(getPackage(""));
}

TEST_F(GetInstanceTest, NumberBeyondThePackagesIsNotFound) {
    serveTwoPackages();
    expectNotFound(getPackage("cpu-2"));
    expectNotFound(getPackage("cpu-99999999999999999999999"));
}

TEST_F(GetInstanceTest, PathWithoutDeviceIdIsNotFound) {
    serveTwoPackages();
    expectNotFound(provider().getInstance(kProcessorClass, {{"CreationClassName", kProcessorClass}}));
}

TEST_F(GetInstanceTest, OtherKeysAreNotCompared) {
    serveTwoPackages();
    const orv::host::Reply reply = provider().getInstance(
        kProcessorClass, {{"SystemCreationClassName", "Elsewhere"},
                          {"SystemName", "another.host"},
                          {"CreationClassName", "CIM_Processor"},
                          {"DeviceID", "cpu-1"},
                          {"ElementName", "cpu-0"}});
    EXPECT_EQ(coresOfFoundPackage(reply), "3");
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "SystemName"), orv::providertest::SimHost::kFqdn);
    EXPECT_EQ(textOf(reply.instances()[0], "ElementName"), "cpu-1");
}

TEST_F(GetInstanceTest, HostWithNoPackagesIsNotFound) {
    serve(uniformHost(0, 0));
    expectNotFound(getPackage("cpu-0"));
    CpuHost host = uniformHost(0, 0);
    host.packages = std::nullopt;
    serve(host);
    expectNotFound(getPackage("cpu-0"));
}

TEST_F(GetInstanceTest, ClassNameInAnyLetterCaseIsServed) {
    serveTwoPackages();
    const orv::host::Reply reply = provider().getInstance("orvane_PROCESSOR", processorKeys("cpu-1"));
    EXPECT_EQ(coresOfFoundPackage(reply), "3");
}

TEST_F(GetInstanceTest, PropertyListNamingOnlyDeviceIdKeepsTheKeys) {
    serveTwoPackages();
    const orv::host::Reply reply = getPackage("cpu-1", std::vector<std::string>{"DeviceID"});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), processorKeyValues("cpu-1"));
}

}  // namespace
}  // namespace processortest
