// What getCpuDetails collects per package, and the edge cases of collection.
#include "CollectionTest.h"

#include <string>

namespace processortest {
namespace {

using OrvaneProcessor::CpuDetails;

std::vector<std::string> deviceIdsOf(const Collected& collected) {
    std::vector<std::string> ids;
    for (const CpuDetails& record : collected.records) {
        ids.emplace_back(record.DeviceID);
    }
    return ids;
}

TEST_F(CollectionTest, NullPackageListGivesSuccessAndNothingWithoutFetchingTheCpuList) {
    CpuHost host = uniformHost(0, 0);
    host.packages = std::nullopt;
    host.faults = Json::array({fault("KSI_GetInstanceListAlloc", kCpuListNode)});
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 0U);
    EXPECT_TRUE(collected.records.empty());
}

TEST_F(CollectionTest, EmptyPackageListGivesSuccessAndNothing) {
    const Collected collected = collect(uniformHost(0, 0));
    EXPECT_EQ(collected.result, 0U);
    EXPECT_TRUE(collected.records.empty());
}

TEST_F(CollectionTest, EmptyPackageListStillFetchesTheCpuList) {
    CpuHost host = uniformHost(0, 0);
    host.faults = Json::array({fault("KSI_GetInstanceListAlloc", kCpuListNode)});
    EXPECT_EQ(collect(host).result, 1U);
}

TEST_F(CollectionTest, TwoPackagesAreNamedByPositionNotByInstanceNumber) {
    CpuHost host = uniformHost(2, 1);
    (*host.packages)[0].instance = 7;
    (*host.packages)[1].instance = 3;
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 0U);
    EXPECT_EQ(deviceIdsOf(collected), (std::vector<std::string>{"cpu-0", "cpu-1"}));
}

TEST_F(CollectionTest, CoreCountsComeFromEachPackage) {
    CpuHost host = uniformHost(2, 2);
    (*host.packages)[1].cores = 1;
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_EQ(collected.records[0].NumberOfEnabledCores, 2U);
    EXPECT_EQ(collected.records[1].NumberOfEnabledCores, 1U);
}

TEST_F(CollectionTest, ModelNameTabAndBytesAboveTildeBecomeBlanks) {
    CpuHost host = uniformHost(1, 1);
    host.modelName = Json::array({'A', '\t', 'B', 0x7E, 0x7F, 0x80, 0xFF, 'C'});
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_STREQ(collected.records[0].ModelName, "A B~   C");
}

TEST_F(CollectionTest, FortyEightCharacterModelNameLosesItsLastCharacter) {
    const std::string name = "0123456789abcdefghijklmnopqrstuvwxyzABCDEFGHIJKL";
    ASSERT_EQ(name.size(), 48U);
    CpuHost host = uniformHost(1, 1);
    host.modelName = name;
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(std::string(collected.records[0].ModelName), name.substr(0, 47));
}

TEST_F(CollectionTest, EveryPackageCarriesTheHostModelName) {
    CpuHost host = uniformHost(2, 1);
    host.modelName = "Host CPU";
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_STREQ(collected.records[0].ModelName, "Host CPU");
    EXPECT_STREQ(collected.records[1].ModelName, "Host CPU");
}

struct PolicyCase {
    const char* shortName;
    uint8_t supported;
    uint8_t enabled;
};

std::ostream& operator<<(std::ostream& os, const PolicyCase& policy) {
    return os << '"' << policy.shortName << "\" -> (" << int{policy.supported} << ", " << int{policy.enabled} << ")";
}

class PowerPolicyTest : public CollectionTest, public ::testing::WithParamInterface<PolicyCase> {};

TEST_P(PowerPolicyTest, ShortNameDecidesThePowerFlags) {
    CpuHost host = uniformHost(1, 1);
    host.policyShortName = GetParam().shortName;
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].PCTLSupported, GetParam().supported);
    EXPECT_EQ(collected.records[0].PCTLEnabled, GetParam().enabled);
}

INSTANTIATE_TEST_SUITE_P(OffInAnyCaseGivesNeither, PowerPolicyTest,
                         ::testing::Values(PolicyCase{"off", 0, 0}, PolicyCase{"OFF", 0, 0},
                                           PolicyCase{"Offline", 0, 0}, PolicyCase{"oFf-peak", 0, 0}));
