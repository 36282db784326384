// Enumeration of kernel IP endpoints: which classes answer, in which order,
// and the exact properties of both instance kinds.
#include <filesystem>
#include <string>

#include "KernelIPFixture.h"
#include "orv/providertest/RegistrationFile.h"

namespace kernelip {
namespace {

using orv::providertest::classNamesOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyNamesOf;
using Endpoints = std::vector<std::pair<std::string, std::string>>;

class EndpointEnumerationTest : public KernelIPTest {};

// The key properties stay in a filtered instance whatever the property list
// says, so that the instance's path can still be built; then the requested ones.
std::vector<std::string> withKeys(const std::vector<std::string>& requested) {
    std::vector<std::string> names = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name"};
    names.insert(names.end(), requested.begin(), requested.end());
    return names;
}

TEST_F(EndpointEnumerationTest, IPv4InstanceCarriesItsPropertiesInOrderWithTypes) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.10", "255.255.255.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), ipv4Properties(kIPv4Class, "vif0", "10.0.0.10", "255.255.255.0"));
    EXPECT_EQ(orv::providertest::classNameOf(reply.instances()[0]), kIPv4Class);
}

TEST_F(EndpointEnumerationTest, IPv6InstanceCarriesItsPropertiesInOrderWithTypes) {
    serve(hostWith({Vnic{"vif3", std::nullopt, {{"2001:db8:0:1::42", 64}}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv6Class);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), ipv6Properties(kIPv6Class, "vif3", "2001:db8:0:1::42", 64));
}

// The host's name is not cached between requests: renaming the host shows in
// the very next answer.
TEST_F(EndpointEnumerationTest, SystemNameIsAskedAfreshOnEveryRequest) {
    Json host = hostWith({Vnic{"vif0", {{"10.0.0.10", "255.255.255.0"}}, {}}});
    for (const char* fqdn : {"first.lab.example.com", "second.lab.example.com"}) {
        host["host"]["fqdn"] = fqdn;
        serve(host);
        const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
        ASSERT_EQ(reply.instances().size(), 1U);
        EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "SystemName"),
                  (NamedValue{"SystemName", CMPI_string, fqdn}));
    }
}

