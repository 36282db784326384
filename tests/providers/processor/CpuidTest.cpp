// Bit reading of CPUID entries and the per-vendor entry layout, with chosen
// register values.
#include <gtest/gtest.h>

#include <tuple>
#include <vector>

#include "OrvaneProcessor-Cpuid.h"

namespace {

using OrvaneProcessor::CpuidEntry;
using OrvaneProcessor::CpuidMap;
using OrvaneProcessor::createCpuidMap;

uint8_t bitsOf(uint32_t reg, uint32_t begin, uint32_t end) {
    CpuidEntry entry(reg, begin, end);
    return entry.readBits();
}

TEST(ReadBitsTest, OneBitEntryReadsOneWhenItsBitIsSet) { EXPECT_EQ(bitsOf(1U << 5, 5, 5), 1); }

TEST(ReadBitsTest, OneBitEntryReadsZeroWhenNoBitAtOrAboveItIsSet) {
    EXPECT_EQ(bitsOf(0x1F, 5, 5), 0);
    EXPECT_EQ(bitsOf(0, 5, 5), 0);
}

TEST(ReadBitsTest, OneBitEntryReadsOneWhenOnlyAHigherBitIsSet) {
    EXPECT_EQ(bitsOf(0x80000000, 5, 5), 1);
    EXPECT_EQ(bitsOf(0x00200000, 20, 20), 1);
}

TEST(ReadBitsTest, EightBitEntryIsAllOnesWhenAnyOfBitsSevenUpIsSet) {
    EXPECT_EQ(bitsOf(0x80, 0, 7), 0xFF);
    EXPECT_EQ(bitsOf(0x80000000, 0, 7), 0xFF);
    EXPECT_EQ(bitsOf(0x00400800, 0, 7), 0xFF);
}

TEST(ReadBitsTest, EightBitEntrySetsBitIWhenTheValueShiftedByIIsNonzero) {
    EXPECT_EQ(bitsOf(0x0A, 0, 7), 0x0F);
    EXPECT_EQ(bitsOf(0x01, 0, 7), 0x01);
    EXPECT_EQ(bitsOf(0x7F, 0, 7), 0x7F);
    EXPECT_EQ(bitsOf(0, 0, 7), 0x00);
}

TEST(ReadBitsTest, ReadingConsumesTheEntry) {
    CpuidEntry entry(0xFF00, 0, 3);
    EXPECT_EQ(entry.readBits(), 0x0F);
    EXPECT_EQ(entry.reg, 0xFF0U);
    EXPECT_EQ(entry.readBits(), 0x0F);
    EXPECT_EQ(entry.reg, 0xFFU);
    EXPECT_EQ(entry.readBits(), 0x0F);
    EXPECT_EQ(entry.reg, 0xFU);
    EXPECT_EQ(entry.readBits(), 0x0F);
    EXPECT_EQ(entry.reg, 0U);
    EXPECT_EQ(entry.readBits(), 0x00);
}

TEST(ReadBitsTest, TheValueIsShiftedByTheBeginningFirst) {
    CpuidEntry entry(0x20000000, 29, 29);
    EXPECT_EQ(entry.readBits(), 1);
    EXPECT_EQ(entry.reg, 0U);
    CpuidEntry brand(0x80, 0, 7);
    EXPECT_EQ(brand.readBits(), 0xFF);
    EXPECT_EQ(brand.readBits(), 0x00);
}

TEST(ReadBitsTest, AnEndBelowTheBeginningReadsUntilTheValueRunsOut) {
    EXPECT_EQ(bitsOf(0x0F, 2, 1), 0x03);
    EXPECT_EQ(bitsOf(0xFFFFFFFF, 4, 0), 0xFF);
}

TEST(ReadBitsTest, ABeginningPastTheRegisterReadsNothing) { EXPECT_EQ(bitsOf(0xFFFFFFFF, 32, 39), 0); }

TEST(ReadBitsTest, OnlyTheLowEightBitsOfTheResultAreKept) { EXPECT_EQ(bitsOf(0xFFFFFFFF, 0, 31), 0xFF); }

// (name, register, beginindex, endindex) of every entry, in map order.
using Rows = std::vector<std::tuple<std::string, uint32_t, uint32_t, uint32_t>>;

Rows rowsOf(const CpuidMap& m) {
    Rows rows;
    for (const auto& [name, entry] : m) {
        rows.emplace_back(name, entry.reg, entry.beginindex, entry.endindex);
    }
    return rows;
}

Hardware_PCPUCPUIDSummaryStruct summary(uint32_t ebx, uint32_t edx, uint32_t ecx) {
    Hardware_PCPUCPUIDSummaryStruct cpuid{};
    cpuid.id0 = {0x16, ebx, ecx, edx};
    cpuid.id1 = {0x50654, 0x11111111, 0x22222222, 0x33333333};
    cpuid.id81 = {0x44444444, 0x55555555, 0x66666666, 0x77777777};
    return cpuid;
}

constexpr uint32_t kGenu = 0x756E6547, kIneI = 0x49656E69, kNtel = 0x6C65746E;
constexpr uint32_t kAuth = 0x68747541, kEnti = 0x69746E65, kCamd = 0x444D4163;

TEST(CreateCpuidMapTest, IntelTakesVirtualisationFromLeafOneEcxBitFive) {
    CpuidMap m;
    EXPECT_EQ(createCpuidMap(summary(kGenu, kIneI, kNtel), m), OrvaneProcessor::INTEL);
    EXPECT_EQ(rowsOf(m), (Rows{{"BrandID", 0x11111111, 0, 7},
                               {"LMSupported", 0x77777777, 29, 29},
                               {"VTSupported", 0x22222222, 5, 5},
                               {"XDSupported", 0x77777777, 20, 20}}));
}

TEST(CreateCpuidMapTest, AmdTakesVirtualisationFromExtendedLeafEcxBitTwo) {
    CpuidMap m;
    EXPECT_EQ(createCpuidMap(summary(kAuth, kEnti, kCamd), m), OrvaneProcessor::AMD);
    EXPECT_EQ(rowsOf(m), (Rows{{"BrandID", 0x11111111, 0, 7},
                               {"LMSupported", 0x77777777, 29, 29},
                               {"VTSupported", 0x66666666, 2, 2},
                               {"XDSupported", 0x77777777, 20, 20}}));
}

TEST(CreateCpuidMapTest, OtherVendorsAddNoEntries) {
    const std::vector<std::tuple<uint32_t, uint32_t, uint32_t>> others = {
        {0, 0, 0},                 // nothing reported
        {0x746E6543, 0x48727561, 0x736C7561},  // CentaurHauls
        {kGenu, kEnti, kCamd},     // Intel's first word, AMD's others
        {kGenu, kIneI, kCamd},     // last word wrong
        {kAuth, kIneI, kNtel},     // AMD's first word, Intel's others
        {kAuth, kEnti, kNtel},     // last word wrong
        {kIneI, kGenu, kNtel},     // Intel's words out of order
    };
    for (const auto& [ebx, edx, ecx] : others) {
        CpuidMap m;
        EXPECT_EQ(createCpuidMap(summary(ebx, edx, ecx), m), OrvaneProcessor::OTHER) << std::hex << ebx;
        EXPECT_TRUE(m.empty()) << std::hex << ebx;
    }
}

TEST(CreateCpuidMapTest, VendorNumbersAreOneTwoThree) {
    EXPECT_EQ(OrvaneProcessor::OTHER, 1);
    EXPECT_EQ(OrvaneProcessor::INTEL, 2);
    EXPECT_EQ(OrvaneProcessor::AMD, 3);
    EXPECT_EQ(sizeof(OrvaneProcessor::VendorEnum), 4U);
}

TEST(CreateCpuidMapTest, IntelWithBitThirtyOneButNotBitFiveIsVirtualisationCapable) {
    Hardware_PCPUCPUIDSummaryStruct cpuid = summary(kGenu, kIneI, kNtel);
    cpuid.id1.ecx = 0x80000000;
    CpuidMap m;
    createCpuidMap(cpuid, m);
    EXPECT_EQ(m.at("VTSupported").readBits(), 1);
}

TEST(CreateCpuidMapTest, ExecuteDisableReadsOneWheneverAnyOfBitsTwentyUpIsSet) {
    Hardware_PCPUCPUIDSummaryStruct cpuid = summary(kAuth, kEnti, kCamd);
    cpuid.id81.edx = 0x00080000;  // bit 19 only
    CpuidMap below;
    createCpuidMap(cpuid, below);
    EXPECT_EQ(below.at("XDSupported").readBits(), 0);
    cpuid.id81.edx = 0x40000000;  // bit 30 only
    CpuidMap above;
    createCpuidMap(cpuid, above);
    EXPECT_EQ(above.at("XDSupported").readBits(), 1);
    EXPECT_EQ(above.at("LMSupported").readBits(), 1);
}

}  // namespace