INSTANTIATE_TEST_SUITE_P(DynamicInAnyCaseGivesSupportedAndEnabled, PowerPolicyTest,
                         ::testing::Values(PolicyCase{"dynamic", 1, 1}, PolicyCase{"DYNAMIC", 1, 1},
                                           PolicyCase{"Dynamically", 1, 1}));
INSTANTIATE_TEST_SUITE_P(AnyOtherGivesSupportedNotEnabled, PowerPolicyTest,
                         ::testing::Values(PolicyCase{"static", 1, 0}, PolicyCase{"custom", 1, 0},
                                           PolicyCase{"of", 1, 0}, PolicyCase{"dynami", 1, 0},
                                           PolicyCase{"", 1, 0}));

using Flags = std::pair<int, int>;  // (supported, enabled)

Flags powerFlags(const char* shortName) {
    PowerKsi_Policy policy{};
    std::snprintf(policy.shortName, sizeof policy.shortName, "%s", shortName);
    uint8_t supported = 9;
    uint8_t enabled = 9;
    OrvaneProcessor::decidePCTLStatus(policy, supported, enabled);
    return {supported, enabled};
}

// The flags decided for `state` when the enabled flag holds `enabledOnEntry`.
Flags hyperthreadingFlags(Hardware_HTStateEnum state, uint8_t enabledOnEntry) {
    uint8_t supported = 9;
    uint8_t enabled = enabledOnEntry;
    OrvaneProcessor::decideHTStatus(state, supported, enabled);
    return {supported, enabled};
}

TEST(DecidePCTLStatusTest, ComparesOnlyTheLeadingCharacters) {
    EXPECT_EQ(powerFlags("Dynamic balanced"), Flags(1, 1));
    EXPECT_EQ(powerFlags("Off"), Flags(0, 0));
    EXPECT_EQ(powerFlags("balanced dynamic"), Flags(1, 0));
}

TEST(DecideHTStatusTest, NotPresentClearsBothFlags) {
    EXPECT_EQ(hyperthreadingFlags(HTNotPresent, 1), Flags(0, 0));
    EXPECT_EQ(hyperthreadingFlags(HTNotPresent, 0), Flags(0, 0));
}

TEST(DecideHTStatusTest, EnabledIsComparedWithTheFlagNotWithTheEnabledState) {
    EXPECT_EQ(hyperthreadingFlags(HTEnabled, 0), Flags(1, 0));
    EXPECT_EQ(hyperthreadingFlags(HTEnabled, 3), Flags(1, 1));
    EXPECT_EQ(hyperthreadingFlags(HTBIOSDisabled, 1), Flags(1, 1));
    EXPECT_EQ(hyperthreadingFlags(HTTMKDisabled, 2), Flags(1, 1));
    EXPECT_EQ(hyperthreadingFlags(HTBIOSDisabled, 0), Flags(1, 0));
}

TEST_F(CollectionTest, HyperthreadingEnabledHostGivesSupportedButNeverEnabled) {
    CpuHost host = uniformHost(3, 1);
    host.htState = "HTEnabled";
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 3U);
    for (const CpuDetails& record : collected.records) {
        EXPECT_EQ(record.HTSupported, 1) << record.DeviceID;
        EXPECT_EQ(record.HTEnabled, 0) << record.DeviceID;
    }
}

TEST_F(CollectionTest, HyperthreadingNotPresentGivesNeitherFlag) {
    CpuHost host = uniformHost(1, 1);
    host.htState = "HTNotPresent";
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].HTSupported, 0);
    EXPECT_EQ(collected.records[0].HTEnabled, 0);
}

TEST_F(CollectionTest, FirstCpuGivesFamilySteppingVendorBrandAndFlags) {
    CpuHost host = uniformHost(1, 2);
    host.cpus[0].family = 23;
    host.cpus[0].stepping = 201;
    host.cpus[0].cpuid = amdLeaves(0x00000003, 0x00000004, 0x20100000);
    host.cpus[1].family = 99;
    host.cpus[1].stepping = 7;
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    const CpuDetails& record = collected.records[0];
    EXPECT_EQ(record.Family, 23U);
    EXPECT_STREQ(record.Stepping, "201");
    EXPECT_EQ(record.Vendor, OrvaneProcessor::AMD);
    EXPECT_EQ(record.BrandID, 0x03);
    EXPECT_EQ(record.VTSupported, 1);
    EXPECT_EQ(record.VTEnabled, 1);
    EXPECT_EQ(record.XDSupported, 1);
    EXPECT_EQ(record.XDEnabled, 1);
    EXPECT_EQ(record.LMSupported, 1);
    EXPECT_EQ(record.LMEnabled, 1);
}

