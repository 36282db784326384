// The simulated host's interface-address list: the default stack's vNICs laid
// out as getifaddrs lays out a kernel's list, re-read when the fixture changes,
// with injected failures and injected entries.
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <netinet/in.h>

#include <cerrno>
#include <string>
#include <vector>

#include "FixtureReader.h"
#include "SimHost.h"
#include "orv/platform/InterfaceAddresses.h"

namespace orv::platform::test {
namespace {

// The text of an IPv4 or IPv6 socket address; "-" when absent.
void render(int family, const sockaddr* address, char (&text)[INET6_ADDRSTRLEN])
{
    if (address == nullptr) {
        return;
    }
    const void* bytes = family == AF_INET
                            ? static_cast<const void*>(&reinterpret_cast<const sockaddr_in*>(address)->sin_addr)
                            : static_cast<const void*>(&reinterpret_cast<const sockaddr_in6*>(address)->sin6_addr);
    inet_ntop(family, bytes, text, sizeof text);
}

// One entry as text: "name family address/netmask" ("-" when absent).
std::string describe(const ifaddrs& entry)
{
    std::string text = std::string(entry.ifa_name) + " ";
    if (entry.ifa_addr == nullptr) {
        return text + "none";
    }
    const int family = entry.ifa_addr->sa_family;
    char address[INET6_ADDRSTRLEN] = "-";
    char netmask[INET6_ADDRSTRLEN] = "-";
    if (family == AF_INET || family == AF_INET6) {
        render(family, entry.ifa_addr, address);
        render(family, entry.ifa_netmask, netmask);
    }
    return text + std::to_string(family) + " " + address + "/" + netmask;
}

std::vector<std::string> listed()
{
    ifaddrs* list = nullptr;
    EXPECT_EQ(OrvHost_GetIfAddrs(&list), 0);
    std::vector<std::string> entries;
    for (const ifaddrs* entry = list; entry != nullptr; entry = entry->ifa_next) {
        entries.push_back(describe(*entry));
    }
    OrvHost_FreeIfAddrs(list);
    return entries;
}

Json vnic(const std::string& name, const Json& ipv4, const Json& ipv6)
{
    Json entry = {{"name", name}, {"ipv6", ipv6}};
    if (!ipv4.is_null()) {
        entry["ipv4"] = ipv4;
    }
    return entry;
}

Json hostWithVnics(const Json& vnics)
{
    Json fixture = defaultHost();
    fixture["tcpipStacks"] = {{"defaultTcpipStack", {{"vnics", vnics}}}, {"otherStack", {{"vnics", Json::array()}}}};
    return fixture;
}

Json twoVnics()
{
    return hostWithVnics(Json::array(
        {vnic("vif0", {{"address", "10.0.0.10"}, {"netmask", "255.255.255.0"}},
              Json::array({{{"address", "fe80::1"}, {"prefixLength", 64}},
                           {{"address", "fd00::10"}, {"prefixLength", 61}}})),
         nullptr,
         vnic("vif1", nullptr,
              Json::array({{{"address", "fd01::10"}, {"prefixLength", 200}},
                           {{"address", "not an address"}, {"prefixLength", 64}}}))}));
}

TEST(SimInterfaces, LinksThenIpv4ThenIpv6InInterfaceOrder)
{
    SimHost host(twoVnics());
    EXPECT_EQ(listed(), (std::vector<std::string>{
                            "vif0 17 -/-",
                            "vif1 17 -/-",
                            "vif0 2 10.0.0.10/255.255.255.0",
                            "vif0 10 fe80::1/ffff:ffff:ffff:ffff::",
                            "vif0 10 fd00::10/ffff:ffff:ffff:fff8::",
                            "vif1 10 fd01::10/ffff:ffff:ffff:ffff:ffff:ffff:ffff:ffff",
                        }));
}

TEST(SimInterfaces, HostWithoutTheDefaultStackListsNothing)
{
    Json fixture = defaultHost();
    fixture.erase("tcpipStacks");
    SimHost host(fixture);
    EXPECT_EQ(listed(), std::vector<std::string>{});
}

TEST(SimInterfaces, RewrittenFixtureChangesTheList)
{
    SimHost host(twoVnics());
    EXPECT_EQ(listed().size(), 6u);
    host.rewrite(hostWithVnics(
        Json::array({vnic("vif7", {{"address", "10.7.0.1"}, {"netmask", "255.0.0.0"}}, Json::array())})));
    EXPECT_EQ(listed(), (std::vector<std::string>{"vif7 17 -/-", "vif7 2 10.7.0.1/255.0.0.0"}));
}

TEST(SimInterfaces, InjectedFailureAnswersItsStatus)
{
    Json fixture = twoVnics();
    addFault(fixture, {{"call", "getifaddrs"}, {"nth", 2}});
    addFault(fixture, {{"call", "getifaddrs"}, {"nth", 3}, {"status", -11}});
    SimHost host(fixture);
    ifaddrs* list = nullptr;
    EXPECT_EQ(OrvHost_GetIfAddrs(&list), 0);
    OrvHost_FreeIfAddrs(list);
    errno = 0;
    EXPECT_EQ(OrvHost_GetIfAddrs(&list), -1);
    EXPECT_EQ(errno, EIO);
    EXPECT_EQ(list, nullptr);
    EXPECT_EQ(OrvHost_GetIfAddrs(&list), -11);
    EXPECT_EQ(list, nullptr);
    EXPECT_EQ(OrvHost_GetIfAddrs(&list), 0);
    OrvHost_FreeIfAddrs(list);
}

TEST(SimInterfaces, InjectedEntriesPrecedeTheirInterfaceLink)
{
    Json fixture = twoVnics();
    addFault(fixture, {{"call", "getifaddrs"}, {"nic", "vif1"}, {"family", nullptr}});
    addFault(fixture, {{"call", "getifaddrs"}, {"nic", "vif1"}, {"family", 99}});
    addFault(fixture, {{"call", "getifaddrs"}, {"nic", "vif0"}, {"family", 2}, {"nth", 2}});
    SimHost host(fixture);
    const std::vector<std::string> first = listed();
    ASSERT_EQ(first.size(), 8u);
    EXPECT_EQ(std::vector<std::string>(first.begin(), first.begin() + 4),
              (std::vector<std::string>{"vif0 17 -/-", "vif1 none", "vif1 99 -/-", "vif1 17 -/-"}));
    const std::vector<std::string> second = listed();
    ASSERT_EQ(second.size(), 9u);
    EXPECT_EQ(second[0], "vif0 2 0.0.0.0/-");
}

TEST(SimInterfaces, AddedEntryRulesAreChecked)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "GetPnics"}, {"family", 2}});
    sim::FixtureResult result = sim::parseFixture(fixture.dump(), "host.json");
    EXPECT_EQ(result.error, "host.json: $.faults[0].family: only getifaddrs rules add an entry");

    fixture = defaultHost();
    addFault(fixture, {{"call", "getifaddrs"}, {"family", 2}});
    result = sim::parseFixture(fixture.dump(), "host.json");
    EXPECT_EQ(result.error, "host.json: $.faults[0].family: an added entry needs \"nic\", the interface it belongs to");
}

} // namespace
} // namespace orv::platform::test
