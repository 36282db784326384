// The non-key properties of a NIC's driver and firmware identities, its
// statistics, and its coalescing, pause and ring settings. Each operation asks
// the NIC for its record first, then (except the identities) for its name, and
// then sets the properties in a fixed order.
#include "EthernetPort-Fill.h"
#include "EthernetPort-Provider.h"

namespace EthernetProvider {

using namespace NodeMgr::Network;

namespace {

template <typename Record, typename Value>
using Field = std::pair<const char*, Value Record::*>;

// The published counters; the multicast, broadcast and 802.3 counters are not.
const Field<PnicStats, uint64_t> kStatsFields[] = {
    {"packetsTx", &PnicStats::packetsTx},
    {"packetsRx", &PnicStats::packetsRx},
    {"bytesTx", &PnicStats::bytesTx},
    {"bytesRx", &PnicStats::bytesRx},
    {"errorsTx", &PnicStats::errorsTx},
    {"errorsRx", &PnicStats::errorsRx},
    {"droppedTx", &PnicStats::droppedTx},
    {"droppedRx", &PnicStats::droppedRx},
    {"RxLengthErrors", &PnicStats::RxLengthErrors},
    {"RxOverErrors", &PnicStats::RxOverErrors},
    {"RxCRCErrors", &PnicStats::RxCRCErrors},
    {"RxFrameErrors", &PnicStats::RxFrameErrors},
    {"RxFIFOErrors", &PnicStats::RxFIFOErrors},
    {"RxMissedErrors", &PnicStats::RxMissedErrors},
    {"TxAbortedErrors", &PnicStats::TxAbortedErrors},
    {"TxFIFOErrors", &PnicStats::TxFIFOErrors},
    {"TxCarrierErrors", &PnicStats::TxCarrierErrors},
    {"TxHeartbeatErrors", &PnicStats::TxHeartbeatErrors},
    {"TxWindowErrors", &PnicStats::TxWindowErrors},
};

const Field<PnicCoalesceInfo, bool> kCoalesceFlags[] = {
    {"adaptiveRX", &PnicCoalesceInfo::adaptiveRX},
    {"adaptiveTX", &PnicCoalesceInfo::adaptiveTX},
};

const Field<PnicCoalesceInfo, uint32_t> kCoalesceValues[] = {
    {"statsBlockUsecs", &PnicCoalesceInfo::statsBlockUsecs},
    {"sampleInterval", &PnicCoalesceInfo::sampleInterval},
    {"pktRateLow", &PnicCoalesceInfo::pktRateLow},
    {"pktRateHigh", &PnicCoalesceInfo::pktRateHigh},
    {"rxUsecs", &PnicCoalesceInfo::rxUsecs},
    {"rxFrames", &PnicCoalesceInfo::rxFrames},
    {"rxUsecsIrq", &PnicCoalesceInfo::rxUsecsIrq},
    {"rxFramesIrq", &PnicCoalesceInfo::rxFramesIrq},
    {"txUsecs", &PnicCoalesceInfo::txUsecs},
    {"txFrames", &PnicCoalesceInfo::txFrames},
    {"txUsecsIrq", &PnicCoalesceInfo::txUsecsIrq},
    {"txFramesIrq", &PnicCoalesceInfo::txFramesIrq},
    {"rxUsecsLow", &PnicCoalesceInfo::rxUsecsLow},
    {"rxFrameLow", &PnicCoalesceInfo::rxFrameLow},
    {"txUsecsLow", &PnicCoalesceInfo::txUsecsLow},
    {"txFrameLow", &PnicCoalesceInfo::txFrameLow},
    {"rxUsecsHigh", &PnicCoalesceInfo::rxUsecsHigh},
    {"rxFrameHigh", &PnicCoalesceInfo::rxFrameHigh},
    {"txUsecsHigh", &PnicCoalesceInfo::txUsecsHigh},
    {"txFrameHigh", &PnicCoalesceInfo::txFrameHigh},
};

const Field<PnicPauseInfo, bool> kPauseFlags[] = {
    {"supported", &PnicPauseInfo::supported},
    {"autoNegotiate", &PnicPauseInfo::autoNegotiate},
    {"rxStatus", &PnicPauseInfo::rxStatus},
    {"txStatus", &PnicPauseInfo::txStatus},
};

const Field<PnicRingInfo, uint32_t> kRingSizes[] = {
    {"rx", &PnicRingInfo::rx},
    {"rxMini", &PnicRingInfo::rxMini},
    {"rxJumbo", &PnicRingInfo::rxJumbo},
    {"tx", &PnicRingInfo::tx},
};

// ElementName is the driver name and the kind; VersionString repeats it
// ahead of the version.
void setSoftwareIdentity(CmpiInstance& instance, const std::string& driverName, const char* kind,
                         const std::string& version) {
    std::string text = driverName + kind;
    instance.setProperty("ElementName", CmpiData(text.c_str()));
    text += version;
    instance.setProperty("VersionString", CmpiData(text.c_str()));
}

void setElementName(CmpiInstance& instance, const std::string& name) {
    instance.setProperty("ElementName", CmpiData(name.c_str()));
}

}  // namespace

void EthernetPortProvider::fillEPDriverInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicDriverInfo driver;
        pnic->GetPnicDriverInfo(driver);
        setSoftwareIdentity(instance, driver.name, " driver ", driver.version);
    });
}

void EthernetPortProvider::fillEPFirmwareInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicDriverInfo driver;
        pnic->GetPnicDriverInfo(driver);
        setSoftwareIdentity(instance, driver.name, " device firmware ", driver.firmwareVersion);
    });
}

void EthernetPortProvider::fillEPStatsInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicStats stats{};
        pnic->GetPnicStats(stats);
        const std::string name = pnic->GetName();
        instance.setProperty("Name", CmpiData(name.c_str()));
        setElementName(instance, name);
        instance.setProperty("Caption", CmpiData(name.c_str()));
        instance.setProperty("Description", CmpiData((name + " statistics").c_str()));
        setFields(instance, stats, kStatsFields);
    });
}

void EthernetPortProvider::fillEPCoalesceInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicCoalesceInfo coalesce{};
        pnic->GetPnicCoalesceInfo(coalesce);
        setElementName(instance, pnic->GetName());
        setFields(instance, coalesce, kCoalesceFlags);
        setFields(instance, coalesce, kCoalesceValues);
    });
}

void EthernetPortProvider::fillEPPauseParamsInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicPauseInfo pause{};
        pnic->GetPnicPauseInfo(pause);
        setElementName(instance, pnic->GetName());
        setFields(instance, pause, kPauseFlags);
        instance.setProperty("rxAutoNegRes", CmpiData(static_cast<CMPIUint32>(pause.rxAutoNegRes)));
        instance.setProperty("txAutoNegRes", CmpiData(static_cast<CMPIUint32>(pause.txAutoNegRes)));
    });
}

// One call fills both records: the first holds the preset sizes, the second
// the current ones.
void EthernetPortProvider::fillEPRingInstance(CmpiInstance& instance, Pnic* pnic, bool current) {
    guardFill([&] {
        PnicRingInfo preset{};
        PnicRingInfo inUse{};
        pnic->GetPnicRingInfo(preset, inUse);
        const PnicRingInfo& ring = current ? inUse : preset;
        setElementName(instance, pnic->GetName());
        instance.setProperty("changed", CmpiData(static_cast<CMPIUint8>(ring.changed)));
        setFields(instance, ring, kRingSizes);
    });
}

}  // namespace EthernetProvider