TEST_F(CollectionTest, IntelWithLeafOneEcxBitThirtyOneButNotBitFiveIsVirtualisationCapable) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].cpuid = intelLeaves(0, 0x80000000, 0);
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].Vendor, OrvaneProcessor::INTEL);
    EXPECT_EQ(collected.records[0].VTSupported, 1);
    EXPECT_EQ(collected.records[0].VTEnabled, 1);
    EXPECT_EQ(collected.records[0].XDSupported, 0);
    EXPECT_EQ(collected.records[0].LMSupported, 0);
    EXPECT_EQ(collected.records[0].BrandID, 0);
}

TEST_F(CollectionTest, IntelWithOnlyLowEcxBitsIsNotVirtualisationCapable) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].cpuid = intelLeaves(0, 0x0000001F, 0);
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].VTSupported, 0);
}

TEST_F(CollectionTest, OtherVendorGetsNoBrandAndNoFeatureFlags) {
    CpuHost host = uniformHost(1, 1);
    host.cpus[0].cpuid = vendorLeaves(0x746E6543, 0x48727561, 0x736C7561);
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 1U);
    const CpuDetails& record = collected.records[0];
    EXPECT_EQ(record.Vendor, OrvaneProcessor::OTHER);
    EXPECT_EQ(record.BrandID, 0);
    EXPECT_EQ(record.VTSupported + record.VTEnabled + record.XDSupported + record.XDEnabled + record.LMSupported +
                  record.LMEnabled,
              0);
}

TEST_F(CollectionTest, PackageWithNoCoresIsIdleWithoutAnySchedulerRead) {
    CpuHost host = uniformHost(1, 1);
    (*host.packages)[0].cores = 0;
    host.faults = Json::array({fault("KSI_Get", kStatsNode), fault("KSI_Get", kLoadNode)});
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 0U);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
}

TEST_F(CollectionTest, HaltedCoreWithActiveLoadMakesThePackageEnabled) {
    CpuHost host = uniformHost(1, 3);
    host.cpus[1].halted = true;
    host.cpus[1].activeLoad = 5;
    // The walk stops at the busy core: the third is never read.
    host.faults = Json::array({fault("KSI_Get", kStatsNode, "102")});
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 0U);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_ENABLED));
}

TEST_F(CollectionTest, LoadIsReadOnlyForHaltedCores) {
    CpuHost host = uniformHost(1, 2);
    host.cpus[0].activeLoad = 9;  // running, not halted: its load is not looked at
    host.faults = Json::array({fault("KSI_Get", kLoadNode)});
    const Collected collected = collect(host);
    EXPECT_EQ(collected.result, 0U);
    ASSERT_EQ(collected.records.size(), 1U);
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
}

TEST_F(CollectionTest, HaltedCoresWithoutLoadLeaveThePackageIdle) {
    const Collected collected = collect(faultTargetHost());
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
    EXPECT_EQ(collected.records[1].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
}

TEST_F(CollectionTest, APackagesCpusStartAtTheSumOfThePreviousCoreCounts) {
    // Two packages of two cores, but two logical CPUs per core in the CPU
    // list: the second package's first CPU is still taken at position 2.
    CpuHost host = uniformHost(2, 4);
    (*host.packages)[0].cores = 2;
    (*host.packages)[1].cores = 2;
    for (size_t i = 0; i < host.cpus.size(); ++i) {
        host.cpus[i].stepping = static_cast<uint8_t>(i);
    }
    host.cpus[3].halted = true;
    host.cpus[3].activeLoad = 1;  // position 3: the second package's second core
    const Collected collected = collect(host);
    ASSERT_EQ(collected.records.size(), 2U);
    EXPECT_STREQ(collected.records[0].Stepping, "0");
    EXPECT_STREQ(collected.records[1].Stepping, "2");
    EXPECT_EQ(collected.records[0].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_IDLE));
    EXPECT_EQ(collected.records[1].CPUStatus, static_cast<uint32_t>(OrvaneProcessor::CPU_ENABLED));
}

TEST_F(CollectionTest, FewerCpusThanCoresFailsTheCollection) {
    CpuHost host = uniformHost(2, 2);
    host.cpus.pop_back();
    EXPECT_EQ(collect(host).result, 1U);
}

}  // namespace
}  // namespace processortest
