// Enumerations of the physical-NIC interface. The numeric values are part of
// the interface: link speeds are in megabits per second. Each is an int, so
// a value the library does not list (a newer speed, say) is still a valid value.
#pragma once

#include <cstdint>
#include <utility>

namespace NodeMgr {
namespace Network {

enum LinkSpeed : int {
    CONNECTION_AUTO = 0,
    CONNECTION_10 = 10,
    CONNECTION_100 = 100,
    CONNECTION_1000 = 1000,
    CONNECTION_2500 = 2500,
    CONNECTION_5000 = 5000,
    CONNECTION_10000 = 10000,
    CONNECTION_20000 = 20000,
    CONNECTION_25000 = 25000,
    CONNECTION_40000 = 40000,
    CONNECTION_50000 = 50000,
    CONNECTION_56000 = 56000,
    CONNECTION_100000 = 100000
};

enum Duplex : int {
    DUPLEX_MODE_AUTO = 0,
    DUPLEX_MODE_FULL = 1,
    DUPLEX_MODE_HALF = 2
};

enum PnicPortMode : int {
    PNICPORT_MODE_TP = 0,
    PNICPORT_MODE_AUI = 1,
    PNICPORT_MODE_BNC = 2,
    PNICPORT_MODE_MII = 3,
    PNICPORT_MODE_FIBRE = 4,
    PNICPORT_MODE_DA = 5,
    PNICPORT_MODE_UNKNOWN = 6
};

enum TransceiverMode : int {
    TRANSCEIVER_MODE_INTERNAL = 0,
    TRANSCEIVER_MODE_EXTERNAL = 1,
    TRANSCEIVER_MODE_UNKNOWN = 2
};

enum WakeOnMode : int {
    WAKEON_MODE_PHY = 0,
    WAKEON_MODE_UCAST = 1,
    WAKEON_MODE_MCAST = 2,
    WAKEON_MODE_BCAST = 3,
    WAKEON_MODE_ARP = 4,
    WAKEON_MODE_MAGIC = 5,
    WAKEON_MODE_MAGICSECURE = 6,
    WAKEON_MODE_UNSUPPORTED = 7,
    WAKEON_MODE_DISABLE = 8
};

// Result of the pause-frame auto-negotiation.
enum PauseAutoNegResult : int {
    AUTO_NEG_NOT_AVAIL = 0,
    AUTO_NEG_ON = 1,
    AUTO_NEG_OFF = 2
};

// A supported or advertised link mode: speed and duplex.
typedef std::pair<LinkSpeed, Duplex> LinkMode;

} // namespace Network
} // namespace NodeMgr
