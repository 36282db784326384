// Directory walks of sysfs for the health readers: entry names in a stable
// order, where a device sits under <sys>/devices, and the PCI function above it.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

// The names in dir (links included), digits compared as numbers so that
// "hwmon10" follows "hwmon9"; empty when dir cannot be read.
std::vector<std::string> directoryEntries(const std::string& dir);
// The names in dir that begin with prefix, in the same order.
std::vector<std::string> entriesStartingWith(const std::string& dir, const std::string& prefix);

// Where path (a link or directory under sysRoot) leads, relative to
// <sysRoot>/devices: "pci0000:00/0000:00:1f.2/ata1". Nothing when it cannot be
// resolved or leads elsewhere.
std::optional<std::string> devicePath(const std::string& sysRoot, const std::string& path);

// The last component of a device path that is a PCI address ("0000:00:1f.2").
std::optional<std::string> pciAddressIn(const std::string& devicePath);

// The name the `subsystem` link of a device directory points to ("pci",
// "nvme", "scsi"); empty when there is none.
std::string subsystemOf(const std::string& deviceDir);

// Whether path exists (a file, directory or link that resolves).
bool exists(const std::string& path);

// "a < b" with runs of digits compared by value.
bool naturalLess(const std::string& a, const std::string& b);

}  // namespace orv::linuxhost::health
