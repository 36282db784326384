// Conversions from the NIC library's enumerations to the values the CIM
// properties of an Ethernet port carry.
#include "EthernetPort-Provider.h"

namespace EthernetProvider {

using namespace NodeMgr::Network;

namespace {

// Speeds that have no port type of their own, whatever the connector.
bool isOtherSpeed(LinkSpeed speed) {
    switch (speed) {
        case CONNECTION_5000:
        case CONNECTION_20000:
        case CONNECTION_25000:
        case CONNECTION_40000:
        case CONNECTION_50000:
        case CONNECTION_56000:
        case CONNECTION_100000:
            return true;
        default:
            return false;
    }
}

CMPIUint16 twistedPairType(LinkSpeed speed) {
    switch (speed) {
        case CONNECTION_10: return EthernetPortProvider::PORT_TYPE_TP_10;
        case CONNECTION_100: return EthernetPortProvider::PORT_TYPE_TP_100;
        case CONNECTION_1000: return EthernetPortProvider::PORT_TYPE_TP_1000;
        case CONNECTION_2500: return EthernetPortProvider::PORT_TYPE_TP_2500;
        case CONNECTION_10000: return EthernetPortProvider::PORT_TYPE_TP_10000;
        default: return EthernetPortProvider::PORT_TYPE_UNKNOWN;
    }
}

// Fibre has types for 100, 1000 and 10000 Mb/s only: 10 and 2500 are unknown.
CMPIUint16 fibreType(LinkSpeed speed) {
    switch (speed) {
        case CONNECTION_100: return EthernetPortProvider::PORT_TYPE_FIBRE_100;
        case CONNECTION_1000: return EthernetPortProvider::PORT_TYPE_FIBRE_1000;
        case CONNECTION_10000: return EthernetPortProvider::PORT_TYPE_FIBRE_10000;
        default: return EthernetPortProvider::PORT_TYPE_UNKNOWN;
    }
}

const char* speedText(LinkSpeed speed) {
    switch (speed) {
        case CONNECTION_AUTO: return "AUTO";
        case CONNECTION_10: return "10";
        case CONNECTION_100: return "100";
        case CONNECTION_1000: return "1000";
        case CONNECTION_2500: return "2500";
        case CONNECTION_5000: return "5000";
        case CONNECTION_10000: return "10000";
        case CONNECTION_20000: return "20000";
        case CONNECTION_25000: return "25000";
        case CONNECTION_40000: return "40000";
        case CONNECTION_50000: return "50000";
        case CONNECTION_56000: return "56000";
        case CONNECTION_100000: return "100000";
        default: return "";
    }
}

const char* duplexText(Duplex duplex) {
    switch (duplex) {
        case DUPLEX_MODE_AUTO: return "AUTO";
        case DUPLEX_MODE_FULL: return "FULL";
        case DUPLEX_MODE_HALF: return "HALF";
        default: return "";
    }
}

}  // namespace

// The speed test comes first: a twisted-pair port at 5000 Mb/s is "other".
CMPIUint16 EthernetPortProvider::getPortType(PnicPortMode port, LinkSpeed speed) {
    if (isOtherSpeed(speed) || port == PNICPORT_MODE_DA) {
        return PORT_TYPE_OTHER;
    }
    if (port == PNICPORT_MODE_TP) {
        return twistedPairType(speed);
    }
    if (port == PNICPORT_MODE_FIBRE) {
        return fibreType(speed);
    }
    return PORT_TYPE_UNKNOWN;
}

EthernetPortProvider::EthernetSupportedPortType EthernetPortProvider::convertPortMode(PnicPortMode mode) {
    static const EthernetSupportedPortType kModes[] = {MODE_TP, MODE_AUI, MODE_BNC, MODE_MII, MODE_FIBRE, MODE_DA};
    const int index = static_cast<int>(mode);
    return index >= 0 && index < static_cast<int>(sizeof kModes / sizeof kModes[0]) ? kModes[index] : MODE_UNKNOWN;
}

std::string EthernetPortProvider::convertLinkMode(std::pair<LinkSpeed, Duplex> mode) {
    return std::string(speedText(mode.first)) + "_" + duplexText(mode.second);
}

EthernetPortProvider::EthernetTransceiver EthernetPortProvider::convertTransceiver(TransceiverMode mode) {
    switch (mode) {
        case TRANSCEIVER_MODE_INTERNAL: return TRANSCEIVER_INTERNAL;
        case TRANSCEIVER_MODE_EXTERNAL: return TRANSCEIVER_ENTERNAL;
        default: return TRANSCEIVER_UNKNOWN;
    }
}

EthernetPortProvider::EthernetWOLOptions EthernetPortProvider::convertWOLOption(WakeOnMode mode) {
    static const EthernetWOLOptions kOptions[] = {MODE_PHY,  MODE_UCAST, MODE_MCAST,     MODE_BCAST,
                                                  MODE_ARP,  MODE_MAGIC, MODE_MAGICSECURE};
    const int index = static_cast<int>(mode);
    return index >= 0 && index < static_cast<int>(sizeof kOptions / sizeof kOptions[0]) ? kOptions[index]
                                                                                        : MODE_DISABLE;
}

}  // namespace EthernetProvider
