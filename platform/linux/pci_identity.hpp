// The PCI function behind a NIC, found by the bus address its driver reports
// (ethtool driver info `bus_info`, "0000:00:03.0"): PCI functions are not
// network-namespaced, so this names the device of the interface the ethtool
// socket sees, whatever namespace sysfs's net class shows.
#pragma once

#include "pci_address.hpp"

#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <string>

namespace orv::linuxhost {

struct PciDeviceInfo {
    PciAddress address;
    std::uint16_t vendorId = 0;
    std::uint16_t deviceId = 0;
};

// <sysRoot>/bus/pci/devices/<busInfo>/vendor and device. Nothing when busInfo
// is not a PCI address (a USB NIC answers "usb-0000:00:14.0-1", a virtual
// device nothing) or the function's files cannot be read.
std::optional<PciDeviceInfo> readPciIdentity(const std::string& sysRoot, const std::string& busInfo);

// The identities read for the NICs of one listing, one reading per bus address
// (the ports of a multi-port function share it). Safe for concurrent use.
class PciIdentities {
public:
    explicit PciIdentities(std::string sysRoot) : sysRoot_(std::move(sysRoot)) {}
    std::optional<PciDeviceInfo> of(const std::string& busInfo);

private:
    std::string sysRoot_;
    std::mutex mutex_;
    std::map<std::string, std::optional<PciDeviceInfo>> read_;
};

}  // namespace orv::linuxhost
