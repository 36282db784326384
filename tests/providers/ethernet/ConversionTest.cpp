// The five conversions from the NIC library's enumerations to CIM values, over
// every enumerator and beyond.
#include <gtest/gtest.h>

#include <map>
#include <string>

#include "EthernetPort-Provider.h"

namespace {

using EthernetProvider::EthernetPortProvider;
using namespace NodeMgr::Network;

const int kSpeeds[] = {0, 10, 100, 1000, 2500, 5000, 10000, 20000, 25000, 40000, 50000, 56000, 100000};
// Speeds that are "other" whatever the port.
const int kOtherSpeeds[] = {5000, 20000, 25000, 40000, 50000, 56000, 100000};
// Values outside the enumeration.
const int kStrangeSpeeds[] = {3, 131071};

bool isOtherSpeed(int speed) {
    for (int other : kOtherSpeeds) {
        if (speed == other) return true;
    }
    return false;
}

CMPIUint16 portType(int port, int speed) {
    return EthernetPortProvider::getPortType(static_cast<PnicPortMode>(port), static_cast<LinkSpeed>(speed));
}

TEST(GetPortType, TwistedPairHasATypePerClassicSpeed) {
    const std::map<int, CMPIUint16> expected = {{0, 0},     {10, 50},    {100, 52},   {1000, 53}, {2500, 54},
                                                {5000, 1},  {10000, 55}, {20000, 1},  {25000, 1}, {40000, 1},
                                                {50000, 1}, {56000, 1},  {100000, 1}, {3, 0},     {131071, 0}};
    for (const auto& [speed, type] : expected) {
        EXPECT_EQ(portType(PNICPORT_MODE_TP, speed), type) << "speed " << speed;
    }
}

TEST(GetPortType, FibreHasTypesFor100And1000And10000Only) {
    const std::map<int, CMPIUint16> expected = {{0, 0},     {10, 0},      {100, 100},  {1000, 102}, {2500, 0},
                                                {5000, 1},  {10000, 105}, {20000, 1},  {25000, 1},  {40000, 1},
                                                {50000, 1}, {56000, 1},   {100000, 1}, {3, 0}};
    for (const auto& [speed, type] : expected) {
        EXPECT_EQ(portType(PNICPORT_MODE_FIBRE, speed), type) << "speed " << speed;
    }
}

TEST(GetPortType, DirectAttachIsOtherAtEverySpeed) {
    for (int speed : kSpeeds) {
        EXPECT_EQ(portType(PNICPORT_MODE_DA, speed), 1) << "speed " << speed;
    }
    for (int speed : kStrangeSpeeds) {
        EXPECT_EQ(portType(PNICPORT_MODE_DA, speed), 1) << "speed " << speed;
    }
}

TEST(GetPortType, OtherPortsAreUnknownExceptAtTheOtherSpeeds) {
    for (int port : {int{PNICPORT_MODE_AUI}, int{PNICPORT_MODE_BNC}, int{PNICPORT_MODE_MII}, int{PNICPORT_MODE_UNKNOWN}, 7}) {
        for (int speed : kSpeeds) {
            EXPECT_EQ(portType(port, speed), isOtherSpeed(speed) ? 1 : 0) << "port " << port << " speed " << speed;
        }
    }
}

TEST(GetPortType, EdgeCasesOfTheDesign) {
    EXPECT_EQ(portType(PNICPORT_MODE_FIBRE, 2500), 0);
    EXPECT_EQ(portType(PNICPORT_MODE_TP, 5000), 1);
    EXPECT_EQ(portType(PNICPORT_MODE_DA, 1000), 1);
    EXPECT_EQ(portType(PNICPORT_MODE_TP, CONNECTION_AUTO), 0);
}

TEST(ConvertPortMode, ModesZeroToFiveGiveModePlusOneAndTheRestZero) {
    const std::map<int, int> expected = {{0, 1}, {1, 2}, {2, 3}, {3, 4}, {4, 5}, {5, 6}, {6, 0}, {7, 0}};
    for (const auto& [mode, value] : expected) {
        EXPECT_EQ(EthernetPortProvider::convertPortMode(static_cast<PnicPortMode>(mode)), value) << "mode " << mode;
    }
    EXPECT_EQ(EthernetPortProvider::convertPortMode(PNICPORT_MODE_UNKNOWN), 0);
}

TEST(ConvertTransceiver, InternalAndExternalOnly) {
    EXPECT_EQ(EthernetPortProvider::convertTransceiver(TRANSCEIVER_MODE_INTERNAL), 1);
    EXPECT_EQ(EthernetPortProvider::convertTransceiver(TRANSCEIVER_MODE_EXTERNAL), 2);
    EXPECT_EQ(EthernetPortProvider::convertTransceiver(TRANSCEIVER_MODE_UNKNOWN), 0);
    EXPECT_EQ(EthernetPortProvider::convertTransceiver(static_cast<TransceiverMode>(3)), 0);
    EXPECT_EQ(EthernetPortProvider::TRANSCEIVER_ENTERNAL, 2);
}

TEST(ConvertWOLOption, ValuesZeroToSixGiveValuePlusOneAndTheRestDisable) {
    const std::map<int, int> expected = {{0, 1}, {1, 2}, {2, 3}, {3, 4}, {4, 5}, {5, 6},
                                         {6, 7}, {7, 0}, {8, 0}, {9, 0}, {15, 0}};
    for (const auto& [mode, value] : expected) {
        EXPECT_EQ(EthernetPortProvider::convertWOLOption(static_cast<WakeOnMode>(mode)), value) << "mode " << mode;
    }
    EXPECT_EQ(EthernetPortProvider::convertWOLOption(WAKEON_MODE_DISABLE), 0);
    EXPECT_EQ(EthernetPortProvider::convertWOLOption(WAKEON_MODE_UNSUPPORTED), 0);
}

std::string linkMode(int speed, int duplex) {
    return EthernetPortProvider::convertLinkMode({static_cast<LinkSpeed>(speed), static_cast<Duplex>(duplex)});
}

TEST(ConvertLinkMode, EverySpeedWithEveryDuplex) {
    const std::map<int, std::string> speeds = {{0, "AUTO"},      {10, "10"},       {100, "100"},     {1000, "1000"},
                                               {2500, "2500"},   {5000, "5000"},   {10000, "10000"}, {20000, "20000"},
                                               {25000, "25000"}, {40000, "40000"}, {50000, "50000"}, {56000, "56000"},
                                               {100000, "100000"}, {3, ""},        {131071, ""}};
    const std::map<int, std::string> duplexes = {{0, "AUTO"}, {1, "FULL"}, {2, "HALF"}, {3, ""}, {7, ""}};
    for (const auto& [speed, speedText] : speeds) {
        for (const auto& [duplex, duplexText] : duplexes) {
            EXPECT_EQ(linkMode(speed, duplex), speedText + "_" + duplexText) << speed << " " << duplex;
        }
    }
}

TEST(ConvertLinkMode, ExamplesOfTheDesign) {
    EXPECT_EQ(linkMode(1000, DUPLEX_MODE_FULL), "1000_FULL");
    EXPECT_EQ(linkMode(0, 0), "AUTO_AUTO");
    EXPECT_EQ(linkMode(3, DUPLEX_MODE_HALF), "_HALF");
    EXPECT_EQ(linkMode(3, 7), "_");
}

}  // namespace
