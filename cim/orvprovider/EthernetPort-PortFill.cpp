// The non-key properties of an "Orvane_EthernetPort" instance, read from one
// physical NIC.
#include <cstdint>

#include "EthernetPort-Fill.h"
#include "EthernetPort-Provider.h"
#include "EthernetPort-Request.h"

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

// Lower-case or upper-case hexadecimal digits of value, digits of them,
// written at out.
void putHex(char* out, unsigned value, int digits, const char* alphabet) {
    for (int i = digits - 1; i >= 0; --i) {
        out[i] = alphabet[value & 0xFu];
        value >>= 4;
    }
}

constexpr const char* kLowerDigits = "0123456789abcdef";
constexpr const char* kUpperDigits = "0123456789ABCDEF";

// Twelve upper-case hexadecimal digits, no separators.
struct MacText {
    char text[13];
    explicit MacText(const MacAddress& mac) {
        unsigned char bytes[6];
        mac.GetBinaryAddress(bytes);
        for (int i = 0; i < 6; ++i) {
            putHex(text + 2 * i, bytes[i], 2, kUpperDigits);
        }
        text[12] = '\0';
    }
};

// "0x" and digits lower-case hexadecimal digits: two for bus, slot and
// function, four for vendor, device and segment (each value fits).
struct HexText {
    char text[7];
    HexText(unsigned value, int digits) {
        text[0] = '0';
        text[1] = 'x';
        putHex(text + 2, value, digits, kLowerDigits);
        text[2 + digits] = '\0';
    }
};

// The state is decided by IsEnabled first; the link is asked only when enabled.
CMPIUint16 enabledState(Pnic* pnic) {
    if (!pnic->IsEnabled()) {
        return kDisabled;
    }
    return pnic->IsLinkUp() ? kEnabled : kEnabledButOffline;
}

CMPIUint16 capability(bool wakeOnLan) { return wakeOnLan ? kCapabilityWakeOnLan : kCapabilityNone; }

// A uint16 array of the values the caller appended to the memo's key;
// shared by the ports of the request that have the same values.
CmpiArray uint16Array(ArrayMemo& memo) {
    return memo.find([&memo] {
        return convertedArray(memo.currentKey(), CMPI_uint16,
                              [](std::int64_t v) { return CmpiData(static_cast<CMPIUint16>(v)); });
    });
}

// A uint16 array of items, each converted by convert.
template <typename Item, typename Convert>
CmpiArray uint16Array(ArrayMemo& memo, const std::vector<Item>& items, Convert convert) {
    std::vector<std::int64_t>& key = memo.key(ArrayTag::Uint16Values);
    for (const Item& item : items) {
        key.push_back(convert(item));
    }
    return uint16Array(memo);
}

CmpiArray oneUint16(ArrayMemo& memo, CMPIUint16 value) {
    memo.key(ArrayTag::Uint16Values).push_back(value);
    return uint16Array(memo);
}

// A string array of texts; each text is built into the array only.
template <std::size_t N>
CmpiArray textArray(const char* const (&texts)[N]) {
    CmpiArray array(static_cast<CMPICount>(N), CMPI_string);
    for (std::size_t i = 0; i < N; ++i) {
        array[static_cast<int>(i)] = CmpiData(CmpiString(texts[i]));
    }
    return array;
}

void setMacAddress(CmpiInstance& instance, Pnic* pnic) {
    const MacText mac(pnic->GetMacAddress());
    instance.setProperty("PermanentAddress", CmpiData(mac.text));
    const char* const addresses[] = {mac.text};
    instance.setProperty("NetworkAddresses", CmpiData(textArray(addresses)));
}

void setState(CmpiInstance& instance, Pnic* pnic, ArrayMemo& memo) {
    instance.setProperty("RequestedState", CmpiData(kRequestedStateNoChange));
    const CMPIUint16 state = enabledState(pnic);
    instance.setProperty("EnabledState", CmpiData(state));
    instance.setProperty("OperationalStatus",
                         CmpiData(oneUint16(memo, state == kEnabled ? kStatusOK : kStatusStopped)));
}

// Both arrays are made before either is set: supported is asked first.
void setCapabilities(CmpiInstance& instance, Pnic* pnic, ArrayMemo& memo) {
    const CmpiArray supported = oneUint16(memo, capability(pnic->GetWakeOnLANSupported()));
    const CmpiArray enabled = oneUint16(memo, capability(pnic->GetWakeOnLANEnabled()));
    instance.setProperty("Capabilities", CmpiData(supported));
    instance.setProperty("EnabledCapabilities", CmpiData(enabled));
}

