// Generated fixtures load, with the requested sizes.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <set>
#include <sstream>
#include <tuple>

#include "FixtureReader.h"
#include "orv/platform/simgen/HostGenerator.h"

namespace orv::platform::test {
namespace {

TEST(FixtureGenerator, LargeHostLoadsWithTheRequestedShape)
{
    simgen::HostShape shape;
    shape.nics = 64;
    shape.nicsWithoutPci = 3;
    shape.packages = 4;
    shape.coresPerPackage = 12;
    shape.threadsPerCore = 2;
    shape.vnics = 300;
    shape.ipv6PerVnic = 5;
    sim::FixtureResult result = sim::parseFixture(simgen::generateHostText(shape), "generated.json");
    ASSERT_NE(result.host, nullptr) << result.error;
    ASSERT_EQ(result.host->nics->size(), 64u);
    EXPECT_TRUE(result.host->nics->at(60).pci.has_value());
    EXPECT_FALSE(result.host->nics->at(61).pci.has_value());
    EXPECT_EQ(result.host->cpu->packages.items.size(), 4u);
    EXPECT_EQ(result.host->cpu->packages.items[3].cores, 12u);
    EXPECT_EQ(result.host->cpu->cpus.items.size(), 96u);
    const sim::StackModel& stack = result.host->tcpipStacks->at("defaultTcpipStack");
    ASSERT_EQ(stack.vnics.items.size(), 300u);
    EXPECT_EQ(stack.vnics.items[299].ipv6.items.size(), 5u);
    EXPECT_TRUE(stack.vnics.items[299].ipv4.has_value());
}

// Two functions per bus on buses from 3 up: past 506 NICs the bus number no
// longer fits its 8 bits unless the adapters go on to another segment.
TEST(FixtureGenerator, HostOfManyNicsLoadsWithUniquePciAddressesMatchingTheBusInfo)
{
    simgen::HostShape shape;
    shape.nics = 1024;
    shape.nicsWithoutPci = 0;
    sim::FixtureResult result = sim::parseFixture(simgen::generateHostText(shape), "generated.json");
    ASSERT_NE(result.host, nullptr) << result.error;
    ASSERT_EQ(result.host->nics->size(), 1024u);
    std::set<std::tuple<unsigned, unsigned, unsigned>> addresses;
    for (const sim::NicModel& nic : *result.host->nics) {
        ASSERT_TRUE(nic.pci.has_value()) << nic.name;
        const sim::PciModel& pci = *nic.pci;
        EXPECT_TRUE(addresses.emplace(pci.segment, pci.bus, pci.function).second) << nic.name;
        char busInfo[32];
        std::snprintf(busInfo, sizeof busInfo, "%04x:%02x:%02x.%u", unsigned{pci.segment}, unsigned{pci.bus},
                      unsigned{pci.slot}, unsigned{pci.function});
        EXPECT_EQ(nic.driver->busInfo, busInfo) << nic.name;
    }
    EXPECT_EQ(result.host->nics->at(505).pci->bus, 255u);
    EXPECT_EQ(result.host->nics->at(506).pci->segment, 1u);
}

TEST(FixtureGenerator, HostWithoutAddressesLoads)
{
    simgen::HostShape shape;
    shape.ipv4 = false;
    shape.ipv6PerVnic = 0;
    sim::FixtureResult result = sim::parseFixture(simgen::generateHostText(shape), "generated.json");
    ASSERT_NE(result.host, nullptr) << result.error;
    EXPECT_FALSE(result.host->tcpipStacks->at("defaultTcpipStack").vnics.items[0].ipv4.has_value());
}

TEST(FixtureGenerator, ShippedExampleLoadsAndHasTheDescribedHost)
{
    const char* source = std::getenv("ORV_SOURCE_DIR");
    ASSERT_NE(source, nullptr);
    const std::string path = std::string(source) + "/platform/sim/examples/host.json";
    sim::FixtureResult result = sim::readFixtureFile(path);
    ASSERT_NE(result.host, nullptr) << result.error;
    EXPECT_EQ(result.host->nics->size(), 4u);
    EXPECT_FALSE(result.host->nics->back().pci.has_value());
    EXPECT_EQ(result.host->cpu->packages.items.size(), 2u);
    EXPECT_EQ(result.host->cpu->packages.items[0].cores, 8u);
    EXPECT_EQ(result.host->tcpipStacks->at("defaultTcpipStack").vnics.items.size(), 2u);
    EXPECT_TRUE(result.host->version->record.has_value());
}

} // namespace
} // namespace orv::platform::test
