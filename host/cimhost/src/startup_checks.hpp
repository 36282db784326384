// What the host checks and prepares before it serves, each failure one clear line.
#pragma once

#include "orv/cimhost/host_config.hpp"
#include "orv/host/broker_core.hpp"

namespace orv::cimhost::detail {

// Exports ORV_PLATFORM and ORV_SIM_FIXTURE when configured; the fixture must exist.
void selectPlatform(const HostConfig& config);
// Every registration file and MOF path named by the configuration exists.
void checkInputFiles(const HostConfig& config);
// Loads every registered provider library through the core (each exactly once: the
// libraries stay loaded for the requests); the first one that fails to load stops
// the start with the dynamic loader's text.
void preloadProviders(host::BrokerCore& core);
// --preload: creates every registered provider's MIs now; each one that fails is
// logged as an error and the host serves the others.
void createAllProviders(host::BrokerCore& core);

}  // namespace orv::cimhost::detail
