// The HealthState values the readers answer (the DMTF scale) and the
// OperationalStatus that goes with each.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace orv::linuxhost::health {

inline constexpr std::uint16_t kOk = 5;
inline constexpr std::uint16_t kDegraded = 10;
inline constexpr std::uint16_t kMajorFailure = 20;
inline constexpr std::uint16_t kCriticalFailure = 25;
inline constexpr std::uint16_t kNonRecoverable = 30;

// The worse of two states; nothing (no information) yields to any state.
std::optional<std::uint16_t> worse(std::optional<std::uint16_t> a, std::optional<std::uint16_t> b);

// OperationalStatus for a HealthState: 2 OK, 3 Degraded, 6 Error,
// 7 Non-Recoverable Error; empty when the state is not known.
std::vector<std::uint16_t> operationalStatusFor(std::optional<std::uint16_t> state);

}  // namespace orv::linuxhost::health
