// Enumeration of "Orvane_Processor": one instance per package, in collection
// order, with every property, type and array element the provider sets.
#include <algorithm>

#include "ProcessorFixture.h"

namespace processortest {
namespace {

using orv::providertest::keysOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyNamesOf;

// The keys of the instance's own object path, in name order.
std::vector<NamedValue> sortedPathKeysOf(const CMPIInstance* instance) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    std::vector<NamedValue> keys = keysOf(instance->ft->getObjectPath(instance, &st));
    std::sort(keys.begin(), keys.end(), [](const NamedValue& a, const NamedValue& b) { return a.name < b.name; });
    return keys;
}

std::vector<NamedValue> sortedKeyValues(const std::string& deviceId) {
    std::vector<NamedValue> keys = processorKeyValues(deviceId);
    std::sort(keys.begin(), keys.end(), [](const NamedValue& a, const NamedValue& b) { return a.name < b.name; });
    return keys;
}

class EnumerationTest : public ProcessorTest {};

TEST_F(EnumerationTest, EveryPackageHasEveryPropertyInOrderWithItsType) {
    serve(uniformHost(2, 2));
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), uniformPackageProperties("cpu-0", 2));
    EXPECT_EQ(propertiesOf(reply.instances()[1]), uniformPackageProperties("cpu-1", 2));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EnumerationTest, InstancesComeInPackageOrder) {
    serve(uniformHost(3, 1));
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(deviceIdsOf(reply), (std::vector<std::string>{"cpu-0", "cpu-1", "cpu-2"}));
}

TEST_F(EnumerationTest, InstanceNamesCarryFiveKeysWithElementName) {
    serve(uniformHost(2, 1));
    const orv::host::Reply reply = provider().enumerateInstanceNames(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.objectPaths().size(), 2U);
    std::vector<NamedValue> keys = keysOf(reply.objectPaths()[1]);
    std::sort(keys.begin(), keys.end(), [](const NamedValue& a, const NamedValue& b) { return a.name < b.name; });
    EXPECT_EQ(keys, sortedKeyValues("cpu-1"));
    EXPECT_EQ(orv::providertest::classNameOf(reply.objectPaths()[1]), kProcessorClass);
    EXPECT_EQ(orv::providertest::nameSpaceOf(reply.objectPaths()[1]), "root/cimv2");
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EnumerationTest, ClassNameInAnyLetterCaseIsServed) {
    serve(uniformHost(2, 1));
    for (const char* name : {"orvane_processor", "ORVANE_PROCESSOR", "Orvane_processor"}) {
        const orv::host::Reply reply = provider().enumerateInstances(name);
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << name;
        EXPECT_EQ(deviceIdsOf(reply), (std::vector<std::string>{"cpu-0", "cpu-1"})) << name;
    }
}

TEST_F(EnumerationTest, HostWithNullPackageListAnswersOkWithNothing) {
    CpuHost host = uniformHost(0, 0);
    host.packages = std::nullopt;
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EnumerationTest, HostWithNoPackagesAnswersOkWithNothing) {
    serve(uniformHost(0, 0));
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
    const orv::host::Reply names = provider().enumerateInstanceNames(kProcessorClass);
    EXPECT_EQ(names.rc(), CMPI_RC_OK);
    EXPECT_TRUE(names.items().empty());
}

TEST_F(EnumerationTest, PropertyListNamingOnlyDeviceIdKeepsTheKeysAndAFiveKeyPath) {
    serve(uniformHost(1, 1));
    const orv::host::Reply reply =
        provider().enumerateInstances(kProcessorClass, std::vector<std::string>{"DeviceID"});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), processorKeyValues("cpu-0"));
    EXPECT_EQ(sortedPathKeysOf(reply.instances()[0]), sortedKeyValues("cpu-0"));
}

TEST_F(EnumerationTest, PropertyListAddsTheNamedPropertiesToTheKeys) {
    serve(uniformHost(1, 1));
    const orv::host::Reply reply =
        provider().enumerateInstances(kProcessorClass, std::vector<std::string>{"Vendor", "Characteristics"});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]),
              (std::vector<std::string>{"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID",
                                        "ElementName", "Vendor", "Characteristics"}));
}

TEST_F(EnumerationTest, EmptyPropertyListKeepsOnlyTheKeys) {
    serve(uniformHost(1, 1));
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass, std::vector<std::string>{});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), processorKeyValues("cpu-0"));
}

