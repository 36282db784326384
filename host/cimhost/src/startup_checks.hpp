// What the host checks and prepares before it serves, each failure one clear line.
#pragma once

#include "orv/cimhost/host_config.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost::detail {

// Exports ORV_PLATFORM and ORV_SIM_FIXTURE when configured; the fixture must exist.
void selectPlatform(const HostConfig& config);
// Every registration file exists and parses, and every library it names is found in a
// provider folder and loads.
void checkProviders(const HostConfig& config);
// Reads the MOF files (or folders of *.mof files, in name order) into `classes`.
void loadClasses(repository::ClassRepository& classes, const HostConfig& config);

}  // namespace orv::cimhost::detail
