// The brand index text and the characteristic slots of a package.
#include <gtest/gtest.h>

#include "OrvaneProcessor-Values.h"

namespace {

using OrvaneProcessor::CharacteristicSlot;
using OrvaneProcessor::CpuDetails;

TEST(BrandTextTest, BrandIdTenRendersAsZeroXThreeBlanksAndA) {
    EXPECT_EQ(OrvaneProcessor::brandText(0x0a), "0x   a");
}

TEST(BrandTextTest, TwoDigitsAreRightAlignedInLowerCase) {
    EXPECT_EQ(OrvaneProcessor::brandText(0xff), "0x  ff");
    EXPECT_EQ(OrvaneProcessor::brandText(0x1F), "0x  1f");
}

TEST(BrandTextTest, ZeroIsOneDigit) { EXPECT_EQ(OrvaneProcessor::brandText(0), "0x   0"); }

// (code, state) of each slot; (0, 0) for an empty one.
std::vector<std::pair<int, int>> slotsOf(const CpuDetails& record) {
    std::vector<std::pair<int, int>> slots;
    for (const std::optional<CharacteristicSlot>& slot : OrvaneProcessor::characteristicSlots(record)) {
        slots.emplace_back(slot ? slot->code : 0, slot ? slot->state : 0);
    }
    return slots;
}

TEST(CharacteristicSlotsTest, EveryFeatureFillsItsOwnSlotInOrder) {
    CpuDetails record{};
    record.LMSupported = record.VTSupported = record.HTSupported = record.XDSupported = 1;
    record.PCTLSupported = record.PCTLEnabled = 1;
    EXPECT_EQ(slotsOf(record), (std::vector<std::pair<int, int>>{{2, 2}, {4, 2}, {5, 2}, {6, 2}, {7, 2}}));
}

TEST(CharacteristicSlotsTest, NoFeatureLeavesEverySlotEmpty) {
    EXPECT_EQ(slotsOf(CpuDetails{}), (std::vector<std::pair<int, int>>(5, {0, 0})));
}

TEST(CharacteristicSlotsTest, OnlyPowerControlLooksAtItsEnabledFlag) {
    CpuDetails record{};
    record.VTSupported = 1;
    record.VTEnabled = 0;
    record.HTSupported = 1;
    record.HTEnabled = 0;
    record.PCTLSupported = 1;
    record.PCTLEnabled = 0;
    EXPECT_EQ(slotsOf(record), (std::vector<std::pair<int, int>>{{0, 0}, {4, 2}, {5, 2}, {0, 0}, {7, 3}}));
}

TEST(CharacteristicSlotsTest, EnabledFlagsWithoutSupportFillNothing) {
    CpuDetails record{};
    record.LMEnabled = record.VTEnabled = record.HTEnabled = record.XDEnabled = record.PCTLEnabled = 1;
    EXPECT_EQ(slotsOf(record), (std::vector<std::pair<int, int>>(5, {0, 0})));
}

TEST(CharacteristicSlotsTest, CodesAndStatesHaveTheirNumbers) {
    EXPECT_EQ(OrvaneProcessor::BITS64, 2);
    EXPECT_EQ(OrvaneProcessor::BITS32, 3);
    EXPECT_EQ(OrvaneProcessor::VIRT, 4);
    EXPECT_EQ(OrvaneProcessor::HWTH, 5);
    EXPECT_EQ(OrvaneProcessor::XDNX, 6);
    EXPECT_EQ(OrvaneProcessor::PCTL, 7);
    EXPECT_EQ(OrvaneProcessor::UNKNOWN, 0);
    EXPECT_EQ(OrvaneProcessor::ENABLED, 2);
    EXPECT_EQ(OrvaneProcessor::DISABLED, 3);
    EXPECT_EQ(OrvaneProcessor::NOTAPPLICABLE, 4);
}

}  // namespace
