// Network devices as sysfs shows them under <root>/class/net: which of them sit on
// a bus (the physical NICs), their PCI device, and their link attributes.
#pragma once

#include "pci_address.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost {

struct PciDeviceInfo {
    PciAddress address;
    std::uint16_t vendorId = 0;
    std::uint16_t deviceId = 0;
};

struct SysfsLinkAttributes {
    int ifindex = 0;
    std::uint32_t flags = 0;          // IFF_* of the interface
    std::string operstate;            // "up", "down", "unknown", ...
    std::optional<bool> carrier;      // unreadable while the interface is down
    std::uint32_t mtu = 0;
    std::string address;              // current MAC, "aa:bb:cc:dd:ee:ff"
    std::optional<std::int64_t> speed;  // Mb/s; -1 when the driver does not know
    std::string duplex;               // "full", "half", "unknown" or empty
};

class SysfsNet {
public:
    explicit SysfsNet(std::string sysRoot = "/sys");

    // Every network device, in interface-index order.
    std::vector<std::string> allDevices() const;
    // The devices that have a bus device (a `device` link), in interface-index order.
    std::vector<std::string> busDevices() const;
    bool hasBusDevice(const std::string& name) const;
    // The PCI function that carries the device: its bus device when that is a PCI
    // function, the PCI function above it when it is a virtio device. Nothing for a
    // device on another bus (a USB NIC is not its host controller).
    std::optional<PciDeviceInfo> pciDevice(const std::string& name) const;
    // Throws LinuxCallError when the device is gone.
    SysfsLinkAttributes linkAttributes(const std::string& name) const;
    // One numeric attribute file ("mtu", "flags", ...); throws LinuxCallError.
    std::uint64_t numberAttribute(const std::string& name, const char* file) const;
    // Speed in Mb/s (-1: unknown) and duplex text as the driver reports them,
    // whether or not the link is up; nothing / empty when unreadable.
    std::optional<std::int64_t> speed(const std::string& name) const;
    std::string duplex(const std::string& name) const;
    // Carrier of an interface; nothing while it is administratively down.
    std::optional<bool> carrier(const std::string& name) const;

private:
    std::string netDir(const std::string& name) const;
    std::vector<std::string> devicesWhere(bool busOnly) const;

    std::string root_;
};

}  // namespace orv::linuxhost
