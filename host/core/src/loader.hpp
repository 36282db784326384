// The provider loader: libraries found in the provider directories, MIs made
// by the factories sfcb looks up, one MI per provider name and kind, created
// on first use; cleanup and unloading.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <condition_variable>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "orv/repository/registration.hpp"

namespace orv::host::detail {

using orv::repository::ProviderKind;
using orv::repository::ProviderRegistration;

// One loaded (or failed) library.
struct ProviderLibrary {
    std::string location;
    std::string path;  // where it was found
    void* handle = nullptr;
    std::string error;  // dlerror text when loading failed
    bool keepLoaded = false;  // a cleanup refused unloading for good
};

// An MI of one provider and kind, or why there is none.
struct LoadedMI {
    void* mi = nullptr;  // CMPIInstanceMI*, CMPIAssociationMI*, ...
    std::string error;   // non-empty: creating it failed
};

struct ProviderEntry {
    std::string name;
    std::string location;
    std::string parameters;
    bool unloadNever = false;
    std::map<ProviderKind, LoadedMI> mis;
    // Kinds whose factory is running now, and the thread running it.
    std::map<ProviderKind, std::thread::id> creating;
    bool indicationsEnabled = false;
    unsigned activeFilters = 0;
    // Active filters per class name (lower case) the MI was activated with.
    std::map<std::string, unsigned> classFilters;
};

class ProviderLoader {
public:
    ProviderLoader(std::vector<std::filesystem::path> dirs, const CMPIBroker* broker);
    ~ProviderLoader();
    ProviderLoader(const ProviderLoader&) = delete;
    ProviderLoader& operator=(const ProviderLoader&) = delete;

    // The MI of the registration's provider for `kind`, created on first use.
    // On failure: nullptr and `error` holds the reason (with dlerror's text).
    void* mi(const ProviderRegistration& reg, ProviderKind kind, std::string* error);
    // Loads the library of `location` now (once, as mi() would); its load
    // error, or "" when it is loaded.
    std::string preload(const std::string& location);
    // An MI of the host's own under a provider name: mi() answers it, nothing is
    // loaded, it is never unloaded, and shutdown() cleans it up like the others.
    void addBuiltIn(const std::string& name, ProviderKind kind, void* mi);
    // The provider's record (after mi() succeeded once), for indication state.
    ProviderEntry* provider(const std::string& name);

    // cleanup(terminating = false) on every idle provider library; see BrokerCore.
    unsigned unloadIdle();
    // disableIndications, cleanup(true) on every provider and kind, dlclose.
    void shutdown();
    std::vector<std::string> loadedLibraries() const;

private:
    ProviderLibrary& library(const std::string& location);
    LoadedMI create(ProviderEntry& entry, ProviderLibrary& lib, ProviderKind kind);
    // Runs the factory of `kind` without holding the lock (see mi()).
    LoadedMI createUnlocked(std::unique_lock<std::recursive_mutex>& lock, ProviderEntry& entry, ProviderLibrary& lib,
                            ProviderKind kind);
    std::string findLibrary(const std::string& location) const;

    std::vector<std::filesystem::path> dirs_;
    const CMPIBroker* broker_;
    mutable std::recursive_mutex mutex_;
    std::vector<std::unique_ptr<ProviderLibrary>> libraries_;  // load order
    std::map<std::string, std::unique_ptr<ProviderEntry>> providers_;
    std::vector<std::string> order_;  // provider names in creation order
    bool shutDown_ = false;
    unsigned creating_ = 0;                 // factories running now
    std::condition_variable_any created_;  // a factory has returned
};

// Name of a kind as the factory symbols spell it ("Instance", "Association", ...).
const char* kindName(ProviderKind kind) noexcept;

}  // namespace orv::host::detail
