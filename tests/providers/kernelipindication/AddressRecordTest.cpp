// The interface address records: equality, the IPv6 prefix rule, and the
// endpoint instances they build through the broker.
#include <arpa/inet.h>
#include <netinet/in.h>

#include <cstring>

#include "IpIndicationFixture.h"

namespace ipindication {
namespace {

using AddressPtr = ORV::KernelIpIndication::AddressPtr;

// An IPv6 entry made by hand, for netmasks no configured prefix produces.
struct Ipv6Entry {
    Ipv6Entry(const char* address, const char* netmask, uint32_t maskScope = 0) {
        auto& in6 = reinterpret_cast<sockaddr_in6&>(addressStorage);
        auto& mask = reinterpret_cast<sockaddr_in6&>(netmaskStorage);
        in6.sin6_family = AF_INET6;
        mask.sin6_family = AF_INET6;
        inet_pton(AF_INET6, address, &in6.sin6_addr);
        inet_pton(AF_INET6, netmask, &mask.sin6_addr);
        mask.sin6_scope_id = maskScope;
        entry.ifa_name = name;
        entry.ifa_addr = reinterpret_cast<sockaddr*>(&addressStorage);
        entry.ifa_netmask = reinterpret_cast<sockaddr*>(&netmaskStorage);
    }
    ifaddrs entry{};
    sockaddr_storage addressStorage{};
    sockaddr_storage netmaskStorage{};
    char name[8] = "vif0";
};

int prefixOf(const char* netmask, uint32_t maskScope = 0) {
    Ipv6Entry entry("fd00::1", netmask, maskScope);
    const ORV::IPv6Address record(&entry.entry);
    return record.getPrefixLength();
}

using IpAddressRecordTest = IpIndicationTest;

TEST_F(IpAddressRecordTest, Ipv4NetmaskChangeMakesRecordsOfTheSameAddressUnequal) {
    const std::vector<AddressPtr> narrow = recordsOf(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}));
    const std::vector<AddressPtr> wide = recordsOf(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.0.0"}}, {}}}));
    const std::vector<AddressPtr> again = recordsOf(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}));
    ASSERT_EQ(narrow.size(), 1U);
    ASSERT_EQ(wide.size(), 1U);
    ASSERT_EQ(again.size(), 1U);
    EXPECT_EQ(narrow[0]->getAddress(), wide[0]->getAddress());
    EXPECT_FALSE(narrow[0]->isEqual(wide[0].get()));
    EXPECT_FALSE(wide[0]->isEqual(narrow[0].get()));
    EXPECT_TRUE(narrow[0]->isEqual(again[0].get()));
    EXPECT_TRUE(narrow[0]->isEqual(narrow[0].get()));
    EXPECT_FALSE(narrow[0]->isEqual(nullptr));
}

TEST_F(IpAddressRecordTest, Ipv6ContiguousMaskGivesItsPrefixAndANonContiguousOneGivesZero) {
    EXPECT_EQ(prefixOf("ffff:ffff:ffff:ffff::"), 64);
    EXPECT_EQ(prefixOf("ff00:ff00::"), 0);
    EXPECT_EQ(prefixOf("ffff:ffff:ffff:ffff:ffff:ffff:ffff:ffff"), 128);
    EXPECT_EQ(prefixOf("ffff:fe00::"), 23);
    EXPECT_EQ(prefixOf("::"), 0);
    // Through the simulated host's list, and into the endpoint instance.
    const std::vector<AddressPtr> records = recordsOf(hostWith({Vnic{"vif0", std::nullopt, {{"fd00::1", 64}}}}));
    ASSERT_EQ(records.size(), 1U);
    const CmpiInstance instance = records[0]->buildInterfaceObject(context(), &broker(), "vif0");
    EXPECT_EQ(orv::providertest::classNameOf(instance.getEnc()), kernelip::kIPv6Class);
    EXPECT_EQ(orv::providertest::propertiesOf(instance.getEnc()), ipv6Endpoint("vif0", "fd00::1", 64));
}

