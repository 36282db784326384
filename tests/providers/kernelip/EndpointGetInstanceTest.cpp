// getInstance: lookup by Name alone, first record of that name, whatever its
// family, answered under the requested family class.
#include <string>

#include "KernelIPFixture.h"

namespace kernelip {
namespace {

using orv::providertest::propertiesOf;
using orv::providertest::StringKeys;

StringKeys keysFor(const std::string& className, const std::string& name) {
    return {{"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
            {"SystemName", orv::providertest::SimHost::kFqdn},
            {"CreationClassName", className},
            {"Name", name}};
}

class EndpointGetInstanceTest : public KernelIPTest {
protected:
    void SetUp() override { serve(hostWith(threeVnics())); }

    // The one instance the request returned, after checking OK and one returnDone.
    const CMPIInstance* single(const orv::host::Reply& reply) {
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        EXPECT_EQ(reply.doneCount(), 1U);
        EXPECT_EQ(reply.instances().size(), 1U);
        return reply.instances().empty() ? nullptr : reply.instances()[0];
    }
};

TEST_F(EndpointGetInstanceTest, IPv4ClassFindsTheInterfaceByName) {
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, keysFor(kIPv4Class, "vif1"));
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance), ipv4Properties(kIPv4Class, "vif1", "10.0.1.10", "255.255.0.0"));
    EXPECT_EQ(orv::providertest::classNameOf(instance), kIPv4Class);
}

TEST_F(EndpointGetInstanceTest, IPv6ClassOfIPv6OnlyInterfaceAnswersItsFirstAddress) {
    serve(hostWith({Vnic{"vif5", std::nullopt, {{"fd05::1", 64}, {"fd05::2", 80}}}}));
    const orv::host::Reply reply = provider().getInstance(kIPv6Class, keysFor(kIPv6Class, "vif5"));
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance), ipv6Properties(kIPv6Class, "vif5", "fd05::1", 64));
}

TEST_F(EndpointGetInstanceTest, SecondIPv6AddressOfAnInterfaceIsNeverReached) {
    serve(hostWith({Vnic{"vif5", std::nullopt, {{"fd05::1", 64}, {"fd05::2", 80}}}}));
    const orv::host::Reply reply = provider().getInstance(kIPv6Class, keysFor(kIPv6Class, "vif5"));
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(orv::providertest::propertyOf(instance, "IPv6Address"),
              (NamedValue{"IPv6Address", CMPI_string, "fd05::1"}));
}

TEST_F(EndpointGetInstanceTest, IPv6ClassOfInterfaceWithIPv4AnswersFromItsIPv4Record) {
    const orv::host::Reply reply = provider().getInstance(kIPv6Class, keysFor(kIPv6Class, "vif0"));
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance), ipv4Properties(kIPv6Class, "vif0", "10.0.0.10", "255.255.255.0"));
    EXPECT_EQ(orv::providertest::classNameOf(instance), kIPv6Class);
}

TEST_F(EndpointGetInstanceTest, IPv4ClassOfIPv6OnlyInterfaceAnswersFromItsFirstIPv6Record) {
    serve(hostWith({Vnic{"vif5", std::nullopt, {{"fd05::1", 64}, {"fd05::2", 80}}}}));
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, keysFor(kIPv4Class, "vif5"));
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance), ipv6Properties(kIPv4Class, "vif5", "fd05::1", 64));
}

TEST_F(EndpointGetInstanceTest, ClassNameIsComparedIgnoringCaseAndAnsweredInItsOwnSpelling) {
    const orv::host::Reply reply = provider().getInstance("orvane_KERNELipv4protocolendpoint", {{"Name", "vif2"}});
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(orv::providertest::classNameOf(instance), kIPv4Class);
    EXPECT_EQ(orv::providertest::propertyOf(instance, "CreationClassName"),
              (NamedValue{"CreationClassName", CMPI_string, kIPv4Class}));
}

TEST_F(EndpointGetInstanceTest, UnknownNameIsNotFoundWithoutMessage) {
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, keysFor(kIPv4Class, "vif7"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "");
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointGetInstanceTest, NameIsComparedExactly) {
    EXPECT_EQ(provider().getInstance(kIPv4Class, {{"Name", "VIF0"}}).rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(provider().getInstance(kIPv4Class, {{"Name", "vif"}}).rc(), CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(EndpointGetInstanceTest, OtherKeysOfTheRequestAreNotExamined) {
    const orv::host::Reply reply = provider().getInstance(
        kIPv4Class, {{"SystemCreationClassName", "Other_System"}, {"SystemName", "elsewhere"},
                     {"CreationClassName", "Other_Class"}, {"Name", "vif1"}});
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance), ipv4Properties(kIPv4Class, "vif1", "10.0.1.10", "255.255.0.0"));
}

TEST_F(EndpointGetInstanceTest, NameLongerThan150CharactersMatchesOnItsFirst150) {
    const std::string longName(170, 'x');
    serve(hostWith({Vnic{longName, {{"10.0.0.1", "255.0.0.0"}}, {}}}));
    const std::string sameStart = std::string(150, 'x') + "different tail";
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, {{"Name", sameStart}});
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(orv::providertest::propertyOf(instance, "Name"), (NamedValue{"Name", CMPI_string, std::string(150, 'x')}));
}

TEST_F(EndpointGetInstanceTest, KernelParentIsNotLookedUpByKey) {
    const orv::host::Reply reply = provider().getInstance(kKernelParent, keysFor(kKernelParent, "vif0"));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(EndpointGetInstanceTest, PropertyListKeepsOnlyTheRequestedProperties) {
    const orv::host::Reply reply =
        provider().getInstance(kIPv4Class, keysFor(kIPv4Class, "vif0"), std::vector<std::string>{"SubnetMask"});
    const CMPIInstance* instance = single(reply);
    ASSERT_NE(instance, nullptr);
    std::vector<NamedValue> expected = commonProperties(kIPv4Class, "vif0", 4096);
    expected.erase(expected.begin() + 4, expected.end());  // the keys stay for the path
    expected.push_back({"SubnetMask", CMPI_string, "255.255.255.0"});
    EXPECT_EQ(propertiesOf(instance), expected);
}

TEST_F(EndpointGetInstanceTest, HostWithoutRecordsAnswersOkWithNothing) {
    serve(hostWith({}));
    const orv::host::Reply reply = provider().getInstance(kIPv4Class, keysFor(kIPv4Class, "vif0"));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

}  // namespace
}  // namespace kernelip
