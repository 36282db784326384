// The PCI address of a device ("ssss:bb:dd.f" as sysfs and ethtool bus-info write it).
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace orv::linuxhost {

struct PciAddress {
    std::uint16_t segment = 0;
    std::uint8_t bus = 0;
    std::uint8_t slot = 0;
    std::uint8_t function = 0;
};

// Accepts exactly four, two, two and one hexadecimal digits: "0000:00:03.0".
// Slot is at most 0x1f and function at most 7; anything else is not a PCI address.
std::optional<PciAddress> parsePciAddress(std::string_view text);

}  // namespace orv::linuxhost
