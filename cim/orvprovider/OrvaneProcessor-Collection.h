// Collection of one record per processor package (socket) of the host from the
// kernel's system-information nodes. Every call reads the kernel afresh and
// keeps nothing; all it uses is local to the call.
#pragma once

#include <cstdint>
#include <vector>

#include <ksi/KsiRecords.h>

#include "OrvaneProcessor-Cpuid.h"

namespace OrvaneProcessor {

// What CPUStatus holds. Collection produces only CPU_ENABLED and CPU_IDLE
// (and CPU_UNKNOWN while a package is being examined).
enum { CPU_UNKNOWN = 0, CPU_ENABLED = 1, CPU_DISABLED_USER = 2, CPU_DISABLED_BIOS = 3, CPU_IDLE = 4, CPU_OTHER = 5 };

inline constexpr std::size_t kDeviceIdSize = 64;
inline constexpr std::size_t kSteppingSize = 8;

// One processor package.
struct CpuDetails {
    VendorEnum Vendor;
    char DeviceID[kDeviceIdSize];  // "cpu-<position in the package list>"
    uint32_t Family;
    uint32_t NumberOfEnabledCores;
    KSI_HardwareCharArray48 ModelName;  // the host's model name, printable bytes only
    char Stepping[kSteppingSize];       // decimal
    uint8_t BrandID;
    uint8_t HTSupported;
    uint8_t HTEnabled;
    uint8_t VTSupported;
    uint8_t VTEnabled;
    uint8_t XDSupported;
    uint8_t XDEnabled;
    uint8_t LMSupported;
    uint8_t LMEnabled;
    uint8_t PCTLSupported;
    uint8_t PCTLEnabled;
    uint32_t CPUStatus;
};

// Appends one record per package, in the kernel's package order, to `cpus`,
// which is expected empty. Answers 0 on success and 1 on any failure; records
// appended before a failure stay, and callers ignore them.
unsigned int getCpuDetails(std::vector<CpuDetails>& cpus);

// Hyperthreading flags from the host's state. Enabled is decided by comparing
// the state with the value the enabled flag holds on entry: the parameter
// carries the name of the "enabled" state and hides it.
void decideHTStatus(Hardware_HTStateEnum htState, uint8_t& HTSupported, uint8_t& HTEnabled);

// Power-control flags from the current power policy's short name: none for a
// policy named "off...", enabled for "dynamic...", otherwise supported only.
// Both names are compared ignoring letter case.
void decidePCTLStatus(PowerKsi_Policy policy, uint8_t& PCTLSupported, uint8_t& PCTLEnabled);

}  // namespace OrvaneProcessor