TEST_F(EnumerationTest, AmdPackageIsVendorThree) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].cpuid = amdLeaves(0x01, 0x04, 0);
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "Vendor"), "3");
    EXPECT_EQ(textOf(reply.instances()[0], "OtherIdentifyingInfo"), "[0x   1]");
    EXPECT_EQ(textOf(reply.instances()[0], "Characteristics"), "[<null>, 4, 5, <null>, 7]");
}

TEST_F(EnumerationTest, PackageWithoutFeaturesHasFiveNullCharacteristics) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].cpuid = vendorLeaves(0x746E6543, 0x48727561, 0x736C7561);
    host.htState = "HTNotPresent";
    host.policyShortName = "off";
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    const CMPIInstance* instance = reply.instances()[0];
    EXPECT_EQ(textOf(instance, "Vendor"), "1");
    EXPECT_EQ(textOf(instance, "OtherIdentifyingInfo"), "[0x   0]");
    const std::string nulls = "[<null>, <null>, <null>, <null>, <null>]";
    EXPECT_EQ(orv::providertest::propertyOf(instance, "Characteristics"),
              (NamedValue{"Characteristics", CMPI_uint16A, nulls}));
    EXPECT_EQ(orv::providertest::propertyOf(instance, "EnabledProcessorCharacteristics"),
              (NamedValue{"EnabledProcessorCharacteristics", CMPI_uint16A, nulls}));
}

TEST_F(EnumerationTest, PowerControlSupportedButNotEnabledIsDisabled) {
    CpuHost host = uniformHost(1, 1);
    host.policyShortName = "static";
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "Characteristics"), "[2, 4, 5, 6, 7]");
    EXPECT_EQ(textOf(reply.instances()[0], "EnabledProcessorCharacteristics"), "[2, 2, 2, 2, 3]");
}

TEST_F(EnumerationTest, BrandIdIsTheWholeValueReadingOfLeafOneEbx) {
    CpuHost host = uniformHost(2, 1);
    host.cpus[0].cpuid = intelLeaves(0x0A, 0, 0);
    host.cpus[1].cpuid = intelLeaves(0x00000100, 0, 0);
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(textOf(reply.instances()[0], "OtherIdentifyingInfo"), "[0x   f]");
    EXPECT_EQ(textOf(reply.instances()[1], "OtherIdentifyingInfo"), "[0x  ff]");
    EXPECT_EQ(textOf(reply.instances()[0], "Characteristics"), "[<null>, <null>, 5, <null>, 7]");
}

TEST_F(EnumerationTest, BusyPackageHasCpuStatusOne) {
    CpuHost host = uniformHost(2, 2);
    host.cpus[3].halted = true;
    host.cpus[3].activeLoad = 1;
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "CPUStatus"),
              (NamedValue{"CPUStatus", CMPI_uint16, "4"}));
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[1], "CPUStatus"),
              (NamedValue{"CPUStatus", CMPI_uint16, "1"}));
}

TEST_F(EnumerationTest, CoreCountKeepsItsLowSixteenBits) {
    CpuHost host = uniformHost(1, 1);
    (*host.packages)[0].cores = 65537;
    host.cpus[0].halted = true;
    host.cpus[0].activeLoad = 1;  // the status walk ends at the first core
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "NumberOfEnabledCores"), "1");
}

TEST_F(EnumerationTest, SteppingAndModelNameComeFromTheKernelRecords) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].stepping = 201;
    host.modelName = Json::array({'X', '\t', 'Y', 0xC3, 0xA9});
    serve(host);
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(textOf(reply.instances()[0], "Stepping"), "201");
    EXPECT_EQ(textOf(reply.instances()[0], "ModelName"), "X Y  ");
}

TEST_F(EnumerationTest, EveryRequestReadsTheHostAfresh) {
    serve(uniformHost(1, 1));
    EXPECT_EQ(deviceIdsOf(provider().enumerateInstances(kProcessorClass)), (std::vector<std::string>{"cpu-0"}));
    serve(uniformHost(3, 1));
    EXPECT_EQ(deviceIdsOf(provider().enumerateInstances(kProcessorClass)),
              (std::vector<std::string>{"cpu-0", "cpu-1", "cpu-2"}));
}

}  // namespace
}  // namespace processortest
