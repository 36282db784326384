#include "OrvaneProcessor-Cpuid.h"

namespace OrvaneProcessor {
namespace {

// Leaf 0 spells the vendor across ebx, edx and ecx.
constexpr KSI_HEX_U32 kIntelEbx = 0x756E6547;  // "Genu"
constexpr KSI_HEX_U32 kIntelEdx = 0x49656E69;  // "ineI"
constexpr KSI_HEX_U32 kIntelEcx = 0x6C65746E;  // "ntel"
constexpr KSI_HEX_U32 kAmdEbx = 0x68747541;    // "Auth"
constexpr KSI_HEX_U32 kAmdEdx = 0x69746E65;    // "enti"
constexpr KSI_HEX_U32 kAmdEcx = 0x444D4163;    // "cAMD"

// Width of the register value: shifting it this far or further leaves nothing.
constexpr uint32_t kRegisterBits = 32;
// Bits of the result that readBits keeps.
constexpr uint32_t kResultBits = 8;

VendorEnum vendorOf(const Hardware_PCPUCPUIDLeafStruct& leaf0) {
    if (leaf0.ebx == kIntelEbx) {
        return leaf0.edx == kIntelEdx && leaf0.ecx == kIntelEcx ? INTEL : OTHER;
    }
    if (leaf0.ebx == kAmdEbx) {
        return leaf0.edx == kAmdEdx && leaf0.ecx == kAmdEcx ? AMD : OTHER;
    }
    return OTHER;
}

// Only the virtualisation flag sits in a different place: Intel reports VMX
// in leaf 1, AMD reports SVM in leaf 0x80000001.
void addVendorEntries(const Hardware_PCPUCPUIDSummaryStruct& cpuid, VendorEnum vendor, CpuidMap& m) {
    if (vendor == INTEL) {
        m.emplace(kVtEntry, CpuidEntry(cpuid.id1.ecx, 5, 5));
    } else {
        m.emplace(kVtEntry, CpuidEntry(cpuid.id81.ecx, 2, 2));
    }
    m.emplace(kBrandIdEntry, CpuidEntry(cpuid.id1.ebx, 0, 7));
    m.emplace(kXdEntry, CpuidEntry(cpuid.id81.edx, 20, 20));
    m.emplace(kLmEntry, CpuidEntry(cpuid.id81.edx, 29, 29));
}

}  // namespace

CpuidEntry::CpuidEntry(KSI_HEX_U32 value, uint32_t begin, uint32_t end)
    : reg(value), beginindex(begin), endindex(end) {}

uint8_t CpuidEntry::readBits() {
    reg = beginindex < kRegisterBits ? reg >> beginindex : 0;
    // Unsigned on purpose: an end below the beginning reads until the value
    // runs out. Once the value is zero no further bit can be set, so the walk
    // stops there.
    const uint32_t span = endindex - beginindex;
    uint32_t result = 0;
    for (uint32_t i = 0; reg != 0; ++i) {
        if (i < kResultBits) {
            result |= 1U << i;
        }
        reg >>= 1;
        if (i == span) {
            break;
        }
    }
    return static_cast<uint8_t>(result);
}

VendorEnum createCpuidMap(const Hardware_PCPUCPUIDSummaryStruct& cpuid, CpuidMap& m) {
    const VendorEnum vendor = vendorOf(cpuid.id0);
    if (vendor != OTHER) {
        addVendorEntries(cpuid, vendor, m);
    }
    return vendor;
}

}  // namespace OrvaneProcessor
