// Run-time choice of the platform substitute.
//
//   ORV_PLATFORM     "sim" or "linux"; unset: "linux" when that substitute is
//                    built in, "sim" otherwise.
//   ORV_SIM_FIXTURE  the sim substitute's fixture file (JSON).
//
// A failed choice (unknown or missing substitute, sim without a fixture) is
// reported once on stderr, naming the variable; every platform call then
// fails as the real libraries fail.
#pragma once

#include <memory>
#include <string>

#include "orv/platform/backend/Backend.h"

namespace orv::platform {

// The selected substitute (chosen on first use, at the latest).
Backend& activeBackend();

// Chooses again from the environment (tests and tools that switch fixtures).
// Must not race with platform calls.
void reselectBackend();

// Makes `backend` the active substitute, for fuzzers and benchmarks that
// answer platform calls themselves. Must not race with platform calls.
void installBackend(std::unique_ptr<Backend> backend);

// Why the current choice failed; empty when a substitute is in use.
std::string selectionError();

// Factories of the substitutes. Each answers null and sets error on failure.
std::unique_ptr<Backend> makeSimBackend(const std::string& fixturePath, std::string& error);
// Defined by the Linux substitute (platform/linux) when it is built.
std::unique_ptr<Backend> makeLinuxBackend(std::string& error);

} // namespace orv::platform
