#include "loader.hpp"

#include <dlfcn.h>
#include <sys/stat.h>

#include <utility>

#include "context.hpp"
#include "mi_calls.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

constexpr ProviderKind kKinds[] = {ProviderKind::Instance, ProviderKind::Association, ProviderKind::Method,
                                   ProviderKind::Property, ProviderKind::Indication};

bool fileExists(const std::string& path) {
    struct stat info {};
    return ::stat(path.c_str(), &info) == 0;
}

std::string dlText() {
    const char* text = dlerror();
    return text != nullptr ? text : "unknown dynamic loader error";
}

// The context factories get, as in sfcb.
CMPIContext* factoryContext(const ProviderEntry& entry) {
    CMPIContext* ctx = newContext(Owner::Caller);
    ValueList* entries = contextImpl(ctx);
    CMPIUint32 zero = 0;
    entries->set(CMPIInvocationFlags, reinterpret_cast<const CMPIValue*>(&zero), CMPI_uint32);
    entries->set(CMPIPrincipal, reinterpret_cast<const CMPIValue*>("$$"), CMPI_chars);
    entries->set("CMPISessionId", reinterpret_cast<const CMPIValue*>(&zero), CMPI_uint32);
    if (!entry.parameters.empty()) {
        entries->set("sfcbProviderParameters", reinterpret_cast<const CMPIValue*>(entry.parameters.c_str()),
                     CMPI_chars);
    }
    return ctx;
}

using GenericFactory = void* (*)(const CMPIBroker*, const CMPIContext*, const char*, CMPIStatus*);
using SpecificFactory = void* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

std::string statusText(const CMPIStatus& status) {
    std::string text = "rc " + std::to_string(static_cast<int>(status.rc));
    if (const char* message = stringText(status.msg); message != nullptr) {
        text += ": " + std::string(message);
    }
    return text;
}

}  // namespace

const char* kindName(ProviderKind kind) noexcept {
    switch (kind) {
    case ProviderKind::Instance: return "Instance";
    case ProviderKind::Association: return "Association";
    case ProviderKind::Method: return "Method";
    case ProviderKind::Property: return "Property";
    case ProviderKind::Indication: return "Indication";
    case ProviderKind::Class: return "Class";
    case ProviderKind::Qualifier: return "QualifierDecl";
    }
    return "";
}

ProviderLoader::ProviderLoader(std::vector<std::filesystem::path> dirs, const CMPIBroker* broker)
    : dirs_(std::move(dirs)), broker_(broker) {}

ProviderLoader::~ProviderLoader() { shutdown(); }

std::string ProviderLoader::findLibrary(const std::string& location) const {
    std::string file = "lib" + location + ".so";
    for (const std::filesystem::path& dir : dirs_) {
        std::string candidate = (dir / file).string();
        if (fileExists(candidate)) {
            return candidate;  // the first directory holding the file wins
        }
    }
    return file;  // let the dynamic loader search, and explain why it fails
}

ProviderLibrary& ProviderLoader::library(const std::string& location) {
    for (auto& lib : libraries_) {
        if (lib->location == location) {
            return *lib;
        }
    }
    auto lib = std::make_unique<ProviderLibrary>();
    lib->location = location;
    lib->path = findLibrary(location);
    dlerror();
    lib->handle = dlopen(lib->path.c_str(), RTLD_NOW | RTLD_GLOBAL);
    if (lib->handle == nullptr) {
        lib->error = "cannot load provider library " + lib->path + ": " + dlText();
    }
    libraries_.push_back(std::move(lib));
    return *libraries_.back();
}

