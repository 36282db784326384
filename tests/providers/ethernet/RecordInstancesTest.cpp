// A NIC's driver and firmware identities, statistics, coalescing, pause and
// ring settings: every property, in order, with its CIM type.
#include "EthernetFixture.h"

namespace ethernet {
namespace {

using orv::providertest::propertiesOf;

class RecordInstancesTest : public EthernetTest {
protected:
    std::vector<NamedValue> onlyInstanceOf(const std::string& className, const Json& nicJson = nic("vmnic0")) {
        serve(hostWith({nicJson}));
        reply_ = provider().enumerateInstances(className);
        EXPECT_EQ(reply_.rc(), CMPI_RC_OK) << reply_.message();
        EXPECT_EQ(reply_.instances().size(), 1u);
        const CMPIInstance* instance = instanceAt(reply_, 0);
        return instance == nullptr ? std::vector<NamedValue>{} : propertiesOf(instance);
    }

    static NamedValue idOf(const std::string& className) {
        return {"InstanceID", CMPI_string, instanceId(className, "vmnic0")};
    }

    Reply reply_;
};

TEST_F(RecordInstancesTest, DriverIdentityRepeatsTheElementNameAheadOfTheVersion) {
    const char* cls = "Orvane_EPDriverSoftwareIdentity";
    EXPECT_EQ(onlyInstanceOf(cls), (std::vector<NamedValue>{idOf(cls),
                                                             {"ElementName", CMPI_string, "e1000e driver "},
                                                             {"VersionString", CMPI_string, "e1000e driver 3.2"}}));
}

TEST_F(RecordInstancesTest, FirmwareIdentityIsNamedAfterTheDriver) {
    const char* cls = "Orvane_EPFirmwareSoftwareIdentity";
    EXPECT_EQ(onlyInstanceOf(cls),
              (std::vector<NamedValue>{idOf(cls),
                                       {"ElementName", CMPI_string, "e1000e device firmware "},
                                       {"VersionString", CMPI_string, "e1000e device firmware 0x800005b6"}}));
}

TEST_F(RecordInstancesTest, StatisticsPublishNineteenCountersWhole) {
    const char* cls = "Orvane_EPStatisticalInformation";
    std::vector<NamedValue> expected = {idOf(cls),
                                        {"Name", CMPI_string, "vmnic0"},
                                        {"ElementName", CMPI_string, "vmnic0"},
                                        {"Caption", CMPI_string, "vmnic0"},
                                        {"Description", CMPI_string, "vmnic0 statistics"}};
    const Json stats = nic("vmnic0")["stats"];
    for (const char* name : {"packetsTx", "packetsRx", "bytesTx", "bytesRx", "errorsTx", "errorsRx", "droppedTx",
                             "droppedRx", "RxLengthErrors", "RxOverErrors", "RxCRCErrors", "RxFrameErrors",
                             "RxFIFOErrors", "RxMissedErrors", "TxAbortedErrors", "TxFIFOErrors", "TxCarrierErrors",
                             "TxHeartbeatErrors", "TxWindowErrors"}) {
        expected.push_back({name, CMPI_uint64, std::to_string(stats[name].get<std::uint64_t>())});
    }
    EXPECT_EQ(onlyInstanceOf(cls), expected);
}

TEST_F(RecordInstancesTest, CountersAbove32BitsArePublishedWhole) {
    Json big = nic("vmnic0");
    big["stats"]["packetsTx"] = 18446744073709551615ULL;
    onlyInstanceOf("Orvane_EPStatisticalInformation", big);
    EXPECT_EQ(orv::providertest::propertyOf(instanceAt(reply_, 0), "packetsTx")->text, "18446744073709551615");
    EXPECT_EQ(orv::providertest::propertyOf(instanceAt(reply_, 0), "bytesRx")->text, "5000000000");
}

TEST_F(RecordInstancesTest, CoalesceSettingsAreTwoFlagsAndTwentyValues) {
    const char* cls = "Orvane_EPCoalesceSettingData";
    std::vector<NamedValue> expected = {idOf(cls),
                                        {"ElementName", CMPI_string, "vmnic0"},
                                        {"adaptiveRX", CMPI_boolean, "true"},
                                        {"adaptiveTX", CMPI_boolean, "false"}};
    const Json coalesce = nic("vmnic0")["coalesce"];
    for (const auto& [name, value] : coalesce.items()) {
        if (value.is_number()) {
            expected.push_back({name, CMPI_uint32, std::to_string(value.get<std::uint32_t>())});
        }
    }
    ASSERT_EQ(expected.size(), 24u);
    EXPECT_EQ(onlyInstanceOf(cls), expected);
}

TEST_F(RecordInstancesTest, PauseSettingsPublishTheNegotiationResultsAsNumbers) {
    const char* cls = "Orvane_EPPauseParamsSettingData";
    EXPECT_EQ(onlyInstanceOf(cls), (std::vector<NamedValue>{idOf(cls),
                                                            {"ElementName", CMPI_string, "vmnic0"},
                                                            {"supported", CMPI_boolean, "true"},
                                                            {"autoNegotiate", CMPI_boolean, "false"},
                                                            {"rxStatus", CMPI_boolean, "true"},
                                                            {"txStatus", CMPI_boolean, "false"},
                                                            {"rxAutoNegRes", CMPI_uint32, "1"},
                                                            {"txAutoNegRes", CMPI_uint32, "2"}}));
}

TEST_F(RecordInstancesTest, CurrentRingSizesComeFromTheSecondRecord) {
    const char* cls = "Orvane_EPRingCurrentSettingData";
    EXPECT_EQ(onlyInstanceOf(cls), (std::vector<NamedValue>{idOf(cls),
                                                            {"ElementName", CMPI_string, "vmnic0"},
                                                            {"changed", CMPI_uint8, "1"},
                                                            {"rx", CMPI_uint32, "512"},
                                                            {"rxMini", CMPI_uint32, "0"},
                                                            {"rxJumbo", CMPI_uint32, "64"},
                                                            {"tx", CMPI_uint32, "1024"}}));
}

TEST_F(RecordInstancesTest, PresetRingSizesComeFromTheFirstRecord) {
    const char* cls = "Orvane_EPRingPresetSettingData";
    EXPECT_EQ(onlyInstanceOf(cls), (std::vector<NamedValue>{idOf(cls),
                                                            {"ElementName", CMPI_string, "vmnic0"},
                                                            {"changed", CMPI_uint8, "0"},
                                                            {"rx", CMPI_uint32, "4096"},
                                                            {"rxMini", CMPI_uint32, "32"},
                                                            {"rxJumbo", CMPI_uint32, "256"},
                                                            {"tx", CMPI_uint32, "4096"}}));
}

}  // namespace
}  // namespace ethernet