TEST_F(EndpointEnumerationTest, PrefixLengthKeepsItsLowEightBits) {
    serve(hostWith({Vnic{"vif0", std::nullopt, {{"fd00::1", 300}}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv6Class);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "PrefixLength"),
              (NamedValue{"PrefixLength", CMPI_uint8, "44"}));
}

TEST_F(EndpointEnumerationTest, AddressZeroIsRenderedByInetNtoaAndReportsEnabledButOffline) {
    serve(hostWith({Vnic{"vif0", {{"0.0.0.0", "0.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    ASSERT_EQ(reply.instances().size(), 1U);
    std::vector<NamedValue> expected = ipv4Properties(kIPv4Class, "vif0", "0.0.0.0", "0.0.0.0");
    expected.push_back({"EnabledState", CMPI_uint16, "6"});
    EXPECT_EQ(propertiesOf(reply.instances()[0]), expected);
}

TEST_F(EndpointEnumerationTest, NonZeroAddressWithZeroNetmaskHasNoEnabledState) {
    serve(hostWith({Vnic{"vif0", {{"10.1.1.1", "0.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "EnabledState"), std::nullopt);
}

TEST_F(EndpointEnumerationTest, TwoIPv6AddressesYieldTwoInstancesWithTheSameName) {
    serve(hostWith({Vnic{"vif1", std::nullopt, {{"fe80::1", 64}, {"fd00::2", 56}}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv6Class);
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), ipv6Properties(kIPv6Class, "vif1", "fe80::1", 64));
    EXPECT_EQ(propertiesOf(reply.instances()[1]), ipv6Properties(kIPv6Class, "vif1", "fd00::2", 56));
}

TEST_F(EndpointEnumerationTest, KernelParentReturnsEveryRecordInKernelOrderUnderItsFamilyClass) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.1", "255.0.0.0"}}, {{"fe80::1", 64}, {"fd00::1", 64}}},
                    Vnic{"vif1", std::nullopt, {{"fe80::2", 64}}},
                    Vnic{"vif2", {{"10.0.0.2", "255.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kKernelParent);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif0"},
                                             {kIPv6Class, "vif1"},
                                             {kIPv4Class, "vif2"}}));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EndpointEnumerationTest, IPv4ClassReturnsOnlyIPv4Records) {
    serve(hostWith(threeVnics()));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"}, {kIPv4Class, "vif1"}, {kIPv4Class, "vif2"}}));
}

TEST_F(EndpointEnumerationTest, IPv6ClassReturnsOnlyIPv6Records) {
    serve(hostWith(threeVnics()));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv6Class);
    EXPECT_EQ(endpointsOf(reply),
              (Endpoints{{kIPv6Class, "vif0"}, {kIPv6Class, "vif0"}, {kIPv6Class, "vif1"}, {kIPv6Class, "vif2"}}));
}

TEST_F(EndpointEnumerationTest, CimParentReturnsBothFamilyClassesNeverTheParent) {
    serve(hostWith(threeVnics()));
    const orv::host::Reply reply = provider().enumerateInstances(kCimParent);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(classNamesOf(reply), (std::vector<std::string>{kIPv4Class, kIPv6Class, kIPv6Class, kIPv4Class,
                                                             kIPv6Class, kIPv4Class, kIPv6Class}));
}

TEST_F(EndpointEnumerationTest, ClassNamesAreComparedIgnoringCase) {
    serve(hostWith(threeVnics()));
    const orv::host::Reply reply = provider().enumerateInstances("ORVANE_kernelipv4protocolendpoint");
    EXPECT_EQ(endpointsOf(reply), (Endpoints{{kIPv4Class, "vif0"}, {kIPv4Class, "vif1"}, {kIPv4Class, "vif2"}}));
}

TEST_F(EndpointEnumerationTest, InterfaceNameLongerThan150CharactersIsCutTo150) {
    const std::string longName(180, 'n');
    serve(hostWith({Vnic{longName, {{"10.0.0.1", "255.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    ASSERT_EQ(reply.instances().size(), 1U);
    const std::string cut(150, 'n');
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "Name"), (NamedValue{"Name", CMPI_string, cut}));
    EXPECT_EQ(orv::providertest::propertyOf(reply.instances()[0], "ElementName"),
              (NamedValue{"ElementName", CMPI_string, cut}));
}

TEST_F(EndpointEnumerationTest, HostWithoutVnicsAnswersOkWithoutReturnDone) {
    serve(hostWith({}));
    const orv::host::Reply reply = provider().enumerateInstances(kKernelParent);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointEnumerationTest, VnicsWithoutAddressesAnswerOkWithoutReturnDone) {
    serve(hostWith({Vnic{"vif0", std::nullopt, {}}, Vnic{"vif1", std::nullopt, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kKernelParent);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointEnumerationTest, FamilyWithoutRecordsStillEndsWithReturnDone) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.1", "255.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv6Class);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(EndpointEnumerationTest, InstanceNamesCarryTheFourKeysOfEachRecord) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.1", "255.0.0.0"}}, {{"fe80::1", 64}}}}));
    const orv::host::Reply reply = provider().enumerateInstanceNames(kKernelParent);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.objectPaths().size(), 2U);
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(reply.doneCount(), 1U);
    const std::string classes[] = {kIPv4Class, kIPv6Class};
    for (std::size_t i = 0; i < 2; ++i) {
        const CMPIObjectPath* path = reply.objectPaths()[i];
        EXPECT_EQ(orv::providertest::nameSpaceOf(path), "root/cimv2");
        EXPECT_EQ(orv::providertest::classNameOf(path), classes[i]);
        std::vector<NamedValue> keys = orv::providertest::keysOf(path);
        std::sort(keys.begin(), keys.end(), [](const NamedValue& a, const NamedValue& b) { return a.name < b.name; });
        EXPECT_EQ(keys, (std::vector<NamedValue>{{"CreationClassName", CMPI_string, classes[i]},
                                                 {"Name", CMPI_string, "vif0"},
                                                 {"SystemCreationClassName", CMPI_string, "OMC_UnitaryComputerSystem"},
                                                 {"SystemName", CMPI_string, orv::providertest::SimHost::kFqdn}}));
    }
}

TEST_F(EndpointEnumerationTest, PropertyListKeepsOnlyTheRequestedProperties) {
    serve(hostWith({Vnic{"vif0", {{"0.0.0.0", "255.0.0.0"}}, {{"fe80::1", 64}}}}));
    const orv::host::Reply reply = provider().enumerateInstances(
        kKernelParent, std::vector<std::string>{"ipv4address", "PrefixLength", "EnabledState"});
    ASSERT_EQ(reply.instances().size(), 2U);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]), withKeys({"IPv4Address", "EnabledState"}));
    EXPECT_EQ(propertyNamesOf(reply.instances()[1]), withKeys({"PrefixLength"}));
}

TEST_F(EndpointEnumerationTest, EmptyPropertyListKeepsNoProperty) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.1", "255.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class, std::vector<std::string>{});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]), withKeys({}));
}

// Routes classes straight to the provider, so that it sees the class name as
// a client wrote it.
class DirectlyRoutedEnumerationTest : public ::testing::Test {
protected:
    DirectlyRoutedEnumerationTest() { host_.write(hostWith(threeVnics())); }

    orv::providertest::ProviderCore routed(const std::string& className) {
        const std::filesystem::path file = host_.path().parent_path() / "direct.reg";
        orv::providertest::writeRegistrationFile(file, {{className, "KernelIPProtocolEndpointProvider"}});
        orv::providertest::ProviderCoreOptions options;
        options.projectRegistrations = false;
        options.registrations = {file};
        return orv::providertest::ProviderCore(options);
    }

private:
    orv::providertest::SimHost host_;
};

TEST_F(DirectlyRoutedEnumerationTest, CimParentNamedInTheRequestReturnsBothFamilies) {
    orv::providertest::ProviderCore provider = routed(kCimParent);
    const orv::host::Reply reply = provider.enumerateInstances(kCimParent);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(classNamesOf(reply), (std::vector<std::string>{kIPv4Class, kIPv6Class, kIPv6Class, kIPv4Class,
                                                             kIPv6Class, kIPv4Class, kIPv6Class}));
}

TEST_F(DirectlyRoutedEnumerationTest, UnrelatedClassAnswersOkWithNothingAndNoReturnDone) {
    orv::providertest::ProviderCore provider = routed("CIM_EthernetPort");
    const orv::host::Reply reply = provider.enumerateInstances("CIM_EthernetPort");
    EXPECT_EQ(reply.providerCalls(), 1U);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

}  // namespace
}  // namespace kernelip
