// The PCI function behind a physical NIC. Owned by the pnic that hands it
// out; valid as long as that pnic lives.
#pragma once

#include <cstdint>

namespace NodeMgr {
namespace Network {

class PciDevice {
public:
    virtual ~PciDevice() = default;
    virtual uint16_t GetSegment() const = 0;
    virtual uint8_t GetBus() const = 0;
    virtual uint8_t GetSlot() const = 0;
    virtual uint8_t GetFunction() const = 0;
    virtual uint16_t GetVendorId() const = 0;
    virtual uint16_t GetDeviceId() const = 0;

protected:
    PciDevice() = default;
    PciDevice(const PciDevice&) = default;
    PciDevice& operator=(const PciDevice&) = default;
};

} // namespace Network
} // namespace NodeMgr
