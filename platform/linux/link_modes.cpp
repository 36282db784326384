#include "link_modes.hpp"

#include <algorithm>
#include <array>

namespace orv::linuxhost {

namespace {

// Every speed bit of the kernel's link-mode enumeration (the ABI's bit numbers).
constexpr KernelLinkMode kLinkModes[] = {
    {0, 10, DUPLEX_HALF},  // 10baseT_Half
    {1, 10, DUPLEX_FULL},  // 10baseT_Full
    {2, 100, DUPLEX_HALF},  // 100baseT_Half
    {3, 100, DUPLEX_FULL},  // 100baseT_Full
    {4, 1000, DUPLEX_HALF},  // 1000baseT_Half
    {5, 1000, DUPLEX_FULL},  // 1000baseT_Full
    {12, 10000, DUPLEX_FULL},  // 10000baseT_Full
    {15, 2500, DUPLEX_FULL},  // 2500baseX_Full
    {17, 1000, DUPLEX_FULL},  // 1000baseKX_Full
    {18, 10000, DUPLEX_FULL},  // 10000baseKX4_Full
    {19, 10000, DUPLEX_FULL},  // 10000baseKR_Full
    {20, 10000, DUPLEX_FULL},  // 10000baseR_FEC
    {21, 20000, DUPLEX_FULL},  // 20000baseMLD2_Full
    {22, 20000, DUPLEX_FULL},  // 20000baseKR2_Full
    {23, 40000, DUPLEX_FULL},  // 40000baseKR4_Full
    {24, 40000, DUPLEX_FULL},  // 40000baseCR4_Full
    {25, 40000, DUPLEX_FULL},  // 40000baseSR4_Full
    {26, 40000, DUPLEX_FULL},  // 40000baseLR4_Full
    {27, 56000, DUPLEX_FULL},  // 56000baseKR4_Full
    {28, 56000, DUPLEX_FULL},  // 56000baseCR4_Full
    {29, 56000, DUPLEX_FULL},  // 56000baseSR4_Full
    {30, 56000, DUPLEX_FULL},  // 56000baseLR4_Full
    {31, 25000, DUPLEX_FULL},  // 25000baseCR_Full
    {32, 25000, DUPLEX_FULL},  // 25000baseKR_Full
    {33, 25000, DUPLEX_FULL},  // 25000baseSR_Full
    {34, 50000, DUPLEX_FULL},  // 50000baseCR2_Full
    {35, 50000, DUPLEX_FULL},  // 50000baseKR2_Full
    {36, 100000, DUPLEX_FULL},  // 100000baseKR4_Full
    {37, 100000, DUPLEX_FULL},  // 100000baseSR4_Full
    {38, 100000, DUPLEX_FULL},  // 100000baseCR4_Full
    {39, 100000, DUPLEX_FULL},  // 100000baseLR4_ER4_Full
    {40, 50000, DUPLEX_FULL},  // 50000baseSR2_Full
    {41, 1000, DUPLEX_FULL},  // 1000baseX_Full
    {42, 10000, DUPLEX_FULL},  // 10000baseCR_Full
    {43, 10000, DUPLEX_FULL},  // 10000baseSR_Full
    {44, 10000, DUPLEX_FULL},  // 10000baseLR_Full
    {45, 10000, DUPLEX_FULL},  // 10000baseLRM_Full
    {46, 10000, DUPLEX_FULL},  // 10000baseER_Full
    {47, 2500, DUPLEX_FULL},  // 2500baseT_Full
    {48, 5000, DUPLEX_FULL},  // 5000baseT_Full
    {52, 50000, DUPLEX_FULL},  // 50000baseKR_Full
    {53, 50000, DUPLEX_FULL},  // 50000baseSR_Full
    {54, 50000, DUPLEX_FULL},  // 50000baseCR_Full
    {55, 50000, DUPLEX_FULL},  // 50000baseLR_ER_FR_Full
    {56, 50000, DUPLEX_FULL},  // 50000baseDR_Full
    {57, 100000, DUPLEX_FULL},  // 100000baseKR2_Full
    {58, 100000, DUPLEX_FULL},  // 100000baseSR2_Full
    {59, 100000, DUPLEX_FULL},  // 100000baseCR2_Full
    {60, 100000, DUPLEX_FULL},  // 100000baseLR2_ER2_FR2_Full
    {61, 100000, DUPLEX_FULL},  // 100000baseDR2_Full
    {62, 200000, DUPLEX_FULL},  // 200000baseKR4_Full
    {63, 200000, DUPLEX_FULL},  // 200000baseSR4_Full
    {64, 200000, DUPLEX_FULL},  // 200000baseLR4_ER4_FR4_Full
    {65, 200000, DUPLEX_FULL},  // 200000baseDR4_Full
    {66, 200000, DUPLEX_FULL},  // 200000baseCR4_Full
    {67, 100, DUPLEX_FULL},  // 100baseT1_Full
    {68, 1000, DUPLEX_FULL},  // 1000baseT1_Full
    {69, 400000, DUPLEX_FULL},  // 400000baseKR8_Full
    {70, 400000, DUPLEX_FULL},  // 400000baseSR8_Full
    {71, 400000, DUPLEX_FULL},  // 400000baseLR8_ER8_FR8_Full
    {72, 400000, DUPLEX_FULL},  // 400000baseDR8_Full
    {73, 400000, DUPLEX_FULL},  // 400000baseCR8_Full
    {75, 100000, DUPLEX_FULL},  // 100000baseKR_Full
    {76, 100000, DUPLEX_FULL},  // 100000baseSR_Full
    {77, 100000, DUPLEX_FULL},  // 100000baseLR_ER_FR_Full
    {78, 100000, DUPLEX_FULL},  // 100000baseCR_Full
    {79, 100000, DUPLEX_FULL},  // 100000baseDR_Full
    {80, 200000, DUPLEX_FULL},  // 200000baseKR2_Full
    {81, 200000, DUPLEX_FULL},  // 200000baseSR2_Full
    {82, 200000, DUPLEX_FULL},  // 200000baseLR2_ER2_FR2_Full
    {83, 200000, DUPLEX_FULL},  // 200000baseDR2_Full
    {84, 200000, DUPLEX_FULL},  // 200000baseCR2_Full
    {85, 400000, DUPLEX_FULL},  // 400000baseKR4_Full
    {86, 400000, DUPLEX_FULL},  // 400000baseSR4_Full
    {87, 400000, DUPLEX_FULL},  // 400000baseLR4_ER4_FR4_Full
    {88, 400000, DUPLEX_FULL},  // 400000baseDR4_Full
    {89, 400000, DUPLEX_FULL},  // 400000baseCR4_Full
    {90, 100, DUPLEX_HALF},  // 100baseFX_Half
    {91, 100, DUPLEX_FULL},  // 100baseFX_Full
    {92, 10, DUPLEX_FULL},  // 10baseT1L_Full
    {93, 10, DUPLEX_FULL},  // 10baseT1S_Full
    {94, 10, DUPLEX_HALF},  // 10baseT1S_Half
    {95, 10, DUPLEX_HALF},  // 10baseT1S_P2MP_Half
    {96, 10, DUPLEX_FULL},  // 10baseT1BRR_Full
    {97, 200000, DUPLEX_FULL},  // 200000baseCR_Full
    {98, 200000, DUPLEX_FULL},  // 200000baseKR_Full
    {99, 200000, DUPLEX_FULL},  // 200000baseDR_Full
    {100, 200000, DUPLEX_FULL},  // 200000baseDR_2_Full
    {101, 200000, DUPLEX_FULL},  // 200000baseSR_Full
    {102, 200000, DUPLEX_FULL},  // 200000baseVR_Full
    {103, 400000, DUPLEX_FULL},  // 400000baseCR2_Full
    {104, 400000, DUPLEX_FULL},  // 400000baseKR2_Full
    {105, 400000, DUPLEX_FULL},  // 400000baseDR2_Full
    {106, 400000, DUPLEX_FULL},  // 400000baseDR2_2_Full
    {107, 400000, DUPLEX_FULL},  // 400000baseSR2_Full
    {108, 400000, DUPLEX_FULL},  // 400000baseVR2_Full
    {109, 800000, DUPLEX_FULL},  // 800000baseCR4_Full
    {110, 800000, DUPLEX_FULL},  // 800000baseKR4_Full
    {111, 800000, DUPLEX_FULL},  // 800000baseDR4_Full
    {112, 800000, DUPLEX_FULL},  // 800000baseDR4_2_Full
    {113, 800000, DUPLEX_FULL},  // 800000baseSR4_Full
    {114, 800000, DUPLEX_FULL},  // 800000baseVR4_Full
};

constexpr std::array<std::uint32_t, 12> kRecordSpeeds = {10,    100,   1000,  2500,  5000,  10000,
                                                         20000, 25000, 40000, 50000, 56000, 100000};

}  // namespace

std::optional<KernelLinkMode> kernelLinkMode(unsigned bit)
{
    for (const auto& mode : kLinkModes) {
        if (mode.bit == bit) return mode;
    }
    return std::nullopt;
}

bool isRecordSpeed(std::uint32_t megabits)
{
    return std::find(kRecordSpeeds.begin(), kRecordSpeeds.end(), megabits) != kRecordSpeeds.end();
}

std::vector<SpeedDuplex> recordLinkModes(const LinkModeMask& mask)
{
    std::vector<SpeedDuplex> modes;
    for (const auto& mode : kLinkModes) {
        if (!mask.test(mode.bit) || !isRecordSpeed(mode.speed)) continue;
        SpeedDuplex pair{mode.speed, recordDuplex(mode.duplex)};
        if (std::find(modes.begin(), modes.end(), pair) == modes.end()) modes.push_back(pair);
    }
    std::sort(modes.begin(), modes.end(), [](const SpeedDuplex& a, const SpeedDuplex& b) {
        return a.speed != b.speed ? a.speed < b.speed : a.duplex < b.duplex;
    });
    return modes;
}

std::uint32_t recordSpeed(std::uint32_t kernelSpeed)
{
    return isRecordSpeed(kernelSpeed) ? kernelSpeed : record::kSpeedAuto;
}

std::uint32_t recordDuplex(std::uint8_t kernelDuplex)
{
    switch (kernelDuplex) {
    case DUPLEX_FULL: return record::kDuplexFull;
    case DUPLEX_HALF: return record::kDuplexHalf;
    default: return record::kDuplexAuto;
    }
}

std::uint32_t recordPort(std::uint8_t kernelPort)
{
    switch (kernelPort) {
    case PORT_TP: return record::kPortTp;
    case PORT_AUI: return record::kPortAui;
    case PORT_BNC: return record::kPortBnc;
    case PORT_MII: return record::kPortMii;
    case PORT_FIBRE: return record::kPortFibre;
    case PORT_DA: return record::kPortDa;
    default: return record::kPortUnknown;
    }
}

std::vector<std::uint32_t> recordPorts(const LinkModeMask& supported)
{
    const std::pair<unsigned, std::uint32_t> portBits[] = {
        {ETHTOOL_LINK_MODE_TP_BIT, record::kPortTp},   {ETHTOOL_LINK_MODE_AUI_BIT, record::kPortAui},
        {ETHTOOL_LINK_MODE_BNC_BIT, record::kPortBnc}, {ETHTOOL_LINK_MODE_MII_BIT, record::kPortMii},
        {ETHTOOL_LINK_MODE_FIBRE_BIT, record::kPortFibre},
    };
    std::vector<std::uint32_t> ports;
    for (const auto& [bit, port] : portBits) {
        if (supported.test(bit)) ports.push_back(port);
    }
    return ports;
}

std::uint32_t recordTransceiver(std::uint8_t kernelTransceiver)
{
    switch (kernelTransceiver) {
    case XCVR_INTERNAL: return record::kTransceiverInternal;
    case XCVR_EXTERNAL: return record::kTransceiverExternal;
    default: return record::kTransceiverUnknown;
    }
}

std::vector<std::uint32_t> recordWakeModes(std::uint32_t wakeMask, std::uint32_t whenNone)
{
    std::vector<std::uint32_t> modes;
    for (std::uint32_t mode = 0; mode <= record::kWakeMagicSecure; ++mode) {
        if (wakeMask & (1u << mode)) modes.push_back(mode);
    }
    if (modes.empty()) modes.push_back(whenNone);
    return modes;
}

}  // namespace orv::linuxhost
