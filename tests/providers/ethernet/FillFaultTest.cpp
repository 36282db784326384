// A NIC call that fails while one instance is being filled: the instance is
// delivered with what was set before the failure, the request succeeds, and
// nothing is logged.
#include "EthernetFixture.h"

#include "orv/testsupport/SyslogCapture.h"

namespace ethernet {
namespace {

using orv::providertest::propertyNamesOf;

struct FaultCase {
    const char* className;
    const char* call;
    std::vector<std::string> properties;  // what the instance keeps, in order
};

std::ostream& operator<<(std::ostream& os, const FaultCase& c) { return os << c.className << "/" << c.call; }

const std::vector<std::string> kPortKeys = {"DeviceID", "SystemCreationClassName", "SystemName", "CreationClassName"};

std::vector<std::string> portUpTo(const std::vector<std::string>& more) {
    std::vector<std::string> names = kPortKeys;
    names.insert(names.end(), more.begin(), more.end());
    return names;
}

const std::vector<std::string> kFirstFive = {"Name", "ElementName", "PortType", "AutoSense", "Caption"};

std::vector<std::string> plus(std::vector<std::string> a, const std::vector<std::string>& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

std::vector<FaultCase> cases() {
    const std::vector<std::string> throughMac = plus(kFirstFive, {"Speed", "LinkTechnology", "PermanentAddress",
                                                                  "NetworkAddresses", "RequestedState"});
    const std::vector<std::string> throughState = plus(throughMac, {"EnabledState", "OperationalStatus"});
    const std::vector<std::string> throughMtu =
        plus(throughState, {"Capabilities", "EnabledCapabilities", "FullDuplex", "ActiveMaximumTransmissionUnit"});
    std::vector<FaultCase> out = {
        {kPort, "GetPnicInfo", portUpTo({})},
        {kPort, "GetName", portUpTo({})},
        {kPort, "GetLinkSpeed", portUpTo(kFirstFive)},
        {kPort, "GetMacAddress", portUpTo(plus(kFirstFive, {"Speed", "LinkTechnology"}))},
        {kPort, "IsEnabled", portUpTo(throughMac)},
        {kPort, "IsLinkUp", portUpTo(throughMac)},
        {kPort, "GetWakeOnLANSupported", portUpTo(throughState)},
        {kPort, "GetWakeOnLANEnabled", portUpTo(throughState)},
        {kPort, "GetDuplex", portUpTo(plus(throughState, {"Capabilities", "EnabledCapabilities"}))},
        {kPort, "GetMTU", portUpTo(plus(throughState, {"Capabilities", "EnabledCapabilities", "FullDuplex"}))},
        {kPort, "GetPciDevice", portUpTo(throughMtu)},
    };
    for (const char* pci : {"GetBus", "GetSlot", "GetFunction", "GetVendorId", "GetDeviceId", "GetSegment"}) {
        out.push_back({kPort, pci, portUpTo(throughMtu)});
    }
    const std::vector<std::string> id = {"InstanceID"};
    out.push_back({"Orvane_EPDriverSoftwareIdentity", "GetPnicDriverInfo", id});
    out.push_back({"Orvane_EPFirmwareSoftwareIdentity", "GetPnicDriverInfo", id});
    out.push_back({"Orvane_EPStatisticalInformation", "GetPnicStats", id});
    out.push_back({"Orvane_EPCoalesceSettingData", "GetPnicCoalesceInfo", id});
    out.push_back({"Orvane_EPPauseParamsSettingData", "GetPnicPauseInfo", id});
    out.push_back({"Orvane_EPRingCurrentSettingData", "GetPnicRingInfo", id});
    out.push_back({"Orvane_EPRingPresetSettingData", "GetPnicRingInfo", id});
    return out;
}

class FillFaultTest : public EthernetTest, public ::testing::WithParamInterface<FaultCase> {};

// The port's own name is asked before the fill (for its path), so a GetName
// fault is injected on the second call; the setting-data and statistics
// fills ask for the name after their record, so the same holds there.
unsigned nthOf(const FaultCase& c) { return std::string(c.call) == "GetName" ? 2 : 0; }

TEST_P(FillFaultTest, DeliversThePartialInstanceWithoutStatusOrLog) {
    const FaultCase& c = GetParam();
    serve(hostWith({nic("vmnic0")}, Json::array({fault(c.call, "vmnic0", nthOf(c))})));
    orv::testsupport::SyslogCapture syslog;
    Reply reply = provider().enumerateInstances(c.className);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(reply.message(), "");
    EXPECT_EQ(reply.doneCount(), 1u);
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]), c.properties);
    EXPECT_TRUE(syslog.lines().empty());
}

INSTANTIATE_TEST_SUITE_P(EachCallOfEachFill, FillFaultTest, ::testing::ValuesIn(cases()));

// The fills that ask for the NIC name after their record keep only the key
// when that name cannot be read.
class NameFaultTest : public EthernetTest, public ::testing::WithParamInterface<const char*> {};

TEST_P(NameFaultTest, AfterTheRecordKeepsOnlyTheKey) {
    serve(hostWith({nic("vmnic0")}, Json::array({fault("GetName", "vmnic0", 2)})));
    Reply reply = provider().enumerateInstances(GetParam());
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]), std::vector<std::string>{"InstanceID"});
}

INSTANTIATE_TEST_SUITE_P(StatisticsAndSettings, NameFaultTest,
                         ::testing::Values("Orvane_EPStatisticalInformation", "Orvane_EPCoalesceSettingData",
                                           "Orvane_EPPauseParamsSettingData", "Orvane_EPRingCurrentSettingData",
                                           "Orvane_EPRingPresetSettingData"));

TEST_F(EthernetTest, StatisticsQueryFailureLeavesTheKeysOnly) {
    serve(hostWith({nic("vmnic0"), nic("vmnic1")}, Json::array({fault("GetPnicStats", "vmnic1")})));
    Reply reply = provider().enumerateInstances("Orvane_EPStatisticalInformation");
    ASSERT_EQ(reply.instances().size(), 2u);
    EXPECT_EQ(propertyNamesOf(reply.instances()[0]).size(), 24u);
    EXPECT_EQ(propertyNamesOf(reply.instances()[1]), std::vector<std::string>{"InstanceID"});
}

}  // namespace
}  // namespace ethernet