LoadedMI ProviderLoader::create(ProviderEntry& entry, ProviderLibrary& lib, ProviderKind kind) {
    std::string kindText = kindName(kind);
    std::string generic = "_Generic_Create_" + kindText + "MI";
    std::string specific = entry.name + "_Create_" + kindText + "MI";
    CMPIContext* ctx = factoryContext(entry);
    CMPIStatus status{CMPI_RC_OK, nullptr};
    void* mi = nullptr;
    dlerror();
    if (void* symbol = dlsym(lib.handle, generic.c_str()); symbol != nullptr) {
        mi = reinterpret_cast<GenericFactory>(symbol)(broker_, ctx, entry.name.c_str(), &status);
    } else if (void* own = dlsym(lib.handle, specific.c_str()); own != nullptr) {
        mi = reinterpret_cast<SpecificFactory>(own)(broker_, ctx, &status);
    } else {
        disposeObject(ctx);
        return LoadedMI{nullptr, "provider " + entry.name + ": no factory " + specific + " in " + lib.path + ": " + dlText()};
    }
    LoadedMI loaded{mi, {}};
    if (mi == nullptr || status.rc != CMPI_RC_OK || !miHasTable(mi)) {
        std::string why = mi == nullptr ? "returned no MI" : (status.rc != CMPI_RC_OK ? "failed" : "returned an MI without a function table");
        loaded = LoadedMI{nullptr, "Error initializing provider " + entry.name + " (" + kindText + "): factory " + why +
                                       " (" + statusText(status) + ")"};
    }
    disposeObject(ctx);
    return loaded;
}

LoadedMI ProviderLoader::createUnlocked(std::unique_lock<std::recursive_mutex>& lock, ProviderEntry& entry,
                                        ProviderLibrary& lib, ProviderKind kind) {
    // The factory calls the provider's initialize, which may take the provider's own
    // locks; a thread of that provider holding them may meanwhile ask the broker for
    // another provider, which needs this lock. So the factory runs without it, and
    // other requests for the same MI wait until it has returned.
    const bool outermost = entry.creating.emplace(kind, std::this_thread::get_id()).second;
    ++creating_;
    lock.unlock();
    LoadedMI loaded = create(entry, lib, kind);
    lock.lock();
    --creating_;
    if (outermost) {
        entry.creating.erase(kind);
    }
    created_.notify_all();
    return loaded;
}

void* ProviderLoader::mi(const ProviderRegistration& reg, ProviderKind kind, std::string* error) {
    std::unique_lock lock(mutex_);
    if (shutDown_) {
        if (error != nullptr) {
            *error = "the broker core has been shut down";
        }
        return nullptr;
    }
    auto& slot = providers_[reg.provider];
    if (!slot) {
        slot = std::make_unique<ProviderEntry>();
        slot->name = reg.provider;
        slot->location = reg.location;
        slot->parameters = reg.parameters;
        order_.push_back(reg.provider);
    }
    slot->unloadNever = slot->unloadNever || reg.unloadNever;
    auto found = slot->mis.find(kind);
    // Another thread is running this MI's factory: wait for its result. (The thread
    // running it may come back here from inside the factory; it does not wait.)
    for (auto busy = slot->creating.find(kind);
         found == slot->mis.end() && busy != slot->creating.end() && busy->second != std::this_thread::get_id();
         busy = slot->creating.find(kind)) {
        created_.wait(lock);
        found = slot->mis.find(kind);
    }
    if (found == slot->mis.end()) {
        ProviderLibrary& lib = library(slot->location);
        LoadedMI loaded = lib.handle != nullptr ? createUnlocked(lock, *slot, lib, kind) : LoadedMI{nullptr, lib.error};
        found = slot->mis.emplace(kind, std::move(loaded)).first;
    }
    if (found->second.mi == nullptr && error != nullptr) {
        *error = found->second.error;
    }
    return found->second.mi;
}

std::string ProviderLoader::preload(const std::string& location) {
    std::lock_guard lock(mutex_);
    if (shutDown_) {
        return "the broker core has been shut down";
    }
    return library(location).error;
}

void ProviderLoader::addBuiltIn(const std::string& name, ProviderKind kind, void* mi) {
    std::lock_guard lock(mutex_);
    auto& slot = providers_[name];
    if (!slot) {
        slot = std::make_unique<ProviderEntry>();
        slot->name = name;
        order_.push_back(name);
    }
    slot->unloadNever = true;
    slot->mis[kind] = LoadedMI{mi, {}};
}

