#include "nvme_smart.hpp"

#include "health_state.hpp"

namespace orv::linuxhost::health {

namespace {

// A 128-bit little-endian counter as 64 bits, saturated.
std::uint64_t counter128(const std::uint8_t* bytes)
{
    for (int i = 8; i < 16; ++i) {
        if (bytes[i] != 0) return UINT64_MAX;
    }
    std::uint64_t value = 0;
    for (int i = 7; i >= 0; --i) value = value << 8 | bytes[i];
    return value;
}

}  // namespace

std::optional<NvmeHealthLog> parseNvmeHealthLog(const std::uint8_t* bytes, std::size_t size)
{
    if (bytes == nullptr || size < kNvmeHealthLogSize) return std::nullopt;
    NvmeHealthLog log;
    log.criticalWarning = bytes[0];
    log.temperatureKelvin = static_cast<std::uint16_t>(bytes[1] | bytes[2] << 8);
    log.availableSpare = bytes[3];
    log.spareThreshold = bytes[4];
    log.percentageUsed = bytes[5];
    log.mediaErrors = counter128(bytes + 160);
    return log;
}

std::uint16_t nvmeHealth(const NvmeHealthLog& log)
{
    const std::uint8_t warning = log.criticalWarning;
    if (warning & kNvmeReadOnly) return kCriticalFailure;
    if (warning & (kNvmeReliabilityDegraded | kNvmeVolatileBackupFailed | kNvmePersistentMemoryReadOnly)) {
        return kMajorFailure;
    }
    if ((warning & (kNvmeSpareBelowThreshold | kNvmeTemperature)) || log.percentageUsed >= 100 || log.mediaErrors > 0) {
        return kDegraded;
    }
    return kOk;
}

}  // namespace orv::linuxhost::health
