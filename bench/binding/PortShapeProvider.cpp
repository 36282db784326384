// A provider built on the C++ binding whose instances have the shape of an
// Ethernet port instance: the same ~30 properties (texts, integers, booleans,
// arrays of strings and of integers) set from constant values, so that a
// benchmark measures the binding and the broker core without a platform.
// Enumerating Bench_Port returns 64 instances.
#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiProviderBase.h>

#include <cstdio>
#include <initializer_list>

namespace {

constexpr int kInstances = 64;
constexpr const char* kClass = "Bench_Port";

CmpiArray stringArray(std::initializer_list<const char*> texts) {
    CmpiArray array(static_cast<CMPICount>(texts.size()), CMPI_string);
    int i = 0;
    for (const char* text : texts) {
        array[i++] = CmpiData(CmpiString(text));
    }
    return array;
}

CmpiArray uint16Array(std::initializer_list<CMPIUint16> values) {
    CmpiArray array(static_cast<CMPICount>(values.size()), CMPI_uint16);
    int i = 0;
    for (CMPIUint16 value : values) {
        array[i++] = CmpiData(value);
    }
    return array;
}

void fill(CmpiInstance& instance, const char* name) {
    instance.setProperty("SystemCreationClassName", CmpiData("Orvane_ComputerSystem"));
    instance.setProperty("SystemName", CmpiData("host.example.com"));
    instance.setProperty("CreationClassName", CmpiData(kClass));
    instance.setProperty("DeviceID", CmpiData(name));
    instance.setProperty("Name", CmpiData(name));
    instance.setProperty("ElementName", CmpiData(name));
    instance.setProperty("PortType", CmpiData(CMPIUint16(54)));
    instance.setProperty("AutoSense", CmpiData(CMPIUint16(1)));
    instance.setProperty("Caption", CmpiData(name));
    instance.setProperty("Speed", CmpiData(CMPIUint64(10000000000ULL)));
    instance.setProperty("LinkTechnology", CmpiData(CMPIUint16(2)));
    instance.setProperty("PermanentAddress", CmpiData("001122334455"));
    instance.setProperty("NetworkAddresses", CmpiData(stringArray({"001122334455"})));
    instance.setProperty("RequestedState", CmpiData(CMPIUint16(5)));
    instance.setProperty("EnabledState", CmpiData(CMPIUint16(2)));
    instance.setProperty("OperationalStatus", CmpiData(uint16Array({2})));
    instance.setProperty("Capabilities", CmpiData(uint16Array({5})));
    instance.setProperty("EnabledCapabilities", CmpiData(uint16Array({5})));
    instance.setProperty("FullDuplex", CmpiData(true));
    instance.setProperty("ActiveMaximumTransmissionUnit", CmpiData(CMPIUint64(1500)));
    instance.setProperty("OtherIdentifyingInfo",
                         CmpiData(stringArray({"0x03", "0x00", "0x01", "0x8086", "0x10fb", "0x0000"})));
    instance.setProperty("IdentifyingDescriptions",
                         CmpiData(stringArray({"PCI Bus", "PCI Slot", "PCI Function", "PCI Vendor", "PCI DeviceID",
                                               "PCI Segment"})));
    instance.setProperty("SupportedPorts", CmpiData(uint16Array({1, 3})));
    instance.setProperty("SupportedLinkModes",
                         CmpiData(stringArray({"1000baseT/Full", "10000baseT/Full", "100baseT/Full"})));
    instance.setProperty("AdvertisedLinkModes", CmpiData(stringArray({"1000baseT/Full", "10000baseT/Full"})));
    instance.setProperty("AdvertisedAutoNegotiation", CmpiData(true));
    instance.setProperty("PhysicalAddress", CmpiData(CMPIUint32(0)));
    instance.setProperty("Transceiver", CmpiData(CMPIUint16(0)));
    instance.setProperty("WOLSupported", CmpiData(uint16Array({2, 5})));
    instance.setProperty("WOLOptions", CmpiData(uint16Array({5})));
}

class PortShapeProvider : public CmpiInstanceMI {
public:
    PortShapeProvider(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        const CmpiString ns = cop.getNameSpace();
        for (int n = 0; n < kInstances; ++n) {
            char name[16];
            std::snprintf(name, sizeof name, "vmnic%d", n);
            CmpiObjectPath path(ns, kClass);
            path.setKey("DeviceID", CmpiData(name));
            CmpiInstance instance(path);
            instance.setPropertyFilter(properties, nullptr);
            fill(instance, name);
            rslt.returnData(instance);
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
};

}  // namespace

CMProviderBase(BenchPortProvider);
CMInstanceMIFactory(PortShapeProvider, BenchPortProvider)
