// The broker handed to providers: CMPIBroker with its four tables. hdl points
// at the core that owns it, so every up-call finds its way back.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include "object.hpp"

namespace orv::host::detail {

class CoreServices;

extern const CMPIBrokerFT kBrokerFT;
extern const CMPIBrokerEncFT kBrokerEncFT;
extern const CMPIBrokerExtFT kBrokerExtFT;
extern const CMPIBrokerMemFT kBrokerMemFT;

// sfcb's capability set: instance manipulation, associations, queries,
// indications and OS encapsulation.
inline constexpr unsigned kBrokerCapabilities = 0x1BF;
inline constexpr const char* kBrokerName = "orv-brokercore";
inline constexpr unsigned kBrokerVersion = 200;

// The broker of one core.
CMPIBroker makeBroker(CoreServices* core) noexcept;
// The core behind a broker of ours, or nullptr.
CoreServices* coreOf(const CMPIBroker* broker) noexcept;

}  // namespace orv::host::detail
