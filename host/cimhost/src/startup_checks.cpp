#include "startup_checks.hpp"

#include <dlfcn.h>

#include <algorithm>
#include <cstdlib>
#include <set>
#include <stdexcept>

#include "orv/repository/registration.hpp"

namespace orv::cimhost::detail {

namespace fs = std::filesystem;

namespace {

[[noreturn]] void startFailure(const std::string& message) {
    throw std::runtime_error(message);
}

// The first provider folder holding lib<location>.so, as the core searches them.
fs::path findLibrary(const HostConfig& config, const std::string& location) {
    const std::string fileName = "lib" + location + ".so";
    for (const auto& dir : config.providerDirs) {
        if (fs::exists(dir / fileName)) {
            return dir / fileName;
        }
    }
    std::string searched;
    for (const auto& dir : config.providerDirs) {
        searched += (searched.empty() ? "" : ", ") + dir.string();
    }
    startFailure("provider library " + fileName + " not found in " + (searched.empty() ? "(no folder)" : searched));
}

void checkLoadable(const fs::path& library) {
    void* handle = dlopen(library.c_str(), RTLD_LAZY | RTLD_LOCAL);
    if (handle == nullptr) {
        const char* why = dlerror();
        startFailure("provider library " + library.string() + " does not load: " + (why ? why : "unknown error"));
    }
    dlclose(handle);
}

std::vector<fs::path> mofFilesOf(const fs::path& path) {
    if (!fs::is_directory(path)) {
        return {path};
    }
    std::vector<fs::path> files;
    for (const auto& entry : fs::directory_iterator(path)) {
        if (entry.path().extension() == ".mof") {
            files.push_back(entry.path());
        }
    }
    std::sort(files.begin(), files.end());
    return files;
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

void checkProviders(const HostConfig& config) {
    std::set<std::string> locations;
    for (const auto& file : config.registrationFiles) {
        if (!fs::exists(file)) {
            startFailure("registration file " + file.string() + " does not exist");
        }
        try {
            const repository::RegistrationSet registrations = repository::RegistrationSet::parseFile(file);
            for (const auto& entry : registrations.all()) {
                locations.insert(entry.location);
            }
        } catch (const std::exception& error) {
            startFailure(error.what());
        }
    }
    for (const auto& location : locations) {
        checkLoadable(findLibrary(config, location));
    }
}

void loadClasses(repository::ClassRepository& classes, const HostConfig& config) {
    for (const auto& path : config.mofFiles) {
        if (!fs::exists(path)) {
            startFailure("MOF file " + path.string() + " does not exist");
        }
        for (const auto& file : mofFilesOf(path)) {
            try {
                classes.loadFile(file, config.mofNamespace);
            } catch (const std::exception& error) {
                startFailure(error.what());
            }
        }
    }
}

}  // namespace orv::cimhost::detail
