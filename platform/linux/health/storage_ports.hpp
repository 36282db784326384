// SAS phys (<sys>/class/sas_phy) and SATA links (<sys>/class/ata_link) with the
// link error counts the kernel keeps for them.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::linuxhost::health {

struct StoragePort {
    std::string id;         // stable identity: "sas:<address>/phy<n>", "ata:<pci address>/port<n>[.<pmp port>]"
    std::string name;       // "SAS phy 3 of 0x500605b0000272b0", "SATA port 1 of 0000:00:1f.2"
    std::optional<std::uint64_t> speed;  // negotiated rate in bit/s
    // Error counters; each nothing when the kernel does not show it.
    std::optional<std::uint64_t> invalidDwords, disparityErrors, lostDwordSync, resetProblems;  // SAS
    std::optional<std::uint64_t> speedDowns;  // SATA: times libata lowered the link speed for errors, over its devices
};

std::vector<StoragePort> readSasPhys(const std::string& sysRoot);
std::vector<StoragePort> readAtaLinks(const std::string& sysRoot);

// "6.0 Gbit", "3.0 Gbps", "1.5 Gbps" -> bit/s; nothing for "Unknown", "<unknown>", "Phy disabled".
std::optional<std::uint64_t> linkRateBits(std::string_view text);

// Any error counted: 10; counters all zero: 5; no counter (a SATA link with no
// device): nothing.
std::optional<std::uint16_t> storagePortHealth(const StoragePort& port);

}  // namespace orv::linuxhost::health
