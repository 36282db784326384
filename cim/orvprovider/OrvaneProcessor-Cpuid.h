// Feature flags of a physical CPU decoded from the CPUID leaves that the
// kernel keeps for it. Which register bits hold a flag depends on the vendor,
// so the vendor is decided first and the bit positions are laid out per vendor
// in a map of named entries.
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include <ksi/KsiRecords.h>

namespace OrvaneProcessor {

// The vendor of a CPU as its Vendor property publishes it.
enum VendorEnum { OTHER = 1, INTEL = 2, AMD = 3 };

// The bits beginindex..endindex of one register value.
struct CpuidEntry {
    CpuidEntry(KSI_HEX_U32 value, uint32_t begin, uint32_t end);

    // Reads the bits and consumes the entry: the register value is left
    // shifted past what was read. Bit i of the result is set when the value
    // shifted right by beginindex + i is nonzero at all, not only when its
    // lowest bit is set, so a one-bit entry reads 1 whenever any bit at or
    // above its position is set. The result keeps its low 8 bits.
    uint8_t readBits();

    KSI_HEX_U32 reg;
    uint32_t beginindex;
    uint32_t endindex;
};

// Entries by name, in name order.
using CpuidMap = std::map<std::string, CpuidEntry>;

// Names of the entries createCpuidMap adds for a known vendor.
inline constexpr const char* kBrandIdEntry = "BrandID";
inline constexpr const char* kXdEntry = "XDSupported";
inline constexpr const char* kVtEntry = "VTSupported";
inline constexpr const char* kLmEntry = "LMSupported";

// Decides the vendor from leaf 0 and, for Intel and AMD, adds the entries
// "VTSupported", "BrandID", "XDSupported" and "LMSupported" at the vendor's bit
// positions. Any other vendor adds nothing.
VendorEnum createCpuidMap(const Hardware_PCPUCPUIDSummaryStruct& cpuid, CpuidMap& m);

}  // namespace OrvaneProcessor
