#include "startup_checks.hpp"

#include <cstdlib>
#include <stdexcept>

#include "orv/cimhost/log.hpp"

namespace orv::cimhost::detail {

namespace fs = std::filesystem;

namespace {

[[noreturn]] void startFailure(const std::string& message) {
    throw std::runtime_error(message);
}

void requireExisting(const std::vector<fs::path>& paths, const char* what) {
    for (const auto& path : paths) {
        if (!fs::exists(path)) {
            startFailure(std::string(what) + " " + path.string() + " does not exist");
        }
    }
}

}  // namespace

void selectPlatform(const HostConfig& config) {
    if (!config.platform.empty()) {
        setenv("ORV_PLATFORM", config.platform.c_str(), 1);
    }
    if (!config.fixture.empty()) {
        if (!fs::exists(config.fixture)) {
            startFailure("fixture file " + config.fixture.string() + " does not exist");
        }
        setenv("ORV_SIM_FIXTURE", config.fixture.c_str(), 1);
    }
}

void checkInputFiles(const HostConfig& config) {
    requireExisting(config.registrationFiles, "registration file");
    requireExisting(config.mofFiles, "MOF file");
}

void preloadProviders(host::BrokerCore& core) {
    const std::vector<std::string> failures = core.preloadProviders();
    if (!failures.empty()) {
        startFailure(failures.front());
    }
}

void createAllProviders(host::BrokerCore& core) {
    for (const std::string& failure : core.createAllProviders()) {
        logLine(LogLevel::Error, "preload: " + failure);
    }
}

}  // namespace orv::cimhost::detail
