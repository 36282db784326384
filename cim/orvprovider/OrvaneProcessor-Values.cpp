#include "OrvaneProcessor-Values.h"

#include <cstdio>

namespace OrvaneProcessor {
namespace {

// "0x", four columns and the terminator.
constexpr std::size_t kBrandTextSize = 7;

std::optional<CharacteristicSlot> slotIf(uint8_t supported, Characteristic code, EnabledState state) {
    if (supported == 0) {
        return std::nullopt;
    }
    return CharacteristicSlot{code, state};
}

}  // namespace

CharacteristicSlots characteristicSlots(const CpuDetails& record) {
    return {
        slotIf(record.LMSupported, BITS64, ENABLED),
        slotIf(record.VTSupported, VIRT, ENABLED),
        slotIf(record.HTSupported, HWTH, ENABLED),
        slotIf(record.XDSupported, XDNX, ENABLED),
        slotIf(record.PCTLSupported, PCTL, record.PCTLEnabled != 0 ? ENABLED : DISABLED),
    };
}

std::string brandText(uint8_t brandId) {
    char text[kBrandTextSize];
    std::snprintf(text, sizeof text, "0x%4x", static_cast<unsigned>(brandId));
    return text;
}

}  // namespace OrvaneProcessor
