// The NIC library answered by the sim substitute: every value is the fixture's.
#include <gtest/gtest.h>

#include "SimHost.h"
#include "tmkctl/network/NetworkInfoImpl.h"
#include "tmkctl/util/AutoVector.h"

namespace orv::platform::test {
namespace {

using namespace NodeMgr::Network;
using TmkCtl::Network::NetworkInfoImpl;
using TmkCtl::Util::AutoVector;

TEST(SimNetwork, GetPnicsListsEveryFixtureNicInOrder)
{
    SimHost host(defaultHost());
    NetworkInfoImpl network;
    AutoVector<Pnic> pnics = network.GetPnics();
    ASSERT_EQ(pnics.size(), 4u);
    EXPECT_EQ(pnics[0]->GetName(), "vmnic0");
    EXPECT_EQ(pnics[3]->GetName(), "vmnic3");
}

TEST(SimNetwork, PnicScalarsAreTheFixtureValues)
{
    Json fixture = defaultHost();
    Json& nic = fixture["nics"][1];
    nic["enabled"] = false;
    nic["linkUp"] = true;
    nic["speed"] = "CONNECTION_25000";
    nic["duplex"] = 2;
    nic["mtu"] = 1280;
    nic["mac"] = "0a:1B:2c:3D:4e:5F";
    nic["wakeOnLan"] = {{"supported", true}, {"enabled", true}};
    SimHost host(fixture);
    NetworkInfoImpl network;
    std::unique_ptr<Pnic> pnic(network.GetPnicByName("vmnic1"));
    ASSERT_NE(pnic, nullptr);
    EXPECT_FALSE(pnic->IsEnabled());
    EXPECT_TRUE(pnic->IsLinkUp());
    EXPECT_EQ(pnic->GetLinkSpeed(), CONNECTION_25000);
    EXPECT_EQ(pnic->GetDuplex(), DUPLEX_MODE_HALF);
    EXPECT_EQ(pnic->GetMTU(), 1280u);
    EXPECT_TRUE(pnic->GetWakeOnLANSupported());
    EXPECT_TRUE(pnic->GetWakeOnLANEnabled());
    unsigned char mac[6] = {};
    pnic->GetMacAddress().GetBinaryAddress(mac);
    const unsigned char expected[6] = {0x0a, 0x1b, 0x2c, 0x3d, 0x4e, 0x5f};
    EXPECT_EQ(std::memcmp(mac, expected, 6), 0);
}

TEST(SimNetwork, PciDeviceIsTheFixturesOrNullWhenAbsent)
{
    Json fixture = defaultHost();
    fixture["nics"][0]["pci"] = {{"segment", 1}, {"bus", 171}, {"slot", 2}, {"function", 1},
                                 {"vendorId", 0x14e4}, {"deviceId", 0x16d7}};
    SimHost host(fixture);
    NetworkInfoImpl network;
    AutoVector<Pnic> pnics = network.GetPnics();
    PciDevice* pci = pnics[0]->GetPciDevice();
    ASSERT_NE(pci, nullptr);
    EXPECT_EQ(pci->GetSegment(), 1);
    EXPECT_EQ(pci->GetBus(), 171);
    EXPECT_EQ(pci->GetSlot(), 2);
    EXPECT_EQ(pci->GetFunction(), 1);
    EXPECT_EQ(pci->GetVendorId(), 0x14e4);
    EXPECT_EQ(pci->GetDeviceId(), 0x16d7);
    EXPECT_EQ(pnics[3]->GetPciDevice(), nullptr);
    EXPECT_TRUE(pnics[3]->IsPseudoDevice());
}

TEST(SimNetwork, RecordsAreCopiedFieldByField)
{
    Json fixture = defaultHost();
    Json& nic = fixture["nics"][2];
    nic["stats"]["dot3OutPauseFrames"] = 18446744073709551615ull;
    nic["stats"]["packetsTx"] = 7;
    nic["coalesce"]["txFrameHigh"] = 4294967295u;
    nic["coalesce"]["adaptiveTX"] = true;
    nic["pause"]["rxAutoNegRes"] = "AUTO_NEG_OFF";
    nic["rings"]["current"]["rxJumbo"] = 33;
    nic["rings"]["preset"]["rxJumbo"] = 44;
    nic["driver"]["firmwareVersion"] = "fw 1.2";
    nic["info"]["wakeOn"] = {"WAKEON_MODE_MAGIC", 8};
    nic["info"]["advertisedLinkModes"] = {{{"speed", 3}, {"duplex", 7}}};
    nic["info"]["linkStatus"] = "Down";
    SimHost host(fixture);
    NetworkInfoImpl network;
    std::unique_ptr<Pnic> pnic(network.GetPnicByName("vmnic2"));
    ASSERT_NE(pnic, nullptr);
    PnicStats stats;
    pnic->GetPnicStats(stats);
    EXPECT_EQ(stats.dot3OutPauseFrames, UINT64_MAX);
    EXPECT_EQ(stats.packetsTx, 7u);
    EXPECT_EQ(stats.packetsRx, 3001u);  // the generator's value for this position
    PnicCoalesceInfo coalesce;
    pnic->GetPnicCoalesceInfo(coalesce);
    EXPECT_EQ(coalesce.txFrameHigh, UINT32_MAX);
    EXPECT_TRUE(coalesce.adaptiveTX);
    PnicPauseInfo pause;
    pnic->GetPnicPauseInfo(pause);
    EXPECT_EQ(pause.rxAutoNegRes, AUTO_NEG_OFF);
    EXPECT_EQ(pause.txAutoNegRes, AUTO_NEG_OFF);
    PnicRingInfo preset;
    PnicRingInfo current;
    pnic->GetPnicRingInfo(preset, current);
    EXPECT_EQ(current.rxJumbo, 33u);
    EXPECT_EQ(preset.rxJumbo, 44u);
    PnicDriverInfo driver;
    pnic->GetPnicDriverInfo(driver);
    EXPECT_EQ(driver.firmwareVersion, "fw 1.2");
    EXPECT_EQ(driver.name, "igbn");
    PnicInfo info;
    pnic->GetPnicInfo(info);
    ASSERT_EQ(info.wakeOn.size(), 2u);
    EXPECT_EQ(info.wakeOn[1], WAKEON_MODE_DISABLE);
    ASSERT_EQ(info.advertisedLinkModes.size(), 1u);
    EXPECT_EQ(info.advertisedLinkModes[0].first, static_cast<LinkSpeed>(3));
    EXPECT_EQ(info.advertisedLinkModes[0].second, static_cast<Duplex>(7));
    EXPECT_EQ(info.linkStatus, "Down");
    EXPECT_EQ(info.port, PNICPORT_MODE_TP);
}

TEST(SimNetwork, GetPnicByNameOfAnUnknownNicIsNull)
{
    SimHost host(defaultHost());
    NetworkInfoImpl network;
    EXPECT_EQ(network.GetPnicByName("vmnic99"), nullptr);
}

TEST(SimNetwork, AbsentRecordThrowsLikeAnAdapterWithoutIt)
{
    Json fixture = defaultHost();
    fixture["nics"][0].erase("coalesce");
    SimHost host(fixture);
    NetworkInfoImpl network;
    std::unique_ptr<Pnic> pnic(network.GetPnicByName("vmnic0"));
    PnicCoalesceInfo coalesce;
    EXPECT_THROW(pnic->GetPnicCoalesceInfo(coalesce), NodeMgr::Lib::NodeMgrException);
    PnicStats stats;
    EXPECT_NO_THROW(pnic->GetPnicStats(stats));
}

TEST(SimNetwork, HostWithoutNicSectionFailsGetPnics)
{
    Json fixture = defaultHost();
    fixture.erase("nics");
    SimHost host(fixture);
    NetworkInfoImpl network;
    EXPECT_THROW(network.GetPnics(), NodeMgr::Lib::NodeMgrException);
}

TEST(SimNetwork, PnicOutlivesAFixtureChange)
{
    SimHost host(defaultHost());
    std::unique_ptr<Pnic> pnic(NetworkInfoImpl().GetPnicByName("vmnic0"));
    Json changed = defaultHost();
    changed["nics"][0]["mtu"] = 4000;
    host.rewrite(changed);
    NetworkInfoImpl network;  // a new request sees the change
    std::unique_ptr<Pnic> fresh(network.GetPnicByName("vmnic0"));
    EXPECT_EQ(pnic->GetMTU(), 9000u);
    EXPECT_EQ(fresh->GetMTU(), 4000u);
}

} // namespace
} // namespace orv::platform::test
