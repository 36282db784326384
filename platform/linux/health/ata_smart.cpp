#include "ata_smart.hpp"

#include "health_state.hpp"

#include <algorithm>
#include <map>
#include <numeric>

namespace orv::linuxhost::health {

namespace {

constexpr std::uint8_t kAtaPassThrough16 = 0x85;
constexpr std::uint8_t kAtaSmart = 0xB0;
constexpr std::uint8_t kAtaCheckPowerMode = 0xE5;
constexpr std::uint8_t kSmartLbaMid = 0x4F;
constexpr std::uint8_t kSmartLbaHigh = 0xC2;
constexpr std::uint8_t kFailingLbaMid = 0xF4;
constexpr std::uint8_t kFailingLbaHigh = 0x2C;
constexpr std::uint8_t kAtaReturnDescriptor = 0x09;
constexpr std::size_t kEntries = 30;
constexpr std::size_t kEntrySize = 12;

// The registers an ATA command returned in the sense data: from the ATA
// Status Return descriptor (descriptor format) or the information and
// command-specific fields (fixed format).
struct AtaRegisters {
    std::uint8_t count, lbaMid, lbaHigh;
};

std::optional<AtaRegisters> ataRegisters(const std::uint8_t* sense, std::size_t size)
{
    if (sense == nullptr || size < 12) return std::nullopt;
    const std::uint8_t response = sense[0] & 0x7f;
    if (response == 0x70 || response == 0x71) return AtaRegisters{sense[6], sense[10], sense[11]};
    if (response != 0x72 && response != 0x73) return std::nullopt;
    const std::size_t end = std::min<std::size_t>(size, 8 + static_cast<std::size_t>(sense[7]));
    for (std::size_t at = 8; at + 2 <= end;) {
        const std::size_t length = 2 + static_cast<std::size_t>(sense[at + 1]);
        if (sense[at] == kAtaReturnDescriptor && length >= 14 && at + 14 <= end) {
            return AtaRegisters{sense[at + 5], sense[at + 9], sense[at + 11]};
        }
        at += length;
    }
    return std::nullopt;
}

bool checksumOk(const std::vector<std::uint8_t>& sector)
{
    return sector.size() >= kAtaSectorSize &&
           std::accumulate(sector.begin(), sector.begin() + kAtaSectorSize, 0u) % 256 == 0;
}

std::optional<bool> verdict(std::uint8_t mid, std::uint8_t high)
{
    if (mid == kSmartLbaMid && high == kSmartLbaHigh) return false;
    if (mid == kFailingLbaMid && high == kFailingLbaHigh) return true;
    return std::nullopt;
}

std::map<std::uint8_t, std::uint8_t> thresholdsById(const std::vector<std::uint8_t>& sector)
{
    std::map<std::uint8_t, std::uint8_t> byId;
    if (!checksumOk(sector)) return byId;
    for (std::size_t i = 0; i < kEntries; ++i) {
        const std::uint8_t* entry = sector.data() + 2 + i * kEntrySize;
        if (entry[0] != 0) byId[entry[0]] = entry[1];
    }
    return byId;
}

}  // namespace

std::array<std::uint8_t, 16> ataSmartCommandBlock(SmartCommand command)
{
    std::array<std::uint8_t, 16> cdb{};
    cdb[0] = kAtaPassThrough16;
    if (command == SmartCommand::ReturnStatus) {
        cdb[1] = 3 << 1;  // non-data
        cdb[2] = 0x20;    // CK_COND: return the registers in the sense data
    } else {
        cdb[1] = 4 << 1;  // PIO data-in
        cdb[2] = 0x0E;    // T_DIR from the device, BYT_BLOK, length in the COUNT field
        cdb[6] = 1;       // one sector
    }
    cdb[4] = static_cast<std::uint8_t>(command);  // FEATURES
    cdb[10] = kSmartLbaMid;
    cdb[12] = kSmartLbaHigh;
    cdb[14] = kAtaSmart;
    return cdb;
}

std::array<std::uint8_t, 16> ataCheckPowerModeBlock()
{
    std::array<std::uint8_t, 16> cdb{};
    cdb[0] = kAtaPassThrough16;
    cdb[1] = 3 << 1;  // non-data
    cdb[2] = 0x20;    // CK_COND
    cdb[14] = kAtaCheckPowerMode;
    return cdb;
}

std::optional<std::uint8_t> ataCountRegister(const std::uint8_t* sense, std::size_t size)
{
    std::optional<AtaRegisters> registers = ataRegisters(sense, size);
    if (!registers) return std::nullopt;
    return registers->count;
}

std::optional<bool> smartThresholdExceeded(const std::uint8_t* sense, std::size_t size)
{
    std::optional<AtaRegisters> registers = ataRegisters(sense, size);
    if (!registers) return std::nullopt;
    return verdict(registers->lbaMid, registers->lbaHigh);
}

std::optional<std::vector<AtaAttribute>> parseSmartAttributes(const std::vector<std::uint8_t>& data,
                                                              const std::vector<std::uint8_t>& thresholds)
{
    if (!checksumOk(data)) return std::nullopt;
    const std::map<std::uint8_t, std::uint8_t> limits = thresholdsById(thresholds);
    std::vector<AtaAttribute> attributes;
    for (std::size_t i = 0; i < kEntries; ++i) {
        const std::uint8_t* entry = data.data() + 2 + i * kEntrySize;
        if (entry[0] == 0) continue;
        AtaAttribute attribute;
        attribute.id = entry[0];
        attribute.preFailure = (entry[1] & 1) != 0;
        attribute.value = entry[3];
        attribute.worst = entry[4];
        for (int b = 5; b >= 0; --b) attribute.raw = attribute.raw << 8 | entry[5 + b];
        auto limit = limits.find(attribute.id);
        if (limit != limits.end()) attribute.threshold = limit->second;
        attributes.push_back(attribute);
    }
    return attributes;
}

std::optional<std::uint16_t> ataSmartHealth(std::optional<bool> thresholdExceeded,
                                            const std::optional<std::vector<AtaAttribute>>& attributes)
{
    std::optional<std::uint16_t> state;
    if (thresholdExceeded) state = *thresholdExceeded ? kMajorFailure : kOk;
    if (!attributes) return state;
    state = worse(state, kOk);
    for (const AtaAttribute& a : *attributes) {
        // A threshold of 0 means "never fails"; 0xFF means "always failing" and marks test attributes.
        const bool limited = a.threshold && *a.threshold != 0 && *a.threshold != 0xFF;
        if (limited && a.preFailure && a.value <= *a.threshold) state = worse(state, kMajorFailure);
        if (limited && a.worst <= *a.threshold) state = worse(state, kDegraded);
        if ((a.id == 5 || a.id == 197 || a.id == 198) && a.raw > 0) state = worse(state, kDegraded);
    }
    return state;
}

}  // namespace orv::linuxhost::health
