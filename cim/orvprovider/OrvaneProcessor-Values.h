// Published forms of a package's values that need more than a type cast: the
// brand index text and the two characteristic arrays.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>

#include "OrvaneProcessor-Collection.h"

namespace OrvaneProcessor {

// Codes of the Characteristics array. BITS32 is never published: a 32-bit
// host has no long mode to report.
enum Characteristic : uint16_t { BITS64 = 2, BITS32 = 3, VIRT = 4, HWTH = 5, XDNX = 6, PCTL = 7 };
// Codes of the EnabledProcessorCharacteristics array.
enum EnabledState : uint16_t { UNKNOWN = 0, ENABLED = 2, DISABLED = 3, NOTAPPLICABLE = 4 };

// One element of both characteristic arrays.
struct CharacteristicSlot {
    Characteristic code;
    EnabledState state;
};

// Both arrays always have one slot per feature: 64-bit mode, virtualisation,
// hyperthreading, execute-disable, power control.
inline constexpr std::size_t kCharacteristicSlots = 5;
using CharacteristicSlots = std::array<std::optional<CharacteristicSlot>, kCharacteristicSlots>;

// The slots of the features the package supports; the others stay empty. A
// supported feature is reported enabled, except power control, whose state
// follows its own enabled flag.
CharacteristicSlots characteristicSlots(const CpuDetails& record);

// "0x" and the brand index in lower-case hexadecimal right-aligned in four
// columns: 0x0a reads "0x   a".
std::string brandText(uint8_t brandId);

}  // namespace OrvaneProcessor
