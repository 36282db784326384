// The health of the computer system rolled up from the hardware elements of
// the watched classes, and the operational status that goes with it.
#pragma once

#include <cstdint>

namespace hwhealth {

inline constexpr uint16_t kHealthUnknown = 0;
inline constexpr uint16_t kHealthOk = 5;

// The worst HealthState any element of a watched class reports; OK when no
// element reports one. Unknown when a class cannot be read and nothing worse
// than OK was seen (the host cannot vouch for what it could not read).
uint16_t rolledUpHealthState();

// The OperationalStatus value for a HealthState: Unknown (0), OK (2),
// Degraded (3), Error (6) or Non-Recoverable Error (7).
uint16_t operationalStatusFor(uint16_t healthState);

}  // namespace hwhealth
