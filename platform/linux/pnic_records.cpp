#include "pnic_records.hpp"

#include "link_modes.hpp"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <initializer_list>

namespace orv::linuxhost {

namespace NN = NodeMgr::Network;

namespace {

std::string fixedText(const char* field, std::size_t size)
{
    return std::string(field, strnlen(field, size));
}

// The first driver counter whose name is one of the given names; 0 when none.
std::uint64_t driverCounter(const std::vector<DriverStatistic>& driver, std::initializer_list<const char*> names)
{
    for (const char* name : names) {
        for (const auto& statistic : driver) {
            if (statistic.name == name) return statistic.value;
        }
    }
    return 0;
}

std::vector<NN::WakeOnMode> toWakeModes(std::uint32_t mask, std::uint32_t whenNone)
{
    std::vector<NN::WakeOnMode> modes;
    for (auto mode : recordWakeModes(mask, whenNone)) modes.push_back(static_cast<NN::WakeOnMode>(mode));
    return modes;
}

NN::PauseAutoNegResult negotiated(bool ours, bool partners, bool available)
{
    if (!available) return NN::AUTO_NEG_NOT_AVAIL;
    return ours && partners ? NN::AUTO_NEG_ON : NN::AUTO_NEG_OFF;
}

}  // namespace

std::vector<NN::LinkMode> toLinkModes(const LinkModeMask& mask)
{
    std::vector<NN::LinkMode> modes;
    for (const auto& pair : recordLinkModes(mask)) {
        modes.emplace_back(static_cast<NN::LinkSpeed>(pair.speed), static_cast<NN::Duplex>(pair.duplex));
    }
    return modes;
}

NN::LinkSpeed toLinkSpeed(std::uint32_t kernelSpeed) { return static_cast<NN::LinkSpeed>(recordSpeed(kernelSpeed)); }

NN::Duplex toDuplex(std::uint8_t kernelDuplex) { return static_cast<NN::Duplex>(recordDuplex(kernelDuplex)); }

void fillLinkPart(NN::PnicInfo& info, const LinkSettings& settings, bool linkUp)
{
    info.supportedPorts.clear();
    for (auto port : recordPorts(settings.supported)) info.supportedPorts.push_back(static_cast<NN::PnicPortMode>(port));
    info.supportedLinkModes = toLinkModes(settings.supported);
    info.supportsAutoNegotiation = settings.supported.test(ETHTOOL_LINK_MODE_Autoneg_BIT);
    info.advertisedLinkModes = toLinkModes(settings.advertising);
    info.advertisedAutoNegotiation = settings.advertising.test(ETHTOOL_LINK_MODE_Autoneg_BIT);
    info.speed = linkUp ? toLinkSpeed(settings.speed) : NN::CONNECTION_AUTO;
    info.duplex = linkUp ? toDuplex(settings.duplex) : NN::DUPLEX_MODE_AUTO;
    info.port = static_cast<NN::PnicPortMode>(recordPort(settings.port));
    info.PHYAD = settings.phyAddress;
    info.transceiver = static_cast<NN::TransceiverMode>(recordTransceiver(settings.transceiver));
    info.autoNegotiation = settings.autoneg == AUTONEG_ENABLE;
    info.linkStatus = linkUp ? "Up" : "Down";
}

void fillWakeOnPart(NN::PnicInfo& info, const std::optional<ethtool_wolinfo>& wol)
{
    info.wolSupported = wol && wol->supported != 0;
    if (!info.wolSupported) {
        info.supportsWakeOn = {NN::WAKEON_MODE_UNSUPPORTED};
        info.wakeOn = {NN::WAKEON_MODE_DISABLE};
        return;
    }
    info.supportsWakeOn = toWakeModes(wol->supported, record::kWakeUnsupported);
    info.wakeOn = toWakeModes(wol->wolopts, record::kWakeDisable);
}

void fillMessageLevel(NN::PnicInfo& info, const std::optional<std::uint32_t>& level)
{
    info.msglvlSupported = level.has_value();
    info.messageLevel = level.value_or(0);
}

NN::PnicOffloadInfo toOffloadInfo(const std::vector<std::string>& activeFeatures)
{
    auto on = [&](std::initializer_list<const char*> names) {
        for (const char* name : names) {
            if (std::find(activeFeatures.begin(), activeFeatures.end(), name) != activeFeatures.end()) return true;
        }
        return false;
    };
    NN::PnicOffloadInfo info;
    info.rxChecksum = on({"rx-checksum"});
    info.txChecksum = on({"tx-checksum-ipv4", "tx-checksum-ip-generic", "tx-checksum-ipv6"});
    info.scatterGather = on({"tx-scatter-gather"});
    info.tcpSegmentation = on({"tx-tcp-segmentation", "tx-tcp-ecn-segmentation", "tx-tcp-mangleid-segmentation",
                               "tx-tcp6-segmentation"});
    info.udpFragmentation = on({"tx-udp-fragmentation"});  // gone from kernels since 4.14: false there
    info.genericSegmentation = on({"tx-generic-segmentation"});
    info.largeReceive = on({"rx-lro"});
    return info;
}

NN::PnicDriverInfo toDriverInfo(const ethtool_drvinfo& info)
{
    return NN::PnicDriverInfo{fixedText(info.driver, sizeof info.driver), fixedText(info.version, sizeof info.version),
                              fixedText(info.fw_version, sizeof info.fw_version),
                              fixedText(info.bus_info, sizeof info.bus_info)};
}

NN::PnicCoalesceInfo toCoalesceInfo(const ethtool_coalesce& c)
{
    NN::PnicCoalesceInfo info;
    info.adaptiveRX = c.use_adaptive_rx_coalesce != 0;
    info.adaptiveTX = c.use_adaptive_tx_coalesce != 0;
    info.statsBlockUsecs = c.stats_block_coalesce_usecs;
    info.sampleInterval = c.rate_sample_interval;
    info.pktRateLow = c.pkt_rate_low;
    info.pktRateHigh = c.pkt_rate_high;
    info.rxUsecs = c.rx_coalesce_usecs;
    info.rxFrames = c.rx_max_coalesced_frames;
    info.rxUsecsIrq = c.rx_coalesce_usecs_irq;
    info.rxFramesIrq = c.rx_max_coalesced_frames_irq;
    info.txUsecs = c.tx_coalesce_usecs;
    info.txFrames = c.tx_max_coalesced_frames;
    info.txUsecsIrq = c.tx_coalesce_usecs_irq;
    info.txFramesIrq = c.tx_max_coalesced_frames_irq;
    info.rxUsecsLow = c.rx_coalesce_usecs_low;
    info.rxFrameLow = c.rx_max_coalesced_frames_low;
    info.txUsecsLow = c.tx_coalesce_usecs_low;
    info.txFrameLow = c.tx_max_coalesced_frames_low;
    info.rxUsecsHigh = c.rx_coalesce_usecs_high;
    info.rxFrameHigh = c.rx_max_coalesced_frames_high;
    info.txUsecsHigh = c.tx_coalesce_usecs_high;
    info.txFrameHigh = c.tx_max_coalesced_frames_high;
    return info;
}

NN::PnicPauseInfo toPauseInfo(const ethtool_pauseparam& pause, const LinkSettings* settings)
{
    NN::PnicPauseInfo info;
    const bool pauseBit = settings && settings->supported.test(ETHTOOL_LINK_MODE_Pause_BIT);
    const bool asymBit = settings && settings->supported.test(ETHTOOL_LINK_MODE_Asym_Pause_BIT);
    info.supported = pauseBit || asymBit || pause.rx_pause || pause.tx_pause || pause.autoneg;
    info.autoNegotiate = pause.autoneg != 0;
    info.rxStatus = pause.rx_pause != 0;
    info.txStatus = pause.tx_pause != 0;
    const bool available = pause.autoneg && settings && settings->autoneg == AUTONEG_ENABLE;
    const bool partnerPause = settings && settings->partner.test(ETHTOOL_LINK_MODE_Pause_BIT);
    info.rxAutoNegRes = negotiated(info.rxStatus, partnerPause, available);
    info.txAutoNegRes = negotiated(info.txStatus, partnerPause, available);
    return info;
}

void toRingInfo(const ethtool_ringparam& rings, NN::PnicRingInfo& preset, NN::PnicRingInfo& current)
{
    preset = NN::PnicRingInfo{0, rings.rx_max_pending, rings.rx_mini_max_pending, rings.rx_jumbo_max_pending,
                              rings.tx_max_pending};
    current = NN::PnicRingInfo{0, rings.rx_pending, rings.rx_mini_pending, rings.rx_jumbo_pending, rings.tx_pending};
}

NN::PnicStats toStats(const rtnl_link_stats64& link, const std::vector<DriverStatistic>& d)
{
    NN::PnicStats s;
    s.packetsTx = link.tx_packets;
    s.packetsRx = link.rx_packets;
    s.bytesTx = link.tx_bytes;
    s.bytesRx = link.rx_bytes;
    s.errorsTx = link.tx_errors;
    s.errorsRx = link.rx_errors;
    s.droppedTx = link.tx_dropped;
    s.droppedRx = link.rx_dropped;
    s.multicastPktsRx = link.multicast;
    s.broadcastPktsRx = driverCounter(d, {"rx_broadcast", "rx_bcast_packets", "rx_broadcast_packets", "broadcast"});
    s.multicastPktsTx = driverCounter(d, {"tx_multicast", "tx_mcast_packets", "tx_multicast_packets"});
    s.broadcastPktsTx = driverCounter(d, {"tx_broadcast", "tx_bcast_packets", "tx_broadcast_packets"});
    s.RxLengthErrors = link.rx_length_errors;
    s.RxOverErrors = link.rx_over_errors;
    s.RxCRCErrors = link.rx_crc_errors;
    s.RxFrameErrors = link.rx_frame_errors;
    s.RxFIFOErrors = link.rx_fifo_errors;
    s.RxMissedErrors = link.rx_missed_errors;
    s.TxAbortedErrors = link.tx_aborted_errors;
    s.TxFIFOErrors = link.tx_fifo_errors;
    s.TxCarrierErrors = link.tx_carrier_errors;
    s.TxHeartbeatErrors = link.tx_heartbeat_errors;
    s.TxWindowErrors = link.tx_window_errors;
    s.dot3StatsAlignmentErrors = driverCounter(d, {"rx_align_errors", "align_errors", "alignment_errors"});
    s.dot3StatsFCSErrors = link.rx_crc_errors;
    s.dot3StatsInternalMacTransmitErrors = driverCounter(d, {"tx_mac_errors", "tx_internal_mac_errors"});
    s.dot3StatsFrameTooLongs = driverCounter(d, {"rx_long_length_errors", "rx_oversize_packets", "rx_frame_too_long"});
    s.dot3StatsInternalMacReceiveErrors = driverCounter(d, {"rx_mac_errors", "rx_internal_mac_errors"});
    s.dot3StatsSingleCollisionFrames = driverCounter(d, {"tx_single_coll_ok", "single_collisions", "tx_single_collisions"});
    s.dot3StatsMultipleCollisionFrames = driverCounter(d, {"tx_multi_coll_ok", "multi_collisions", "tx_multiple_collisions"});
    s.dot3StatsSQETestErrors = driverCounter(d, {"tx_sqe_errors", "sqe_test_errors"});
    s.dot3StatsDeferredTransmissions = driverCounter(d, {"tx_deferred_ok", "tx_deferred", "deferred"});
    s.dot3StatsLateCollisions = driverCounter(d, {"tx_late_coll", "late_collisions", "tx_late_collisions"});
    s.dot3StatsExcessiveCollisions = driverCounter(d, {"tx_excess_coll", "excessive_collisions", "tx_excessive_collisions"});
    s.dot3StatsCarrierSenseErrors = link.tx_carrier_errors;
    s.dot3StatsSymbolErrors = driverCounter(d, {"rx_symbol_errors", "symbol_errors"});
    s.dot3ControlInUnknownOpcodes = driverCounter(d, {"rx_unknown_opcodes", "unknown_opcodes"});
    s.dot3InPauseFrames = driverCounter(d, {"rx_pause", "rx_pause_frames", "rx_xoff"});
    s.dot3OutPauseFrames = driverCounter(d, {"tx_pause", "tx_pause_frames", "tx_xoff"});
    return s;
}

NN::MacAddress toMacAddress(const std::vector<std::uint8_t>& bytes)
{
    if (bytes.size() != 6) return NN::MacAddress();
    std::array<unsigned char, 6> address{};
    std::copy(bytes.begin(), bytes.end(), address.begin());
    return NN::MacAddress(address);
}

}  // namespace orv::linuxhost
