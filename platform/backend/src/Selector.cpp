#include "orv/platform/backend/Selector.h"

#include <cstdio>
#include <cstdlib>
#include <atomic>
#include <mutex>
#include <vector>

#include "FailingBackend.h"

namespace orv::platform {
namespace {

#if defined(ORV_HAVE_LINUX_SUBSTITUTE) && ORV_HAVE_LINUX_SUBSTITUTE
constexpr const char* kDefaultSubstitute = "linux";
constexpr const char* kKnownSubstitutes = "sim, linux";
#else
constexpr const char* kDefaultSubstitute = "sim";
constexpr const char* kKnownSubstitutes = "sim";
#endif

struct Selection {
    std::unique_ptr<Backend> backend;
    std::string error;
};

std::string envOrEmpty(const char* name)
{
    const char* value = std::getenv(name);
    return value != nullptr ? value : "";
}

std::unique_ptr<Backend> makeNamed(const std::string& name, std::string& error)
{
    if (name == "sim") {
        const std::string fixture = envOrEmpty("ORV_SIM_FIXTURE");
        if (fixture.empty()) {
            error = "ORV_PLATFORM=sim needs ORV_SIM_FIXTURE, the fixture file, which is not set";
            return nullptr;
        }
        return makeSimBackend(fixture, error);
    }
#if defined(ORV_HAVE_LINUX_SUBSTITUTE) && ORV_HAVE_LINUX_SUBSTITUTE
    if (name == "linux") {
        return makeLinuxBackend(error);
    }
#endif
    error = "ORV_PLATFORM=" + name + ": no such platform substitute in this build (known: " + kKnownSubstitutes + ")";
    return nullptr;
}

Selection choose()
{
    std::string name = envOrEmpty("ORV_PLATFORM");
    if (name.empty()) {
        name = kDefaultSubstitute;
    }
    Selection selection;
    selection.backend = makeNamed(name, selection.error);
    if (!selection.backend) {
        std::fprintf(stderr, "orv platform: %s\n", selection.error.c_str());
        selection.backend = makeFailingBackend("platform substitute unavailable: " + selection.error);
    }
    return selection;
}

class Registry {
public:
    Backend& active()
    {
        std::call_once(first_, [this] { install(choose()); });
        return *active_.load(std::memory_order_acquire);
    }

    void reselect()
    {
        std::call_once(first_, [] {});
        install(choose());
    }

    void replace(std::unique_ptr<Backend> backend)
    {
        std::call_once(first_, [] {});
        Selection selection;
        selection.backend = std::move(backend);
        install(std::move(selection));
    }

    std::string error()
    {
        active();
        std::lock_guard<std::mutex> lock(mutex_);
        return error_;
    }

private:
    void install(Selection selection)
    {
        std::lock_guard<std::mutex> lock(mutex_);
        // Earlier substitutes stay alive: objects they handed out may still be in use.
        active_.store(selection.backend.get(), std::memory_order_release);
        error_ = std::move(selection.error);
        owned_.push_back(std::move(selection.backend));
    }

    std::once_flag first_;
    std::mutex mutex_;
    std::atomic<Backend*> active_{nullptr};
    std::string error_;
    std::vector<std::unique_ptr<Backend>> owned_;
};

Registry& registry()
{
    static Registry instance;
    return instance;
}

// Choose while the library loads, so a wrong setting is reported right away.
[[maybe_unused]] const bool chosenAtLoad = (registry().active(), true);

} // namespace

Backend& activeBackend()
{
    return registry().active();
}

void reselectBackend()
{
    registry().reselect();
}

void installBackend(std::unique_ptr<Backend> backend)
{
    if (backend) {
        registry().replace(std::move(backend));
    }
}

std::string selectionError()
{
    return registry().error();
}

} // namespace orv::platform
