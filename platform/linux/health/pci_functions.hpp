// PCI functions of one base class (<sys>/bus/pci/devices) with the error
// counts that PCI Express Advanced Error Reporting keeps for them
// (aer_dev_correctable, aer_dev_nonfatal, aer_dev_fatal).
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::linuxhost::health {

inline constexpr std::uint8_t kPciMassStorage = 0x01;
inline constexpr std::uint8_t kPciNetwork = 0x02;

struct PciFunctionHealth {
    std::string address;  // "0000:03:00.0"
    std::uint32_t classCode = 0;  // 24 bits: base class, subclass, interface
    std::uint16_t vendorId = 0, deviceId = 0;
    std::optional<std::string> driver;  // name of the bound driver
    std::optional<std::uint64_t> correctable, nonFatal, fatal;  // nothing without AER
};

// The functions whose base class is baseClass, in address order.
std::vector<PciFunctionHealth> readPciFunctions(const std::string& sysRoot, std::uint8_t baseClass);

// The total of an aer_dev_* file: the line named totalName ("TOTAL_ERR_COR"),
// else the sum of every "<error name> <count>" line; nothing when no line has a count.
std::optional<std::uint64_t> aerTotal(std::string_view text, std::string_view totalName);

// Fatal errors: 25; non-fatal: 20; correctable: 10; counters all zero: 5;
// no AER counters: nothing.
std::optional<std::uint16_t> pciFunctionHealth(const PciFunctionHealth& function);

}  // namespace orv::linuxhost::health
