// SMART answers parsed from byte buffers laid out as the standards define
// them: the NVMe SMART / Health Information log page, the sense data of the
// ATA PASS-THROUGH command (descriptor and fixed formats), and the ATA SMART
// data and threshold sectors.
#include "health/ata_smart.hpp"
#include "health/nvme_smart.hpp"

#include <gtest/gtest.h>

#include <numeric>

using namespace orv::linuxhost::health;

namespace {

std::vector<std::uint8_t> nvmeLog(std::uint8_t warning, std::uint8_t used = 3)
{
    std::vector<std::uint8_t> log(512, 0);
    log[0] = warning;
    log[1] = 0x40;  // 320 K
    log[2] = 0x01;
    log[3] = 100;
    log[4] = 10;
    log[5] = used;
    return log;
}

std::uint16_t nvmeState(const std::vector<std::uint8_t>& bytes)
{
    return nvmeHealth(*parseNvmeHealthLog(bytes.data(), bytes.size()));
}

TEST(NvmeHealthLog, FieldsAtTheirOffsets)
{
    std::vector<std::uint8_t> bytes = nvmeLog(0);
    bytes[160] = 0x34;
    bytes[161] = 0x12;
    auto log = parseNvmeHealthLog(bytes.data(), bytes.size());
    ASSERT_TRUE(log);
    EXPECT_EQ(log->temperatureKelvin, 320);
    EXPECT_EQ(log->availableSpare, 100);
    EXPECT_EQ(log->spareThreshold, 10);
    EXPECT_EQ(log->percentageUsed, 3);
    EXPECT_EQ(log->mediaErrors, 0x1234u);
    bytes[170] = 1;
    EXPECT_EQ(parseNvmeHealthLog(bytes.data(), bytes.size())->mediaErrors, UINT64_MAX);
    EXPECT_FALSE(parseNvmeHealthLog(bytes.data(), 511));
}

TEST(NvmeHealthLog, HealthyDriveIsOk)
{
    EXPECT_EQ(nvmeState(nvmeLog(0)), 5);
}

TEST(NvmeHealthLog, CriticalWarningsBySeverity)
{
    EXPECT_EQ(nvmeState(nvmeLog(kNvmeSpareBelowThreshold)), 10);
    EXPECT_EQ(nvmeState(nvmeLog(kNvmeTemperature)), 10);
    EXPECT_EQ(nvmeState(nvmeLog(kNvmeReliabilityDegraded)), 20);
    EXPECT_EQ(nvmeState(nvmeLog(kNvmeVolatileBackupFailed)), 20);
    EXPECT_EQ(nvmeState(nvmeLog(kNvmePersistentMemoryReadOnly)), 20);
    EXPECT_EQ(nvmeState(nvmeLog(kNvmeReadOnly | kNvmeTemperature)), 25);
}

TEST(NvmeHealthLog, EnduranceUsedUpAndMediaErrorsDegrade)
{
    EXPECT_EQ(nvmeState(nvmeLog(0, 100)), 10);
    EXPECT_EQ(nvmeState(nvmeLog(0, 255)), 10);
    std::vector<std::uint8_t> errors = nvmeLog(0);
    errors[160] = 2;
    EXPECT_EQ(nvmeState(errors), 10);
}

TEST(AtaCommandBlocks, SmartReturnStatusAndReadData)
{
    auto status = ataSmartCommandBlock(SmartCommand::ReturnStatus);
    EXPECT_EQ(status[0], 0x85);
    EXPECT_EQ(status[1], 0x06);
    EXPECT_EQ(status[2], 0x20);
    EXPECT_EQ(status[4], 0xDA);
    EXPECT_EQ(status[6], 0);
    EXPECT_EQ(status[10], 0x4F);
    EXPECT_EQ(status[12], 0xC2);
    EXPECT_EQ(status[14], 0xB0);
    auto data = ataSmartCommandBlock(SmartCommand::ReadData);
    EXPECT_EQ(data[1], 0x08);
    EXPECT_EQ(data[2], 0x0E);
    EXPECT_EQ(data[4], 0xD0);
    EXPECT_EQ(data[6], 1);
    EXPECT_EQ(ataSmartCommandBlock(SmartCommand::ReadThresholds)[4], 0xD1);
}

// Descriptor-format sense (72h) with the ATA Status Return descriptor.
std::vector<std::uint8_t> descriptorSense(std::uint8_t mid, std::uint8_t high)
{
    std::vector<std::uint8_t> sense(22, 0);
    sense[0] = 0x72;
    sense[1] = 0x01;  // recovered error
    sense[2] = 0x00;
    sense[3] = 0x1D;  // ATA pass through information available
    sense[7] = 14;
    sense[8] = 0x09;
    sense[9] = 0x0C;
    sense[17] = mid;
    sense[19] = high;
    sense[21] = 0x50;  // status: ready, no error
    return sense;
}

TEST(AtaReturnStatus, DescriptorSenseTellsPassingFromFailing)
{
    auto passing = descriptorSense(0x4F, 0xC2);
    auto failing = descriptorSense(0xF4, 0x2C);
    auto other = descriptorSense(0x00, 0x00);
    EXPECT_EQ(smartThresholdExceeded(passing.data(), passing.size()), false);
    EXPECT_EQ(smartThresholdExceeded(failing.data(), failing.size()), true);
    EXPECT_EQ(smartThresholdExceeded(other.data(), other.size()), std::nullopt);
}

TEST(AtaReturnStatus, DescriptorAfterAnotherDescriptorIsFound)
{
    std::vector<std::uint8_t> sense = {0x72, 0x01, 0x00, 0x1D, 0, 0, 0, 18,
                                       0x02, 0x02, 0x00, 0x00,  // a 4-byte descriptor first
                                       0x09, 0x0C, 0, 0, 0, 0, 0, 0, 0, 0xF4, 0, 0x2C, 0xA0, 0x51};
    EXPECT_EQ(smartThresholdExceeded(sense.data(), sense.size()), true);
}

TEST(AtaReturnStatus, FixedFormatSense)
{
    std::vector<std::uint8_t> sense(18, 0);
    sense[0] = 0x70;
    sense[2] = 0x01;
    sense[7] = 10;
    sense[10] = 0xF4;
    sense[11] = 0x2C;
    EXPECT_EQ(smartThresholdExceeded(sense.data(), sense.size()), true);
    sense[10] = 0x4F;
    sense[11] = 0xC2;
    EXPECT_EQ(smartThresholdExceeded(sense.data(), sense.size()), false);
}

TEST(AtaPowerMode, CheckPowerModeBlockAndCountRegister)
{
    auto cdb = ataCheckPowerModeBlock();
    EXPECT_EQ(cdb[0], 0x85);
    EXPECT_EQ(cdb[1], 0x06);
    EXPECT_EQ(cdb[2], 0x20);
    EXPECT_EQ(cdb[14], 0xE5);
    auto sense = descriptorSense(0, 0);
    sense[13] = 0xFF;  // COUNT (7:0): active or idle
    EXPECT_EQ(ataCountRegister(sense.data(), sense.size()), 0xFF);
    sense[13] = 0x00;
    EXPECT_EQ(ataCountRegister(sense.data(), sense.size()), kAtaPowerModeStandby);
    std::vector<std::uint8_t> fixed(18, 0);
    fixed[0] = 0x70;
    fixed[6] = 0x80;
    EXPECT_EQ(ataCountRegister(fixed.data(), fixed.size()), 0x80);
    EXPECT_EQ(ataCountRegister(nullptr, 0), std::nullopt);
}

TEST(AtaReturnStatus, NoRegistersNoVerdict)
{
    std::vector<std::uint8_t> sense = {0x72, 0x05, 0x24, 0x00, 0, 0, 0, 0, 0, 0, 0, 0};
    EXPECT_EQ(smartThresholdExceeded(sense.data(), sense.size()), std::nullopt);
    EXPECT_EQ(smartThresholdExceeded(nullptr, 0), std::nullopt);
}

struct Entry {
    std::uint8_t id;
    bool preFailure;
    std::uint8_t value, worst, threshold;
    std::uint64_t raw;
};

void sealChecksum(std::vector<std::uint8_t>& sector)
{
    sector[511] = 0;
    sector[511] = static_cast<std::uint8_t>(256 - std::accumulate(sector.begin(), sector.end(), 0u) % 256);
}

// The SMART data sector and the threshold sector of the entries.
std::pair<std::vector<std::uint8_t>, std::vector<std::uint8_t>> smartSectors(const std::vector<Entry>& entries)
{
    std::vector<std::uint8_t> data(512, 0), thresholds(512, 0);
    data[0] = thresholds[0] = 0x10;  // revision
    for (std::size_t i = 0; i < entries.size(); ++i) {
        std::uint8_t* d = data.data() + 2 + i * 12;
        std::uint8_t* t = thresholds.data() + 2 + i * 12;
        d[0] = t[0] = entries[i].id;
        d[1] = entries[i].preFailure ? 0x03 : 0x32;
        d[3] = entries[i].value;
        d[4] = entries[i].worst;
        for (int b = 0; b < 6; ++b) d[5 + b] = static_cast<std::uint8_t>(entries[i].raw >> (8 * b));
        t[1] = entries[i].threshold;
    }
    sealChecksum(data);
    sealChecksum(thresholds);
    return {data, thresholds};
}

const std::vector<Entry> kHealthyDisk = {
    {1, true, 200, 200, 51, 0},   {3, true, 177, 175, 21, 4100}, {5, true, 200, 200, 140, 0},
    {9, false, 91, 91, 0, 6600},  {194, false, 112, 99, 0, 35},  {197, false, 200, 200, 0, 0},
    {198, false, 100, 253, 0, 0},
};

TEST(AtaAttributes, TableReadWithThresholdsById)
{
    auto [data, thresholds] = smartSectors(kHealthyDisk);
    auto attributes = parseSmartAttributes(data, thresholds);
    ASSERT_TRUE(attributes);
    ASSERT_EQ(attributes->size(), kHealthyDisk.size());
    EXPECT_EQ((*attributes)[1].id, 3);
    EXPECT_TRUE((*attributes)[1].preFailure);
    EXPECT_EQ((*attributes)[1].value, 177);
    EXPECT_EQ((*attributes)[1].worst, 175);
    EXPECT_EQ((*attributes)[1].threshold, 21);
    EXPECT_EQ((*attributes)[1].raw, 4100u);
    EXPECT_FALSE((*attributes)[3].preFailure);
}

TEST(AtaAttributes, BadChecksumOfDataGivesNothingOfThresholdsGivesNoThresholds)
{
    auto [data, thresholds] = smartSectors(kHealthyDisk);
    std::vector<std::uint8_t> badThresholds = thresholds;
    badThresholds[511] ^= 1;
    auto attributes = parseSmartAttributes(data, badThresholds);
    ASSERT_TRUE(attributes);
    EXPECT_FALSE((*attributes)[0].threshold);
    data[100] ^= 1;
    EXPECT_FALSE(parseSmartAttributes(data, thresholds));
    EXPECT_FALSE(parseSmartAttributes(std::vector<std::uint8_t>(100, 0), thresholds));
}

std::optional<std::uint16_t> verdictOf(std::optional<bool> exceeded, const std::vector<Entry>& entries)
{
    auto [data, thresholds] = smartSectors(entries);
    return ataSmartHealth(exceeded, parseSmartAttributes(data, thresholds));
}

TEST(AtaSmartHealth, HealthyDiskIsOk)
{
    EXPECT_EQ(verdictOf(false, kHealthyDisk), 5);
}

TEST(AtaSmartHealth, ThresholdExceededIsMajorFailure)
{
    EXPECT_EQ(verdictOf(true, kHealthyDisk), 20);
    EXPECT_EQ(ataSmartHealth(true, std::nullopt), 20);
}

TEST(AtaSmartHealth, PreFailureAttributeAtItsThresholdIsMajorFailure)
{
    std::vector<Entry> failing = kHealthyDisk;
    failing[2] = {5, true, 140, 140, 140, 1800};
    EXPECT_EQ(verdictOf(false, failing), 20);
}

TEST(AtaSmartHealth, AttributeThatFailedInThePastOrReallocationsDegrade)
{
    std::vector<Entry> past = kHealthyDisk;
    past[0] = {1, true, 200, 40, 51, 0};
    EXPECT_EQ(verdictOf(false, past), 10);
    std::vector<Entry> reallocated = kHealthyDisk;
    reallocated[2].raw = 8;
    EXPECT_EQ(verdictOf(false, reallocated), 10);
    std::vector<Entry> pending = kHealthyDisk;
    pending[5].raw = 1;
    EXPECT_EQ(verdictOf(std::nullopt, pending), 10);
}

TEST(AtaSmartHealth, ZeroAndAlwaysFailingThresholdsAreIgnored)
{
    std::vector<Entry> entries = kHealthyDisk;
    entries.push_back({240, true, 100, 100, 0xFF, 0});
    entries.push_back({241, true, 0, 0, 0, 0});
    EXPECT_EQ(verdictOf(false, entries), 5);
}

TEST(AtaSmartHealth, NothingKnownIsNoHealth)
{
    EXPECT_EQ(ataSmartHealth(std::nullopt, std::nullopt), std::nullopt);
}

}  // namespace
