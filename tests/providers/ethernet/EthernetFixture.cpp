#include "EthernetFixture.h"

#include <cmpift.h>

#include <cstdlib>

namespace ethernet {

namespace {

// The provider fixture finds the sources and the built library through these
// variables; a run outside ctest gets the folders this test was built for.
const bool kFoldersKnown = [] {
    setenv("ORV_SOURCE_DIR", ORV_ETHERNET_SOURCE_DIR, 0);
    setenv("ORV_BUILD_DIR", ORV_ETHERNET_BUILD_DIR, 0);
    return true;
}();

}  // namespace

const std::vector<FarEnd>& farEnds() {
    static const std::vector<FarEnd> kRows = {
        {"Orvane_EPDriverSoftwareIdentity", "Orvane_EPDriverElementSoftwareIdentity", "Dependent", "Antecedent"},
        {"Orvane_EPFirmwareSoftwareIdentity", "Orvane_EPFirmwareElementSoftwareIdentity", "Dependent", "Antecedent"},
        {"Orvane_EPStatisticalInformation", "Orvane_EPStatistics", "Element", "Stats"},
        {"Orvane_EPCoalesceSettingData", "Orvane_EPCoalesceElementSettingData", "ManagedElement", "SettingData"},
        {"Orvane_EPPauseParamsSettingData", "Orvane_EPPauseParamsElementSettingData", "ManagedElement",
         "SettingData"},
        {"Orvane_EPRingCurrentSettingData", "Orvane_EPRingCurrentElementSettingData", "ManagedElement",
         "SettingData"},
        {"Orvane_EPRingPresetSettingData", "Orvane_EPRingPresetElementSettingData", "ManagedElement",
         "SettingData"},
    };
    return kRows;
}

std::vector<std::string> servedClasses() {
    std::vector<std::string> classes{kPort};
    for (const FarEnd& row : farEnds()) {
        classes.emplace_back(row.className);
    }
    for (const FarEnd& row : farEnds()) {
        classes.emplace_back(row.assocClass);
    }
    return classes;
}

std::string instanceId(const std::string& className, const std::string& name) {
    return "Orvane:" + className + ":" + name;
}

namespace {

Json linkMode(const char* speed, const char* duplex) { return Json{{"speed", speed}, {"duplex", duplex}}; }

Json info() {
    Json out;
    out["supportedPorts"] = Json::array({"PNICPORT_MODE_TP", "PNICPORT_MODE_FIBRE", "PNICPORT_MODE_UNKNOWN"});
    out["supportedLinkModes"] =
        Json::array({linkMode("CONNECTION_1000", "DUPLEX_MODE_FULL"), linkMode("CONNECTION_10000", "DUPLEX_MODE_FULL"),
                     linkMode("CONNECTION_AUTO", "DUPLEX_MODE_AUTO")});
    out["advertisedLinkModes"] = Json::array({linkMode("CONNECTION_10000", "DUPLEX_MODE_HALF")});
    for (const char* flag : {"linkStatusChanged", "portChanged", "phyadChanged", "viradChanged", "transceiverChanged",
                             "autoNegChanged", "autoNegotiation", "wolChanged", "wolSupported", "msglvlChanged",
                             "msglvlSupported"}) {
        out[flag] = false;
    }
    out["supportsAutoNegotiation"] = true;
    out["advertisedAutoNegotiation"] = false;
    out["speed"] = "CONNECTION_10000";
    out["duplex"] = "DUPLEX_MODE_FULL";
    out["port"] = "PNICPORT_MODE_FIBRE";
    out["PHYAD"] = 7;
    out["transceiver"] = "TRANSCEIVER_MODE_EXTERNAL";
    out["supportsWakeOn"] = Json::array({"WAKEON_MODE_MAGIC", "WAKEON_MODE_UCAST", "WAKEON_MODE_DISABLE"});
    out["wakeOn"] = Json::array({"WAKEON_MODE_PHY"});
    out["messageLevel"] = 7;
    out["viraddr"] = "";
    out["linkStatus"] = "Up";
    return out;
}

const char* const kStatsNames[] = {
    "packetsTx", "packetsRx", "bytesTx", "bytesRx", "errorsTx", "errorsRx", "droppedTx", "droppedRx",
    "multicastPktsRx", "broadcastPktsRx", "multicastPktsTx", "broadcastPktsTx", "RxLengthErrors", "RxOverErrors",
    "RxCRCErrors", "RxFrameErrors", "RxFIFOErrors", "RxMissedErrors", "TxAbortedErrors", "TxFIFOErrors",
    "TxCarrierErrors", "TxHeartbeatErrors", "TxWindowErrors", "dot3StatsAlignmentErrors", "dot3StatsFCSErrors",
    "dot3StatsInternalMacTransmitErrors", "dot3StatsFrameTooLongs", "dot3StatsInternalMacReceiveErrors",
    "dot3StatsSingleCollisionFrames", "dot3StatsMultipleCollisionFrames", "dot3StatsSQETestErrors",
    "dot3StatsDeferredTransmissions", "dot3StatsLateCollisions", "dot3StatsExcessiveCollisions",
    "dot3StatsCarrierSenseErrors", "dot3StatsSymbolErrors", "dot3ControlInUnknownOpcodes", "dot3InPauseFrames",
    "dot3OutPauseFrames"};

const char* const kCoalesceNames[] = {
    "statsBlockUsecs", "sampleInterval", "pktRateLow", "pktRateHigh", "rxUsecs", "rxFrames", "rxUsecsIrq",
    "rxFramesIrq", "txUsecs", "txFrames", "txUsecsIrq", "txFramesIrq", "rxUsecsLow", "rxFrameLow", "txUsecsLow",
    "txFrameLow", "rxUsecsHigh", "rxFrameHigh", "txUsecsHigh", "txFrameHigh"};

Json stats() {
    Json out;
    std::uint64_t value = 100;
    for (const char* name : kStatsNames) {
        out[name] = value++;
    }
    out["bytesRx"] = 5000000000ULL;
    return out;
}

Json coalesce() {
    Json out{{"adaptiveRX", true}, {"adaptiveTX", false}};
    std::uint32_t value = 11;
    for (const char* name : kCoalesceNames) {
        out[name] = value;
        value += 3;
    }
    return out;
}

Json ring(unsigned changed, unsigned rx, unsigned rxMini, unsigned rxJumbo, unsigned tx) {
    return Json{{"changed", changed}, {"rx", rx}, {"rxMini", rxMini}, {"rxJumbo", rxJumbo}, {"tx", tx}};
}

}  // namespace

Json nic(const std::string& name) {
    Json out;
    out["name"] = name;
    out["pci"] = {{"segment", 0x1a}, {"bus", 171}, {"slot", 4}, {"function", 1}, {"vendorId", 0x8086},
                  {"deviceId", 0x10fb}};
    out["mac"] = "0a:1b:2c:3d:4e:5f";
    out["enabled"] = true;
    out["linkUp"] = true;
    out["speed"] = 10000;
    out["duplex"] = "DUPLEX_MODE_FULL";
    out["mtu"] = 9000;
    out["wakeOnLan"] = {{"supported", true}, {"enabled", false}};
    out["info"] = info();
    out["driver"] = {{"name", "e1000e"}, {"version", "3.2"}, {"firmwareVersion", "0x800005b6"},
                     {"busInfo", "0000:ab:04.1"}};
    out["stats"] = stats();
    out["coalesce"] = coalesce();
    out["pause"] = {{"supported", true},   {"autoNegotiate", false},        {"rxStatus", true},
                    {"txStatus", false},   {"rxAutoNegRes", "AUTO_NEG_ON"}, {"txAutoNegRes", "AUTO_NEG_OFF"}};
    out["rings"] = {{"current", ring(1, 512, 0, 64, 1024)}, {"preset", ring(0, 4096, 32, 256, 4096)}};
    return out;
}

Json fault(const std::string& call, const std::string& nicName, unsigned nth) {
    Json rule{{"call", call}};
    if (!nicName.empty()) {
        rule["nic"] = nicName;
    }
    if (nth > 0) {
        rule["nth"] = nth;
    }
    return rule;
}

Json hostWith(const std::vector<Json>& nics, const Json& faults) {
    return orv::providertest::SimHost::withHost({{"nics", nics}, {"faults", faults}});
}

void EthernetTest::serve(const Json& fixture) { host_.write(fixture); }

orv::providertest::ProviderCore& EthernetTest::provider() {
    if (!provider_) {
        provider_ = std::make_unique<orv::providertest::ProviderCore>();
    }
    return *provider_;
}

CMPIObjectPath* EthernetTest::portPath(const std::string& name) {
    return provider().path(kPort, {{"DeviceID", name},
                                   {"SystemCreationClassName", kSystemClass},
                                   {"SystemName", orv::providertest::SimHost::kFqdn},
                                   {"CreationClassName", kPort}});
}

CMPIObjectPath* EthernetTest::portPathWithoutDeviceId() {
    return provider().path(kPort, {{"SystemCreationClassName", kSystemClass},
                                   {"SystemName", orv::providertest::SimHost::kFqdn},
                                   {"CreationClassName", kPort}});
}

CMPIObjectPath* EthernetTest::farEndPath(const std::string& className, const std::string& id) {
    return provider().path(className, {{"InstanceID", id}});
}

const CMPIInstance* EthernetTest::instanceAt(const Reply& reply, std::size_t index) {
    const std::vector<const CMPIInstance*> instances = reply.instances();
    EXPECT_LT(index, instances.size());
    return index < instances.size() ? instances[index] : nullptr;
}

std::string portRefText(const std::string& name) {
    return std::string("root/cimv2:") + kPort + ".DeviceID=" + name +
           ",SystemCreationClassName=" + kSystemClass + ",SystemName=" + orv::providertest::SimHost::kFqdn +
           ",CreationClassName=" + kPort;
}

std::string farEndRefText(const std::string& className, const std::string& name) {
    return "root/cimv2:" + className + ".InstanceID=" + instanceId(className, name);
}

}  // namespace ethernet
