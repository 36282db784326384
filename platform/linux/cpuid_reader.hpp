// CPUID leaves of one logical CPU: read from the kernel's cpuid device
// (/dev/cpu/N/cpuid), or executed on that CPU by a helper thread pinned to it
// when the device is missing. Leaves above the CPU's highest leaf read as zero.
#pragma once

#include <array>
#include <cstdint>
#include <string>

namespace orv::linuxhost {

struct CpuidRegisters {
    std::uint32_t eax = 0, ebx = 0, ecx = 0, edx = 0;
};

// The leaves the processor records carry, in their order.
constexpr std::array<std::uint32_t, 6> kRecordLeaves = {0x0, 0x1, 0x80000000, 0x80000001, 0x80000008, 0x8000000A};

struct CpuidLeaves {
    std::array<CpuidRegisters, kRecordLeaves.size()> leaves{};
    const CpuidRegisters& leaf(std::uint32_t number) const;
};

// Family, model and stepping as leaf 1's EAX encodes them (extended family
// added for base family 0xF, extended model for families 6 and 0xF).
struct CpuSignature {
    std::uint32_t family = 0;
    std::uint32_t model = 0;
    std::uint32_t type = 0;
    std::uint32_t stepping = 0;
};
CpuSignature decodeSignature(std::uint32_t leaf1Eax);

// Keeps only the leaves within the maxima that leaf 0 and leaf 0x80000000 announce.
CpuidLeaves clampToAnnounced(CpuidLeaves leaves);

// Throws LinuxCallError when neither way works for this CPU.
CpuidLeaves readCpuidLeaves(unsigned cpu, const std::string& devRoot = "/dev");

}  // namespace orv::linuxhost
