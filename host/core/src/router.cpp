// Request routing: which provider registrations a request reaches.
#include "core.hpp"
#include "names.hpp"

namespace orv::host::detail {

namespace {

bool servesNamespace(const ProviderRegistration& reg, std::string_view ns) {
    if (reg.namespaces.empty()) {
        return equalsNoCase(ns, orv::repository::kDefaultNamespace);
    }
    for (const std::string& item : reg.namespaces) {
        if (equalsNoCase(item, ns)) {
            return true;
        }
    }
    return false;
}

void addTargets(std::vector<Target>& out, const std::vector<const ProviderRegistration*>& regs) {
    for (const ProviderRegistration* reg : regs) {
        out.push_back(Target{reg, reg->className});
    }
}

}  // namespace

std::vector<const ProviderRegistration*> CoreServices::registrationsFor(std::string_view ns,
                                                                        std::string_view className,
                                                                        ProviderKind kind) const {
    std::vector<const ProviderRegistration*> found;
    for (const ProviderRegistration* reg : registrations_) {
        if (reg->has(kind) && equalsNoCase(reg->className, className) && servesNamespace(*reg, ns)) {
            found.push_back(reg);
        }
    }
    return found;
}

// The providers of the class, or else of its nearest registered superclass
// (called with the requested class name); with `withSubclasses` also those of
// every subclass, deep (called with their own class names).
std::vector<Target> CoreServices::targets(std::string_view ns, std::string_view className, ProviderKind kind,
                                          bool withSubclasses) const {
    std::vector<Target> out;
    std::vector<const ProviderRegistration*> own = registrationsFor(ns, className, kind);
    for (const std::string& ancestor : repository_.superclassChain(ns, className)) {
        if (!own.empty()) {
            break;
        }
        own = registrationsFor(ns, ancestor, kind);
    }
    for (const ProviderRegistration* reg : own) {
        out.push_back(Target{reg, std::string(className)});
    }
    if (withSubclasses) {
        for (const std::string& sub : repository_.subclasses(ns, className, true)) {
            addTargets(out, registrationsFor(ns, sub, kind));
        }
    }
    return out;
}

// Association providers for a filter class (and its subclasses), or all of
// the namespace's association providers when there is no filter.
std::vector<Target> CoreServices::associationTargets(std::string_view ns, const char* filterClass) const {
    if (filterClass != nullptr && *filterClass != '\0') {
        return targets(ns, filterClass, ProviderKind::Association, true);
    }
    std::vector<Target> out;
    for (const ProviderRegistration* reg : registrations_) {
        if (reg->has(ProviderKind::Association) && servesNamespace(*reg, ns)) {
            out.push_back(Target{reg, reg->className});
        }
    }
    return out;
}

Outcome CoreServices::noTarget(std::string_view ns, std::string_view className) const {
    if (repository_.getClass(ns, className) == nullptr) {
        if (!repository_.hasNamespace(ns)) {
            return Outcome{CMPI_RC_ERR_INVALID_NAMESPACE, "namespace " + std::string(ns) + " not found", 0};
        }
        return Outcome{CMPI_RC_ERR_INVALID_CLASS, "class " + std::string(className) + " not found in " + std::string(ns), 0};
    }
    return Outcome{CMPI_RC_ERR_NOT_SUPPORTED, "no provider registered for class " + std::string(className), 0};
}

}  // namespace orv::host::detail