TEST_F(IpAddressRecordTest, Ipv6PrefixIgnoresBitZeroButNeedsAZeroMaskScope) {
    // Bit 0 of the first byte that is not all ones is never examined.
    EXPECT_EQ(prefixOf("ffff:ff01::"), 24);
    EXPECT_EQ(prefixOf("ffff:ff03::"), 0);
    // The scope identifier after the 16 mask bytes is part of what is read.
    EXPECT_EQ(prefixOf("ffff:ffff:ffff:ffff::", 1), 0);
}

TEST_F(IpAddressRecordTest, GetPrefixCountsOverTheGivenLength) {
    const unsigned char allOnes[4] = {0xFF, 0xFF, 0xFF, 0xFF};
    const unsigned char trailing[4] = {0xFF, 0xF0, 0x00, 0x01};
    EXPECT_EQ(ORV::IPv6Address::getPrefix(allOnes, 0), 0);
    EXPECT_EQ(ORV::IPv6Address::getPrefix(allOnes, 4), 32);
    EXPECT_EQ(ORV::IPv6Address::getPrefix(trailing, 3), 12);
    EXPECT_EQ(ORV::IPv6Address::getPrefix(trailing, 4), 0);
}

TEST_F(IpAddressRecordTest, ComparingAnIpv4RecordWithAnIpv6RecordIsFalse) {
    const std::vector<AddressPtr> records =
        recordsOf(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {{"fd00::5", 64}}}}));
    ASSERT_EQ(records.size(), 2U);
    EXPECT_EQ(records[0]->getCreationClassName(), kernelip::kIPv4Class);
    EXPECT_EQ(records[1]->getCreationClassName(), kernelip::kIPv6Class);
    EXPECT_FALSE(records[0]->isEqual(records[1].get()));
    EXPECT_FALSE(records[1]->isEqual(records[0].get()));
}

TEST_F(IpAddressRecordTest, Ipv6EqualityComparesTheAddressTextOnly) {
    const std::vector<AddressPtr> narrow = recordsOf(hostWith({Vnic{"vif0", std::nullopt, {{"fd00::5", 64}}}}));
    const std::vector<AddressPtr> wide = recordsOf(hostWith({Vnic{"vif0", std::nullopt, {{"fd00::5", 48}}}}));
    ASSERT_EQ(narrow.size(), 1U);
    ASSERT_EQ(wide.size(), 1U);
    EXPECT_TRUE(narrow[0]->isEqual(wide[0].get()));
}

TEST_F(IpAddressRecordTest, Ipv4RecordBuildsItsEndpointInstance) {
    const std::vector<AddressPtr> records = recordsOf(hostWith({Vnic{"vif3", {{"192.168.5.7", "255.255.255.128"}}, {}}}));
    ASSERT_EQ(records.size(), 1U);
    EXPECT_EQ(records[0]->getType(), AF_INET);
    const CmpiInstance instance = records[0]->buildInterfaceObject(context(), &broker(), "vif3");
    EXPECT_EQ(orv::providertest::classNameOf(instance.getEnc()), kernelip::kIPv4Class);
    EXPECT_EQ(orv::providertest::nameSpaceOf(instance.getObjectPath().getEnc()), "root/cimv2");
    EXPECT_EQ(orv::providertest::propertiesOf(instance.getEnc()),
              ipv4Endpoint("vif3", "192.168.5.7", "255.255.255.128"));
}

TEST_F(IpAddressRecordTest, UnsupportedFamilyIsRefusedWithItsNumber) {
    sockaddr_storage address{};
    address.ss_family = AF_PACKET;
    ifaddrs entry{};
    char name[] = "vif0";
    entry.ifa_name = name;
    entry.ifa_addr = reinterpret_cast<sockaddr*>(&address);
    try {
        ORV::KernelIpIndication::getAddressPtr(&entry);
        FAIL() << "a link-layer entry made a record";
    } catch (const std::invalid_argument& e) {
        EXPECT_STREQ(e.what(), "Unsupported protocol family: 17");
    }
}

}  // namespace
}  // namespace ipindication
