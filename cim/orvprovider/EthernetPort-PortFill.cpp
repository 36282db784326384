// The non-key properties of an "Orvane_EthernetPort" instance, read from one
// physical NIC.
#include <cstdio>

#include "EthernetPort-Fill.h"
#include "EthernetPort-Provider.h"

namespace EthernetProvider {

using namespace NodeMgr::Network;

namespace {

constexpr CMPIUint16 kLinkTechnologyEthernet = 2;
constexpr CMPIUint16 kRequestedStateNoChange = 5;
constexpr CMPIUint16 kEnabled = 2;
constexpr CMPIUint16 kDisabled = 3;
constexpr CMPIUint16 kEnabledButOffline = 6;
constexpr CMPIUint16 kStatusOK = 2;
constexpr CMPIUint16 kStatusStopped = 10;
constexpr CMPIUint16 kCapabilityWakeOnLan = 5;
constexpr CMPIUint16 kCapabilityNone = 0;
constexpr CMPIUint64 kBitsPerMegabit = 1000000;

// Twelve upper-case hexadecimal digits, no separators.
std::string macText(const MacAddress& mac) {
    unsigned char bytes[6];
    mac.GetBinaryAddress(bytes);
    char text[13];
    std::snprintf(text, sizeof text, "%02X%02X%02X%02X%02X%02X", bytes[0], bytes[1], bytes[2], bytes[3], bytes[4],
                  bytes[5]);
    return text;
}

// Lower-case hexadecimal behind 0x: two digits for bus, slot and function
// (printed into 33 bytes), four for the rest (vendor and device into exactly
// 7 bytes, the segment into 33).
std::string hex2(unsigned value) {
    char text[33];
    std::snprintf(text, sizeof text, "0x%02x", value);
    return text;
}

template <std::size_t Size>
std::string hex4(unsigned value) {
    char text[Size];
    std::snprintf(text, sizeof text, "0x%04x", value);
    return text;
}

// The state is decided by IsEnabled first; the link is asked only when enabled.
CMPIUint16 enabledState(Pnic* pnic) {
    if (!pnic->IsEnabled()) {
        return kDisabled;
    }
    return pnic->IsLinkUp() ? kEnabled : kEnabledButOffline;
}

CMPIUint16 capability(bool wakeOnLan) { return wakeOnLan ? kCapabilityWakeOnLan : kCapabilityNone; }

void setMacAddress(CmpiInstance& instance, Pnic* pnic) {
    const std::string mac = macText(pnic->GetMacAddress());
    instance.setProperty("PermanentAddress", CmpiData(mac.c_str()));
    instance.setProperty("NetworkAddresses", CmpiData(stringArray({mac})));
}

void setState(CmpiInstance& instance, Pnic* pnic) {
    instance.setProperty("RequestedState", CmpiData(kRequestedStateNoChange));
    const CMPIUint16 state = enabledState(pnic);
    instance.setProperty("EnabledState", CmpiData(state));
    instance.setProperty("OperationalStatus", CmpiData(singleUint16(state == kEnabled ? kStatusOK : kStatusStopped)));
}

// Both arrays are built before either is set: supported is asked first.
void setCapabilities(CmpiInstance& instance, Pnic* pnic) {
    const CmpiArray supported = singleUint16(capability(pnic->GetWakeOnLANSupported()));
    const CmpiArray enabled = singleUint16(capability(pnic->GetWakeOnLANEnabled()));
    instance.setProperty("Capabilities", CmpiData(supported));
    instance.setProperty("EnabledCapabilities", CmpiData(enabled));
}

// OtherIdentifyingInfo and IdentifyingDescriptions, only for a NIC with a PCI
// device; read in the order bus, slot, function, vendor, device, segment.
void setPciIdentity(CmpiInstance& instance, Pnic* pnic) {
    const PciDevice* pci = pnic->GetPciDevice();
    if (pci == nullptr) {
        return;
    }
    std::vector<std::string> values;
    values.push_back(hex2(pci->GetBus()));
    values.push_back(hex2(pci->GetSlot()));
    values.push_back(hex2(pci->GetFunction()));
    values.push_back(hex4<7>(pci->GetVendorId()));
    values.push_back(hex4<7>(pci->GetDeviceId()));
    values.push_back(hex4<33>(pci->GetSegment()));
    instance.setProperty("OtherIdentifyingInfo", CmpiData(stringArray(values)));
    instance.setProperty("IdentifyingDescriptions",
                         CmpiData(stringArray({"PCI Bus", "PCI Slot", "PCI Function", "PCI Vendor", "PCI DeviceID",
                                               "PCI Segment"})));
}

CmpiArray linkModeArray(const std::vector<LinkMode>& modes) {
    return convertedArray(modes, CMPI_string, [](const LinkMode& mode) {
        return CmpiData(CmpiString(EthernetPortProvider::convertLinkMode(mode).c_str()));
    });
}

CmpiArray wakeOnArray(const std::vector<WakeOnMode>& modes) {
    return convertedArray(modes, CMPI_uint16, [](WakeOnMode mode) {
        return CmpiData(static_cast<CMPIUint16>(EthernetPortProvider::convertWOLOption(mode)));
    });
}

void setInfoProperties(CmpiInstance& instance, const PnicInfo& info) {
    instance.setProperty("SupportedPorts", CmpiData(convertedArray(info.supportedPorts, CMPI_uint16, [](PnicPortMode p) {
                             return CmpiData(static_cast<CMPIUint16>(EthernetPortProvider::convertPortMode(p)));
                         })));
    instance.setProperty("SupportedLinkModes", CmpiData(linkModeArray(info.supportedLinkModes)));
    instance.setProperty("AdvertisedLinkModes", CmpiData(linkModeArray(info.advertisedLinkModes)));
    instance.setProperty("AdvertisedAutoNegotiation", CmpiData(info.advertisedAutoNegotiation));
    instance.setProperty("PhysicalAddress", CmpiData(static_cast<CMPIUint32>(info.PHYAD)));
    instance.setProperty("Transceiver",
                         CmpiData(static_cast<CMPIUint16>(EthernetPortProvider::convertTransceiver(info.transceiver))));
    instance.setProperty("WOLSupported", CmpiData(wakeOnArray(info.supportsWakeOn)));
    instance.setProperty("WOLOptions", CmpiData(wakeOnArray(info.wakeOn)));
}

}  // namespace

void EthernetPortProvider::fillEPInstance(CmpiInstance& instance, Pnic* pnic) {
    guardFill([&] {
        PnicInfo info;
        pnic->GetPnicInfo(info);
        const std::string name = pnic->GetName();
        instance.setProperty("Name", CmpiData(name.c_str()));
        instance.setProperty("ElementName", CmpiData(name.c_str()));
        instance.setProperty("PortType", CmpiData(getPortType(info.port, info.speed)));
        // An integer on purpose, though the parent class has a boolean.
        instance.setProperty("AutoSense", CmpiData(static_cast<CMPIUint16>(info.supportsAutoNegotiation ? 1 : 0)));
        instance.setProperty("Caption", CmpiData(name.c_str()));
        instance.setProperty("Speed", CmpiData(static_cast<CMPIUint64>(pnic->GetLinkSpeed()) * kBitsPerMegabit));
        instance.setProperty("LinkTechnology", CmpiData(kLinkTechnologyEthernet));
        setMacAddress(instance, pnic);
        setState(instance, pnic);
        setCapabilities(instance, pnic);
        instance.setProperty("FullDuplex", CmpiData(pnic->GetDuplex() == DUPLEX_MODE_FULL));
        instance.setProperty("ActiveMaximumTransmissionUnit", CmpiData(static_cast<CMPIUint64>(pnic->GetMTU())));
        setPciIdentity(instance, pnic);
        setInfoProperties(instance, info);
    });
}

}  // namespace EthernetProvider
