// Linux's ethtool answers turned into the NIC records' terms: link-mode bits into
// (speed, duplex) pairs, kernel port, duplex, transceiver and wake-on codes into the
// records' enumerator values. Plain numbers here; the records' enumerations take them.
#pragma once

#include "ethtool_reader.hpp"

#include <cstdint>
#include <optional>
#include <vector>

namespace orv::linuxhost {

// Record codes (the values of the NIC library's enumerations).
namespace record {
constexpr std::uint32_t kSpeedAuto = 0;
constexpr std::uint32_t kDuplexAuto = 0, kDuplexFull = 1, kDuplexHalf = 2;
constexpr std::uint32_t kPortTp = 0, kPortAui = 1, kPortBnc = 2, kPortMii = 3, kPortFibre = 4, kPortDa = 5,
                        kPortUnknown = 6;
constexpr std::uint32_t kTransceiverInternal = 0, kTransceiverExternal = 1, kTransceiverUnknown = 2;
constexpr std::uint32_t kWakeMagicSecure = 6, kWakeUnsupported = 7, kWakeDisable = 8;
}  // namespace record

struct SpeedDuplex {
    std::uint32_t speed = 0;   // Mb/s, one of the records' speeds
    std::uint32_t duplex = 0;  // record::kDuplexFull or record::kDuplexHalf
    friend bool operator==(const SpeedDuplex&, const SpeedDuplex&) = default;
};

// Speed and kernel duplex of one link-mode bit; nothing for bits that are not
// speeds (port, pause, FEC, autoneg) or that this build does not know.
struct KernelLinkMode {
    unsigned bit;
    std::uint32_t speed;
    std::uint8_t duplex;  // DUPLEX_HALF or DUPLEX_FULL
};
std::optional<KernelLinkMode> kernelLinkMode(unsigned bit);

// True for the speeds the records can carry (10 Mb/s to 100 Gb/s, fixed list).
bool isRecordSpeed(std::uint32_t megabits);
// The link modes of a mask that the records can carry, each pair once,
// ordered by speed and then full before half.
std::vector<SpeedDuplex> recordLinkModes(const LinkModeMask& mask);
// Current speed: a record speed, else kSpeedAuto (unknown, no link, or beyond the list).
std::uint32_t recordSpeed(std::uint32_t kernelSpeed);
std::uint32_t recordDuplex(std::uint8_t kernelDuplex);
std::uint32_t recordPort(std::uint8_t kernelPort);
// Connector types named by the port bits of a supported-modes mask, in record order.
std::vector<std::uint32_t> recordPorts(const LinkModeMask& supported);
std::uint32_t recordTransceiver(std::uint8_t kernelTransceiver);
// WAKE_* bit n is wake-on mode n; an empty set of modes reads as the one given.
std::vector<std::uint32_t> recordWakeModes(std::uint32_t wakeMask, std::uint32_t whenNone);

}  // namespace orv::linuxhost
