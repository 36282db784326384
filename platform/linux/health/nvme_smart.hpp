// The NVMe SMART / Health Information log page (log identifier 02h, 512
// bytes), read from its byte layout, and the health it amounts to.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>

namespace orv::linuxhost::health {

inline constexpr std::size_t kNvmeHealthLogSize = 512;

// Critical warning bits (byte 0).
inline constexpr std::uint8_t kNvmeSpareBelowThreshold = 1 << 0;
inline constexpr std::uint8_t kNvmeTemperature = 1 << 1;
inline constexpr std::uint8_t kNvmeReliabilityDegraded = 1 << 2;
inline constexpr std::uint8_t kNvmeReadOnly = 1 << 3;
inline constexpr std::uint8_t kNvmeVolatileBackupFailed = 1 << 4;
inline constexpr std::uint8_t kNvmePersistentMemoryReadOnly = 1 << 5;

struct NvmeHealthLog {
    std::uint8_t criticalWarning = 0;
    std::uint16_t temperatureKelvin = 0;  // composite temperature, bytes 1-2
    std::uint8_t availableSpare = 0;      // percent, byte 3
    std::uint8_t spareThreshold = 0;      // percent, byte 4
    std::uint8_t percentageUsed = 0;      // byte 5; may exceed 100
    std::uint64_t mediaErrors = 0;        // bytes 160-175 (the low 64 bits; saturated when higher bits are set)
};

// Nothing when fewer than 512 bytes are given.
std::optional<NvmeHealthLog> parseNvmeHealthLog(const std::uint8_t* bytes, std::size_t size);

// Media read-only: 25. Reliability degraded, volatile memory backup failed,
// persistent memory read-only: 20. Spare below threshold, temperature beyond
// a threshold, endurance used up (100 % or more), media errors: 10. Else 5.
std::uint16_t nvmeHealth(const NvmeHealthLog& log);

}  // namespace orv::linuxhost::health
