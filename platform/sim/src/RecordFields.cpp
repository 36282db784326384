#include "orv/platform/sim/RecordFields.h"

#include "ksi/KsiRecords.h"

namespace orv::platform::sim {

using namespace NodeMgr::Network;

#define ORV_FIELD(Record, member) {#member, &Record::member}

const FieldTable<PnicStats, uint64_t>& statsFields()
{
    static const FieldTable<PnicStats, uint64_t> table = {
        ORV_FIELD(PnicStats, packetsTx), ORV_FIELD(PnicStats, packetsRx), ORV_FIELD(PnicStats, bytesTx),
        ORV_FIELD(PnicStats, bytesRx), ORV_FIELD(PnicStats, errorsTx), ORV_FIELD(PnicStats, errorsRx),
        ORV_FIELD(PnicStats, droppedTx), ORV_FIELD(PnicStats, droppedRx), ORV_FIELD(PnicStats, multicastPktsRx),
        ORV_FIELD(PnicStats, broadcastPktsRx), ORV_FIELD(PnicStats, multicastPktsTx),
        ORV_FIELD(PnicStats, broadcastPktsTx), ORV_FIELD(PnicStats, RxLengthErrors),
        ORV_FIELD(PnicStats, RxOverErrors), ORV_FIELD(PnicStats, RxCRCErrors), ORV_FIELD(PnicStats, RxFrameErrors),
        ORV_FIELD(PnicStats, RxFIFOErrors), ORV_FIELD(PnicStats, RxMissedErrors),
        ORV_FIELD(PnicStats, TxAbortedErrors), ORV_FIELD(PnicStats, TxFIFOErrors),
        ORV_FIELD(PnicStats, TxCarrierErrors), ORV_FIELD(PnicStats, TxHeartbeatErrors),
        ORV_FIELD(PnicStats, TxWindowErrors), ORV_FIELD(PnicStats, dot3StatsAlignmentErrors),
        ORV_FIELD(PnicStats, dot3StatsFCSErrors), ORV_FIELD(PnicStats, dot3StatsInternalMacTransmitErrors),
        ORV_FIELD(PnicStats, dot3StatsFrameTooLongs), ORV_FIELD(PnicStats, dot3StatsInternalMacReceiveErrors),
        ORV_FIELD(PnicStats, dot3StatsSingleCollisionFrames),
        ORV_FIELD(PnicStats, dot3StatsMultipleCollisionFrames), ORV_FIELD(PnicStats, dot3StatsSQETestErrors),
        ORV_FIELD(PnicStats, dot3StatsDeferredTransmissions), ORV_FIELD(PnicStats, dot3StatsLateCollisions),
        ORV_FIELD(PnicStats, dot3StatsExcessiveCollisions), ORV_FIELD(PnicStats, dot3StatsCarrierSenseErrors),
        ORV_FIELD(PnicStats, dot3StatsSymbolErrors), ORV_FIELD(PnicStats, dot3ControlInUnknownOpcodes),
        ORV_FIELD(PnicStats, dot3InPauseFrames), ORV_FIELD(PnicStats, dot3OutPauseFrames),
    };
    return table;
}

const FieldTable<PnicCoalesceInfo, uint32_t>& coalesceCounterFields()
{
    static const FieldTable<PnicCoalesceInfo, uint32_t> table = {
        ORV_FIELD(PnicCoalesceInfo, statsBlockUsecs), ORV_FIELD(PnicCoalesceInfo, sampleInterval),
        ORV_FIELD(PnicCoalesceInfo, pktRateLow), ORV_FIELD(PnicCoalesceInfo, pktRateHigh),
        ORV_FIELD(PnicCoalesceInfo, rxUsecs), ORV_FIELD(PnicCoalesceInfo, rxFrames),
        ORV_FIELD(PnicCoalesceInfo, rxUsecsIrq), ORV_FIELD(PnicCoalesceInfo, rxFramesIrq),
        ORV_FIELD(PnicCoalesceInfo, txUsecs), ORV_FIELD(PnicCoalesceInfo, txFrames),
        ORV_FIELD(PnicCoalesceInfo, txUsecsIrq), ORV_FIELD(PnicCoalesceInfo, txFramesIrq),
        ORV_FIELD(PnicCoalesceInfo, rxUsecsLow), ORV_FIELD(PnicCoalesceInfo, rxFrameLow),
        ORV_FIELD(PnicCoalesceInfo, txUsecsLow), ORV_FIELD(PnicCoalesceInfo, txFrameLow),
        ORV_FIELD(PnicCoalesceInfo, rxUsecsHigh), ORV_FIELD(PnicCoalesceInfo, rxFrameHigh),
        ORV_FIELD(PnicCoalesceInfo, txUsecsHigh), ORV_FIELD(PnicCoalesceInfo, txFrameHigh),
    };
    return table;
}

const FieldTable<PnicCoalesceInfo, bool>& coalesceFlagFields()
{
    static const FieldTable<PnicCoalesceInfo, bool> table = {
        ORV_FIELD(PnicCoalesceInfo, adaptiveRX), ORV_FIELD(PnicCoalesceInfo, adaptiveTX)};
    return table;
}

const FieldTable<PnicRingInfo, uint32_t>& ringFields()
{
    static const FieldTable<PnicRingInfo, uint32_t> table = {
        ORV_FIELD(PnicRingInfo, rx), ORV_FIELD(PnicRingInfo, rxMini), ORV_FIELD(PnicRingInfo, rxJumbo),
        ORV_FIELD(PnicRingInfo, tx)};
    return table;
}

const FieldTable<PnicPauseInfo, bool>& pauseFlagFields()
{
    static const FieldTable<PnicPauseInfo, bool> table = {
        ORV_FIELD(PnicPauseInfo, supported), ORV_FIELD(PnicPauseInfo, autoNegotiate),
        ORV_FIELD(PnicPauseInfo, rxStatus), ORV_FIELD(PnicPauseInfo, txStatus)};
    return table;
}

const FieldTable<PnicInfo, bool>& infoFlagFields()
{
    static const FieldTable<PnicInfo, bool> table = {
        ORV_FIELD(PnicInfo, supportsAutoNegotiation), ORV_FIELD(PnicInfo, advertisedAutoNegotiation),
        ORV_FIELD(PnicInfo, linkStatusChanged), ORV_FIELD(PnicInfo, portChanged),
        ORV_FIELD(PnicInfo, phyadChanged), ORV_FIELD(PnicInfo, viradChanged),
        ORV_FIELD(PnicInfo, transceiverChanged), ORV_FIELD(PnicInfo, autoNegChanged),
        ORV_FIELD(PnicInfo, autoNegotiation), ORV_FIELD(PnicInfo, wolChanged), ORV_FIELD(PnicInfo, wolSupported),
        ORV_FIELD(PnicInfo, msglvlChanged), ORV_FIELD(PnicInfo, msglvlSupported),
    };
    return table;
}

const FieldTable<PnicDriverInfo, std::string>& driverFields()
{
    static const FieldTable<PnicDriverInfo, std::string> table = {
        ORV_FIELD(PnicDriverInfo, name), ORV_FIELD(PnicDriverInfo, version),
        ORV_FIELD(PnicDriverInfo, firmwareVersion), ORV_FIELD(PnicDriverInfo, busInfo)};
    return table;
}

#undef ORV_FIELD

#define ORV_NAME(enumerator) {#enumerator, enumerator}

const EnumNames& linkSpeedNames()
{
    static const EnumNames names = {
        ORV_NAME(CONNECTION_AUTO), ORV_NAME(CONNECTION_10), ORV_NAME(CONNECTION_100),
        ORV_NAME(CONNECTION_1000), ORV_NAME(CONNECTION_2500), ORV_NAME(CONNECTION_5000),
        ORV_NAME(CONNECTION_10000), ORV_NAME(CONNECTION_20000), ORV_NAME(CONNECTION_25000),
        ORV_NAME(CONNECTION_40000), ORV_NAME(CONNECTION_50000), ORV_NAME(CONNECTION_56000),
        ORV_NAME(CONNECTION_100000)};
    return names;
}

const EnumNames& duplexNames()
{
    static const EnumNames names = {ORV_NAME(DUPLEX_MODE_AUTO), ORV_NAME(DUPLEX_MODE_FULL), ORV_NAME(DUPLEX_MODE_HALF)};
    return names;
}

const EnumNames& portModeNames()
{
    static const EnumNames names = {ORV_NAME(PNICPORT_MODE_TP), ORV_NAME(PNICPORT_MODE_AUI),
                                    ORV_NAME(PNICPORT_MODE_BNC), ORV_NAME(PNICPORT_MODE_MII),
                                    ORV_NAME(PNICPORT_MODE_FIBRE), ORV_NAME(PNICPORT_MODE_DA),
                                    ORV_NAME(PNICPORT_MODE_UNKNOWN)};
    return names;
}

const EnumNames& transceiverNames()
{
    static const EnumNames names = {ORV_NAME(TRANSCEIVER_MODE_INTERNAL), ORV_NAME(TRANSCEIVER_MODE_EXTERNAL),
                                    ORV_NAME(TRANSCEIVER_MODE_UNKNOWN)};
    return names;
}

const EnumNames& wakeOnNames()
{
    static const EnumNames names = {ORV_NAME(WAKEON_MODE_PHY), ORV_NAME(WAKEON_MODE_UCAST),
                                    ORV_NAME(WAKEON_MODE_MCAST), ORV_NAME(WAKEON_MODE_BCAST),
                                    ORV_NAME(WAKEON_MODE_ARP), ORV_NAME(WAKEON_MODE_MAGIC),
                                    ORV_NAME(WAKEON_MODE_MAGICSECURE), ORV_NAME(WAKEON_MODE_UNSUPPORTED),
                                    ORV_NAME(WAKEON_MODE_DISABLE)};
    return names;
}

const EnumNames& pauseResultNames()
{
    static const EnumNames names = {ORV_NAME(AUTO_NEG_NOT_AVAIL), ORV_NAME(AUTO_NEG_ON), ORV_NAME(AUTO_NEG_OFF)};
    return names;
}

const EnumNames& htStateNames()
{
    static const EnumNames names = {ORV_NAME(HTNotPresent), ORV_NAME(HTBIOSDisabled), ORV_NAME(HTTMKDisabled),
                                    ORV_NAME(HTEnabled)};
    return names;
}

#undef ORV_NAME

} // namespace orv::platform::sim
