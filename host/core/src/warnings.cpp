// Warnings of the core about providers that break a rule the core repairs.
#include <cstdio>

#include "core.hpp"

namespace orv::host::detail {

void CoreServices::warn(const std::string& line) const {
    if (warningSink_) {
        warningSink_(line);
        return;
    }
    std::fprintf(stderr, "%s\n", line.c_str());
}

void CoreServices::warnPathsAsInstances(const Target& target, const Request& request) {
    const ProviderRegistration& reg = *target.reg;
    {
        std::lock_guard<std::mutex> lock(warnedMutex_);
        if (!warnedProviders_.insert(reg.location + "/" + reg.provider).second) {
            return;
        }
    }
    const char* operation = request.op == Op::GetInstance ? "getInstance" : "enumerateInstances";
    warn("provider " + reg.provider + " (lib" + reg.location + ".so) returned object paths to " + operation +
         " of " + target.className +
         "; they are delivered as instances made from the paths (logged once per provider)");
}

}  // namespace orv::host::detail
