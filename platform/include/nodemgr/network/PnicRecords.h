// Records the physical-NIC interface fills. All are plain values: the caller
// declares them (usually on its stack) and passes them by reference.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "nodemgr/network/PnicTypes.h"

namespace NodeMgr {
namespace Network {

struct PnicInfo {
    std::vector<PnicPortMode> supportedPorts;
    std::vector<LinkMode> supportedLinkModes;
    bool supportsAutoNegotiation = false;
    std::vector<LinkMode> advertisedLinkModes;
    bool advertisedAutoNegotiation = false;
    bool linkStatusChanged = false;
    bool portChanged = false;
    bool phyadChanged = false;
    bool viradChanged = false;
    bool transceiverChanged = false;
    bool autoNegChanged = false;
    LinkSpeed speed = CONNECTION_AUTO;
    Duplex duplex = DUPLEX_MODE_AUTO;
    PnicPortMode port = PNICPORT_MODE_UNKNOWN;
    uint32_t PHYAD = 0;
    TransceiverMode transceiver = TRANSCEIVER_MODE_UNKNOWN;
    bool autoNegotiation = false;
    bool wolChanged = false;
    bool wolSupported = false;
    std::vector<WakeOnMode> supportsWakeOn;
    std::vector<WakeOnMode> wakeOn;
    bool msglvlChanged = false;
    bool msglvlSupported = false;
    uint32_t messageLevel = 0;
    std::string viraddr;
    std::string linkStatus;
};

struct PnicDriverInfo {
    std::string name;
    std::string version;
    std::string firmwareVersion;
    std::string busInfo;
};

struct PnicPauseInfo {
    bool supported = false;
    bool autoNegotiate = false;
    bool rxStatus = false;
    bool txStatus = false;
    PauseAutoNegResult rxAutoNegRes = AUTO_NEG_NOT_AVAIL;
    PauseAutoNegResult txAutoNegRes = AUTO_NEG_NOT_AVAIL;
};

struct PnicCoalesceInfo {
    bool adaptiveRX = false;
    bool adaptiveTX = false;
    uint32_t statsBlockUsecs = 0;
    uint32_t sampleInterval = 0;
    uint32_t pktRateLow = 0;
    uint32_t pktRateHigh = 0;
    uint32_t rxUsecs = 0;
    uint32_t rxFrames = 0;
    uint32_t rxUsecsIrq = 0;
    uint32_t rxFramesIrq = 0;
    uint32_t txUsecs = 0;
    uint32_t txFrames = 0;
    uint32_t txUsecsIrq = 0;
    uint32_t txFramesIrq = 0;
    uint32_t rxUsecsLow = 0;
    uint32_t rxFrameLow = 0;
    uint32_t txUsecsLow = 0;
    uint32_t txFrameLow = 0;
    uint32_t rxUsecsHigh = 0;
    uint32_t rxFrameHigh = 0;
    uint32_t txUsecsHigh = 0;
    uint32_t txFrameHigh = 0;
};

struct PnicRingInfo {
    uint8_t changed = 0;
    uint32_t rx = 0;
    uint32_t rxMini = 0;
    uint32_t rxJumbo = 0;
    uint32_t tx = 0;
};

struct PnicStats {
    uint64_t packetsTx = 0;
    uint64_t packetsRx = 0;
    uint64_t bytesTx = 0;
    uint64_t bytesRx = 0;
    uint64_t errorsTx = 0;
    uint64_t errorsRx = 0;
    uint64_t droppedTx = 0;
    uint64_t droppedRx = 0;
    uint64_t multicastPktsRx = 0;
    uint64_t broadcastPktsRx = 0;
    uint64_t multicastPktsTx = 0;
    uint64_t broadcastPktsTx = 0;
    uint64_t RxLengthErrors = 0;
    uint64_t RxOverErrors = 0;
    uint64_t RxCRCErrors = 0;
    uint64_t RxFrameErrors = 0;
    uint64_t RxFIFOErrors = 0;
    uint64_t RxMissedErrors = 0;
    uint64_t TxAbortedErrors = 0;
    uint64_t TxFIFOErrors = 0;
    uint64_t TxCarrierErrors = 0;
    uint64_t TxHeartbeatErrors = 0;
    uint64_t TxWindowErrors = 0;
    uint64_t dot3StatsAlignmentErrors = 0;
    uint64_t dot3StatsFCSErrors = 0;
    uint64_t dot3StatsInternalMacTransmitErrors = 0;
    uint64_t dot3StatsFrameTooLongs = 0;
    uint64_t dot3StatsInternalMacReceiveErrors = 0;
    uint64_t dot3StatsSingleCollisionFrames = 0;
    uint64_t dot3StatsMultipleCollisionFrames = 0;
    uint64_t dot3StatsSQETestErrors = 0;
    uint64_t dot3StatsDeferredTransmissions = 0;
    uint64_t dot3StatsLateCollisions = 0;
    uint64_t dot3StatsExcessiveCollisions = 0;
    uint64_t dot3StatsCarrierSenseErrors = 0;
    uint64_t dot3StatsSymbolErrors = 0;
    uint64_t dot3ControlInUnknownOpcodes = 0;
    uint64_t dot3InPauseFrames = 0;
    uint64_t dot3OutPauseFrames = 0;
};

// Records of operations the providers do not use; kept small but complete
// enough for the substitutes to answer them.
struct PnicOffloadInfo {
    bool rxChecksum = false;
    bool txChecksum = false;
    bool scatterGather = false;
    bool tcpSegmentation = false;
    bool udpFragmentation = false;
    bool genericSegmentation = false;
    bool largeReceive = false;
};

struct PnicSoftwareSimulationInfo {
    bool vlanTagging = false;
    bool vlanUntagging = false;
    bool ipv4Checksum = false;
    bool ipv6Checksum = false;
    bool tcpSegmentation = false;
};

struct PnicSourcePortStats {
    uint64_t packetsTx = 0;
    uint64_t packetsRx = 0;
    uint64_t bytesTx = 0;
    uint64_t bytesRx = 0;
};

// Neighbour discovery (CDP or LLDP) as text pairs.
struct PnicDiscoveryInfo {
    std::vector<std::pair<std::string, std::string>> fields;
};

} // namespace Network
} // namespace NodeMgr
