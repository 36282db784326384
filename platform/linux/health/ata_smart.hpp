// ATA SMART through the SCSI/ATA Translation layer: the ATA PASS-THROUGH (16)
// command blocks for SMART RETURN STATUS, READ DATA and READ THRESHOLDS; the
// status read back from the sense data (descriptor or fixed format); and the
// attribute table of the SMART data and threshold sectors.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

namespace orv::linuxhost::health {

inline constexpr std::size_t kAtaSectorSize = 512;

enum class SmartCommand : std::uint8_t { ReadData = 0xD0, ReadThresholds = 0xD1, ReturnStatus = 0xDA };

// ReadData and ReadThresholds read one sector from the device (PIO data-in);
// ReturnStatus transfers nothing and asks for the registers back (CK_COND).
std::array<std::uint8_t, 16> ataSmartCommandBlock(SmartCommand command);

// CHECK POWER MODE as ATA PASS-THROUGH (16), non-data, registers returned: a
// drive in standby answers it without spinning up.
std::array<std::uint8_t, 16> ataCheckPowerModeBlock();
// The COUNT register (7:0) in the sense data of a command that returned its
// registers; for CHECK POWER MODE 00h means standby. Nothing when the sense
// data carries no ATA registers.
std::optional<std::uint8_t> ataCountRegister(const std::uint8_t* sense, std::size_t size);
inline constexpr std::uint8_t kAtaPowerModeStandby = 0x00;

// From the sense data of SMART RETURN STATUS: true when the drive reports a
// threshold exceeded (LBA mid/high F4h/2Ch), false for 4Fh/C2h, nothing when
// the sense data carries no ATA registers or other values.
std::optional<bool> smartThresholdExceeded(const std::uint8_t* sense, std::size_t size);

struct AtaAttribute {
    std::uint8_t id = 0;
    bool preFailure = false;  // flag bit 0: pre-failure (else advisory)
    std::uint8_t value = 0, worst = 0;
    std::optional<std::uint8_t> threshold;
    std::uint64_t raw = 0;  // 48 bits
};

// The attributes of a SMART data sector (entries with id 0 left out), with the
// thresholds of the threshold sector by id. Nothing when the data sector is
// short or its checksum is wrong; a bad threshold sector gives no thresholds.
std::optional<std::vector<AtaAttribute>> parseSmartAttributes(const std::vector<std::uint8_t>& data,
                                                              const std::vector<std::uint8_t>& thresholds);

// Threshold exceeded, or a pre-failure attribute at or below its threshold: 20.
// An attribute that was at or below its threshold once (worst), reallocated
// (5), pending (197) or offline-uncorrectable (198) sectors: 10. Otherwise 5,
// or nothing when neither the status nor the attributes are known.
std::optional<std::uint16_t> ataSmartHealth(std::optional<bool> thresholdExceeded,
                                            const std::optional<std::vector<AtaAttribute>>& attributes);

}  // namespace orv::linuxhost::health