CmpiArray identifyingDescriptions(ArrayMemo& memo) {
    static const char* const kDescriptions[] = {"PCI Bus",    "PCI Slot",     "PCI Function",
                                                "PCI Vendor", "PCI DeviceID", "PCI Segment"};
    memo.key(ArrayTag::Texts);
    return memo.find([] { return textArray(kDescriptions); });
}

// OtherIdentifyingInfo and IdentifyingDescriptions, only for a NIC with a PCI
// device; read in the order bus, slot, function, vendor, device, segment.
void setPciIdentity(CmpiInstance& instance, Pnic* pnic, ArrayMemo& memo) {
    const PciDevice* pci = pnic->GetPciDevice();
    if (pci == nullptr) {
        return;
    }
    const HexText bus(pci->GetBus(), 2);
    const HexText slot(pci->GetSlot(), 2);
    const HexText function(pci->GetFunction(), 2);
    const HexText vendor(pci->GetVendorId(), 4);
    const HexText device(pci->GetDeviceId(), 4);
    const HexText segment(pci->GetSegment(), 4);
    const char* const values[] = {bus.text, slot.text, function.text, vendor.text, device.text, segment.text};
    instance.setProperty("OtherIdentifyingInfo", CmpiData(textArray(values)));
    instance.setProperty("IdentifyingDescriptions", CmpiData(identifyingDescriptions(memo)));
}

CmpiArray linkModeArray(ArrayMemo& memo, const std::vector<LinkMode>& modes) {
    std::vector<std::int64_t>& key = memo.key(ArrayTag::LinkModes);
    for (const LinkMode& mode : modes) {
        key.push_back(mode.first);
        key.push_back(mode.second);
    }
    return memo.find([&] {
        return convertedArray(modes, CMPI_string, [](const LinkMode& mode) {
            return CmpiData(CmpiString(EthernetPortProvider::convertLinkMode(mode).c_str()));
        });
    });
}

CmpiArray wakeOnArray(ArrayMemo& memo, const std::vector<WakeOnMode>& modes) {
    return uint16Array(memo, modes, [](WakeOnMode mode) {
        return static_cast<CMPIUint16>(EthernetPortProvider::convertWOLOption(mode));
    });
}

void setInfoProperties(CmpiInstance& instance, const PnicInfo& info, ArrayMemo& memo) {
    instance.setProperty("SupportedPorts", CmpiData(uint16Array(memo, info.supportedPorts, [](PnicPortMode p) {
                             return static_cast<CMPIUint16>(EthernetPortProvider::convertPortMode(p));
                         })));
    instance.setProperty("SupportedLinkModes", CmpiData(linkModeArray(memo, info.supportedLinkModes)));
    instance.setProperty("AdvertisedLinkModes", CmpiData(linkModeArray(memo, info.advertisedLinkModes)));
    instance.setProperty("AdvertisedAutoNegotiation", CmpiData(info.advertisedAutoNegotiation));
    instance.setProperty("PhysicalAddress", CmpiData(static_cast<CMPIUint32>(info.PHYAD)));
    instance.setProperty("Transceiver",
                         CmpiData(static_cast<CMPIUint16>(EthernetPortProvider::convertTransceiver(info.transceiver))));
    instance.setProperty("WOLSupported", CmpiData(wakeOnArray(memo, info.supportsWakeOn)));
    instance.setProperty("WOLOptions", CmpiData(wakeOnArray(memo, info.wakeOn)));
}

}  // namespace

void EthernetPortProvider::fillEPInstance(CmpiInstance& instance, Pnic* pnic, PortRequest& request) {
    guardFill([&] {
        ArrayMemo& memo = request.arrays();
        PnicInfo& info = request.freshInfo();
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
        setState(instance, pnic, memo);
        setCapabilities(instance, pnic, memo);
        instance.setProperty("FullDuplex", CmpiData(pnic->GetDuplex() == DUPLEX_MODE_FULL));
        instance.setProperty("ActiveMaximumTransmissionUnit", CmpiData(static_cast<CMPIUint64>(pnic->GetMTU())));
        setPciIdentity(instance, pnic, memo);
        setInfoProperties(instance, info, memo);
    });
}

}  // namespace EthernetProvider