ProviderEntry* ProviderLoader::provider(const std::string& name) {
    std::lock_guard lock(mutex_);
    auto found = providers_.find(name);
    return found != providers_.end() ? found->second.get() : nullptr;
}

unsigned ProviderLoader::unloadIdle() {
    std::lock_guard lock(mutex_);
    unsigned unloaded = 0;
    for (auto it = libraries_.begin(); it != libraries_.end();) {
        ProviderLibrary& lib = **it;
        std::vector<ProviderEntry*> users;
        bool busy = lib.keepLoaded || lib.handle == nullptr;
        for (auto& [name, entry] : providers_) {
            if (entry->location == lib.location) {
                users.push_back(entry.get());
                busy = busy || entry->unloadNever || entry->activeFilters > 0 || !entry->creating.empty();
            }
        }
        if (busy) {
            ++it;
            continue;
        }
        CMPIrc refusal = CMPI_RC_OK;
        for (ProviderKind kind : kKinds) {
            for (ProviderEntry* entry : users) {
                auto found = entry->mis.find(kind);
                if (refusal == CMPI_RC_OK && found != entry->mis.end() && found->second.mi != nullptr) {
                    refusal = callCleanup(found->second.mi, kind, false).rc;
                    break;  // once per library and kind
                }
            }
        }
        if (refusal != CMPI_RC_OK) {
            lib.keepLoaded = refusal != CMPI_RC_DO_NOT_UNLOAD;  // NEVER_UNLOAD and errors end it for good
            ++it;
            continue;
        }
        for (ProviderEntry* entry : users) {
            entry->mis.clear();
            entry->indicationsEnabled = false;
        }
        dlclose(lib.handle);
        it = libraries_.erase(it);
        ++unloaded;
    }
    return unloaded;
}

void ProviderLoader::shutdown() {
    std::unique_lock lock(mutex_);
    if (shutDown_) {
        return;
    }
    shutDown_ = true;
    // No factory may be running in a library about to be cleaned up and unloaded.
    created_.wait(lock, [this] { return creating_ == 0; });
    // From here on mi() refuses, so the MIs can be called without the lock: a
    // provider's cleanup may wait for its own thread, which may be inside an
    // up-call that needs this lock.
    std::vector<std::pair<ProviderKind, void*>> mis;
    for (const std::string& name : order_) {
        for (ProviderKind kind : kKinds) {
            auto& entry = providers_[name];
            auto found = entry->mis.find(kind);
            if (found != entry->mis.end() && found->second.mi != nullptr) {
                mis.emplace_back(kind, found->second.mi);
            }
        }
    }
    lock.unlock();
    for (const auto& [kind, mi] : mis) {
        if (kind == ProviderKind::Indication) {
            callDisableIndications(mi);
        }
    }
    // Every provider's every MI, as sfcb cleans up a provider in a process of
    // its own. (Where sfcb runs several providers of one library in one
    // process, it calls each kind's cleanup only once per library, then ends
    // the process without unloading anything.) This host unloads the libraries
    // next, so a provider that is not cleaned up could leave a thread running
    // in unloaded code.
    for (const auto& [kind, mi] : mis) {
        callCleanup(mi, kind, true);
    }
    lock.lock();
    for (const std::string& name : order_) {
        providers_[name]->mis.clear();
    }
    for (auto& lib : libraries_) {
        if (lib->handle != nullptr) {
            dlclose(lib->handle);
        }
    }
    libraries_.clear();
}

std::vector<std::string> ProviderLoader::loadedLibraries() const {
    std::lock_guard lock(mutex_);
    std::vector<std::string> names;
    for (const auto& lib : libraries_) {
        if (lib->handle != nullptr) {
            names.push_back(lib->location);
        }
    }
    return names;
}

}  // namespace orv::host::detail
