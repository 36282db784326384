// Many ports in one request: the ports share what is equal among them (the
// system name, arrays with the same elements), and each still carries exactly
// what it carries when it is the host's only port. A host that is rewritten
// between or during requests is seen whole by each request.
#include <atomic>
#include <string>
#include <thread>

#include "EthernetFixture.h"

namespace ethernet {
namespace {

using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

Json linkMode(const std::string& speed, const std::string& duplex) {
    return Json{{"speed", speed}, {"duplex", duplex}};
}

// A NIC whose lists differ from nic()'s in every element.
Json otherNic(const std::string& name) {
    Json out = nic(name);
    out["mac"] = "00:50:56:aa:bb:0c";
    out["pci"]["bus"] = 3;
    out["wakeOnLan"] = {{"supported", false}, {"enabled", true}};
    out["linkUp"] = false;
    out["info"]["supportedPorts"] = Json::array({"PNICPORT_MODE_TP"});
    out["info"]["supportedLinkModes"] = Json::array({linkMode("CONNECTION_100", "DUPLEX_MODE_HALF")});
    out["info"]["advertisedLinkModes"] = Json::array({linkMode("CONNECTION_100", "DUPLEX_MODE_HALF")});
    out["info"]["supportsWakeOn"] = Json::array({"WAKEON_MODE_PHY"});
    out["info"]["wakeOn"] = Json::array();
    return out;
}

class ManyPortsTest : public EthernetTest {
protected:
    // The properties of the port of a host that has only nicJson.
    std::vector<NamedValue> alone(const Json& nicJson) {
        serve(hostWith({nicJson}));
        const Reply reply = provider().enumerateInstances(kPort);
        EXPECT_EQ(reply.instances().size(), 1u);
        return reply.instances().empty() ? std::vector<NamedValue>{} : propertiesOf(reply.instances()[0]);
    }
};

TEST_F(ManyPortsTest, EachPortOfOneRequestIsThePortServedAlone) {
    Json third = nic("vmnic2");
    third["pci"] = nullptr;
    third["info"]["advertisedLinkModes"] = third["info"]["supportedLinkModes"];
    const std::vector<Json> nics = {nic("vmnic0"), otherNic("vmnic1"), third, otherNic("vmnic3"), nic("vmnic4")};
    std::vector<std::vector<NamedValue>> expected;
    for (const Json& one : nics) {
        expected.push_back(alone(one));
    }
    serve(hostWith(nics));
    const Reply reply = provider().enumerateInstances(kPort);
    ASSERT_EQ(reply.instances().size(), nics.size());
    for (std::size_t i = 0; i < nics.size(); ++i) {
        EXPECT_EQ(propertiesOf(reply.instances()[i]), expected[i]) << "port " << i;
    }
}

// More distinct arrays than a request keeps for sharing: the ones after
// that are made for their port alone, with the same content.
TEST_F(ManyPortsTest, PortsWithMoreDistinctListsThanAreSharedEachGetTheirOwn) {
    const std::vector<std::pair<std::string, std::string>> speeds = {
        {"CONNECTION_10", "10"},       {"CONNECTION_100", "100"},     {"CONNECTION_1000", "1000"},
        {"CONNECTION_2500", "2500"},   {"CONNECTION_5000", "5000"},   {"CONNECTION_10000", "10000"},
        {"CONNECTION_20000", "20000"}, {"CONNECTION_25000", "25000"}, {"CONNECTION_40000", "40000"},
        {"CONNECTION_50000", "50000"}, {"CONNECTION_56000", "56000"}, {"CONNECTION_100000", "100000"},
        {"CONNECTION_AUTO", "AUTO"}};
    const std::vector<std::pair<std::string, std::string>> duplexes = {
        {"DUPLEX_MODE_FULL", "FULL"}, {"DUPLEX_MODE_HALF", "HALF"}, {"DUPLEX_MODE_AUTO", "AUTO"}};
    std::vector<Json> nics;
    std::vector<std::string> texts;
    for (const auto& [speed, speedText] : speeds) {
        for (const auto& [duplex, duplexText] : duplexes) {
            Json one = nic("vmnic" + std::to_string(nics.size()));
            one["info"]["supportedLinkModes"] = Json::array({linkMode(speed, duplex)});
            one["info"]["wakeOn"] = Json::array();
            for (std::size_t i = 0; i <= nics.size() % 7; ++i) {
                one["info"]["wakeOn"].push_back("WAKEON_MODE_MAGIC");
            }
            nics.push_back(one);
            texts.push_back("[" + speedText + "_" + duplexText + "]");
        }
    }
    ASSERT_GT(nics.size(), 32u);
    serve(hostWith(nics));
    const Reply reply = provider().enumerateInstances(kPort);
    ASSERT_EQ(reply.instances().size(), nics.size());
    for (std::size_t i = 0; i < nics.size(); ++i) {
        const CMPIInstance* port = reply.instances()[i];
        EXPECT_EQ(propertyOf(port, "SupportedLinkModes")->text, texts[i]) << "port " << i;
        EXPECT_EQ(propertyOf(port, "AdvertisedLinkModes")->text, "[10000_HALF]") << "port " << i;
        std::string wakeOn = "[6";
        for (std::size_t k = 0; k < i % 7; ++k) {
            wakeOn += ", 6";
        }
        EXPECT_EQ(propertyOf(port, "WOLOptions")->text, wakeOn + "]") << "port " << i;
    }
}

TEST_F(ManyPortsTest, TheSystemNameOfEveryPortAndPathIsTheHosts) {
    serve(hostWith({nic("vmnic0"), otherNic("vmnic1"), nic("vmnic2")}));
    const Reply ports = provider().enumerateInstances(kPort);
    ASSERT_EQ(ports.instances().size(), 3u);
    for (const CMPIInstance* port : ports.instances()) {
        EXPECT_EQ(propertyOf(port, "SystemName")->text, orv::providertest::SimHost::kFqdn);
    }
    const Reply names = provider().enumerateInstanceNames(kPort);
    ASSERT_EQ(names.objectPaths().size(), 3u);
    for (const CMPIObjectPath* path : names.objectPaths()) {
        EXPECT_EQ(orv::providertest::keysOf(path)[2],
                  (NamedValue{"SystemName", CMPI_string, orv::providertest::SimHost::kFqdn}));
    }
}

TEST_F(ManyPortsTest, ARewrittenHostIsWhatTheNextRequestSees) {
    Json changed = nic("vmnic0");
    changed["info"]["supportedLinkModes"] = Json::array({linkMode("CONNECTION_25000", "DUPLEX_MODE_FULL")});
    changed["mtu"] = 1500;
    serve(hostWith({nic("vmnic0"), nic("vmnic1")}));
    ASSERT_EQ(provider().getInstance(kPort, {{"DeviceID", "vmnic1"}}).instances().size(), 1u);
    ASSERT_EQ(provider().enumerateInstances(kPort).instances().size(), 2u);

    serve(hostWith({otherNic("vmnic7"), changed}));
    const Reply gone = provider().getInstance(kPort, {{"DeviceID", "vmnic1"}});
    EXPECT_EQ(gone.rc(), CMPI_RC_OK);
    EXPECT_TRUE(gone.items().empty());
    const Reply added = provider().getInstance(kPort, {{"DeviceID", "vmnic7"}});
    ASSERT_EQ(added.instances().size(), 1u);
    EXPECT_EQ(propertyOf(added.instances()[0], "SupportedLinkModes")->text, "[100_HALF]");
    const Reply all = provider().enumerateInstances(kPort);
    ASSERT_EQ(all.instances().size(), 2u);
    EXPECT_EQ(propertyOf(all.instances()[0], "DeviceID")->text, "vmnic7");
    EXPECT_EQ(propertyOf(all.instances()[1], "SupportedLinkModes")->text, "[25000_FULL]");
    EXPECT_EQ(propertyOf(all.instances()[1], "ActiveMaximumTransmissionUnit")->text, "1500");
}

// Two hosts of four ports that differ in every port's MTU and link modes; a
// request sees one of them whole.
struct Variant {
    Json fixture;
    std::string mtu;
    std::string linkModes;
};

Variant variant(const std::string& mtu, const std::string& speed, const std::string& linkModes) {
    std::vector<Json> nics;
    for (int i = 0; i < 4; ++i) {
        Json one = nic("vmnic" + std::to_string(i));
        one["mtu"] = std::stoul(mtu);
        one["info"]["supportedLinkModes"] = Json::array({linkMode(speed, "DUPLEX_MODE_FULL")});
        nics.push_back(one);
    }
    return Variant{hostWith(nics), mtu, linkModes};
}

// Which variant the port is of; -1 for neither (a mixed port).
int variantOf(const CMPIInstance* port, const std::vector<Variant>& variants) {
    const std::string mtu = propertyOf(port, "ActiveMaximumTransmissionUnit")->text;
    const std::string modes = propertyOf(port, "SupportedLinkModes")->text;
    for (std::size_t v = 0; v < variants.size(); ++v) {
        if (variants[v].mtu == mtu && variants[v].linkModes == modes) {
            return static_cast<int>(v);
        }
    }
    return -1;
}

// Whether every port of the reply is of one and the same variant.
bool wholeVariant(const Reply& reply, const std::vector<Variant>& variants, std::size_t ports) {
    if (reply.rc() != CMPI_RC_OK || reply.instances().size() != ports) {
        return false;
    }
    const int first = variantOf(reply.instances()[0], variants);
    for (const CMPIInstance* port : reply.instances()) {
        if (variantOf(port, variants) != first || first < 0) {
            return false;
        }
    }
    return true;
}

TEST_F(ManyPortsTest, RequestsWhileTheHostIsRewrittenEachSeeOneWholeHost) {
    const std::vector<Variant> variants = {variant("1500", "CONNECTION_1000", "[1000_FULL]"),
                                           variant("9000", "CONNECTION_40000", "[40000_FULL]")};
    serve(variants[0].fixture);
    provider();
    std::atomic<bool> writing{true};
    std::atomic<int> requests{0};
    std::atomic<int> mismatches{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < 3; ++t) {
        threads.emplace_back([&] {
            while (writing.load() || requests.load() < 30) {
                const Reply all = provider().enumerateInstances(kPort);
                const Reply one = provider().getInstance(kPort, {{"DeviceID", "vmnic3"}});
                if (!wholeVariant(all, variants, 4) || !wholeVariant(one, variants, 1)) {
                    ++mismatches;
                }
                ++requests;
            }
        });
    }
    for (int i = 1; i <= 40; ++i) {
        serve(variants[i % 2].fixture);
        std::this_thread::yield();
    }
    writing = false;
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(mismatches.load(), 0);
    EXPECT_GE(requests.load(), 30);
}

}  // namespace
}  // namespace ethernet
