// Indication control: filters and the enable/disable switch of indication providers.
#include "context.hpp"
#include "core.hpp"
#include "mi_calls.hpp"
#include "names.hpp"
#include "object_path.hpp"
#include "select_exp.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

CMPIContext* controlContext(const Caller& caller) {
    CMPIContext* ctx = newContext(Owner::Caller);
    ValueList* entries = contextImpl(ctx);
    CMPIUint32 zero = 0;
    entries->set(CMPIInvocationFlags, reinterpret_cast<const CMPIValue*>(&zero), CMPI_uint32);
    entries->set(CMPIPrincipal, reinterpret_cast<const CMPIValue*>(caller.principal.c_str()), CMPI_chars);
    entries->set("CMPISessionId", reinterpret_cast<const CMPIValue*>(&caller.sessionId), CMPI_uint32);
    return ctx;
}

Outcome failure(const CMPIStatus& status, unsigned calls) {
    const char* text = stringText(status.msg);
    return Outcome{status.rc, text != nullptr ? text : "", calls};
}

// authorizeFilter, mustPoll (its answer is ignored, as in sfcb), activateFilter.
CMPIStatus activate(void* mi, const CMPIContext* ctx, const CMPISelectExp* se, const char* className,
                    const CMPIObjectPath* classPath, const char* owner, bool first) {
    const CMPIIndicationMIFT* ft = tableOf<CMPIIndicationMI>(mi);
    auto* imi = static_cast<CMPIIndicationMI*>(mi);
    if (ft == nullptr || ft->authorizeFilter == nullptr || ft->mustPoll == nullptr || ft->activateFilter == nullptr) {
        return missingSlot("authorizeFilter, mustPoll or activateFilter");
    }
    CMPIStatus status = ft->authorizeFilter(imi, ctx, se, className, classPath, owner);
    if (status.rc != CMPI_RC_OK) {
        return status;
    }
    ft->mustPoll(imi, ctx, se, className, classPath);
    return ft->activateFilter(imi, ctx, se, className, classPath, first ? 1 : 0);
}

CMPIStatus deactivate(void* mi, const CMPIContext* ctx, const CMPISelectExp* se, const char* className,
                      const CMPIObjectPath* classPath, bool last) {
    const CMPIIndicationMIFT* ft = tableOf<CMPIIndicationMI>(mi);
    if (ft == nullptr || ft->deActivateFilter == nullptr) {
        return missingSlot("deActivateFilter");
    }
    return ft->deActivateFilter(static_cast<CMPIIndicationMI*>(mi), ctx, se, className, classPath, last ? 1 : 0);
}

// One provider MI reached by a filter, with what it needs for the calls.
struct FilterCall {
    void* mi = nullptr;
    ProviderEntry* entry = nullptr;
    const Target* target = nullptr;
};

}  // namespace

// Activation: for each provider of the FROM class and its subclasses, in turn
// authorizeFilter, mustPoll and activateFilter (firstActivation when the provider
// had no active filter on that class); then enableIndications on each provider
// that had no active filter at all. A refusal deactivates what was activated
// before it. Deactivation: disableIndications on a provider that loses its last
// filter, then deActivateFilter (lastActivation when no filter on that class is
// left), in that order as sfcb calls them.
Outcome CoreServices::filterControl(std::string_view ns, std::string_view query, std::string_view lang,
                                    const Caller& caller, bool activateIt) {
    std::string queryText(query);
    std::string language(lang);
    std::string error;
    auto parsed = parseQuery(queryText, &error);
    if (!parsed) {
        return Outcome{CMPI_RC_ERR_INVALID_QUERY, error, 0};
    }
    std::vector<Target> found = targets(ns, parsed->fromClass, ProviderKind::Indication, true);
    if (found.empty()) {
        return noTarget(ns, parsed->fromClass);
    }
    std::lock_guard lock(filterMutex_);
    Outcome outcome;
    std::vector<FilterCall> done;
    CallFrame frame(controlContext(caller));
    CMPIStatus status{CMPI_RC_OK, nullptr};
    CMPISelectExp* se = newSelectExp(queryText.c_str(), language.c_str(), Owner::Arena, &status);
    if (se == nullptr) {
        return failure(status, 0);
    }
    auto undo = [&] {
        for (auto it = done.rbegin(); it != done.rend(); ++it) {
            filterOff(*it->entry, it->mi, frame.ctx(), se, ns, it->target->className);
        }
    };
    for (const Target& target : found) {
        void* mi = loader_->mi(*target.reg, ProviderKind::Indication, &error);
        ++outcome.calls;
        if (mi == nullptr) {
            if (activateIt) {
                undo();
            }
            return Outcome{CMPI_RC_ERR_FAILED, error, outcome.calls};
        }
        ProviderEntry* entry = loader_->provider(target.reg->provider);
        if (!activateIt) {
            status = filterOff(*entry, mi, frame.ctx(), se, ns, target.className);
        } else {
            unsigned& onClass = entry->classFilters[lowerCase(target.className)];
            CMPIObjectPath* classPath = newObjectPath(ns, target.className, this, Owner::Arena);
            status = activate(mi, frame.ctx(), se, target.className.c_str(), classPath, caller.principal.c_str(),
                              onClass == 0);
            if (status.rc == CMPI_RC_OK) {
                ++onClass;
                ++entry->activeFilters;
                done.push_back(FilterCall{mi, entry, &target});
            }
        }
        if (status.rc != CMPI_RC_OK) {
            undo();
            return failure(status, outcome.calls);
        }
    }
    for (const FilterCall& call : done) {
        if (!call.entry->indicationsEnabled) {
            call.entry->indicationsEnabled = true;
            callEnableIndications(call.mi, frame.ctx());
        }
    }
    return outcome;
}

CMPIStatus CoreServices::filterOff(ProviderEntry& entry, void* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                                   std::string_view ns, const std::string& className) {
    unsigned& onClass = entry.classFilters[lowerCase(className)];
    if (onClass == 0) {
        return okStatus();  // not active on this class: nothing to undo
    }
    --onClass;
    --entry.activeFilters;
    if (entry.activeFilters == 0 && entry.indicationsEnabled) {
        entry.indicationsEnabled = false;
        callDisableIndications(mi);
    }
    CMPIObjectPath* classPath = newObjectPath(ns, className, this, Owner::Arena);
    return deactivate(mi, ctx, se, className.c_str(), classPath, onClass == 0);
}

Outcome CoreServices::indicationSwitch(std::string_view ns, std::string_view className, bool enable) {
    std::lock_guard lock(filterMutex_);
    Outcome outcome;
    std::vector<Target> found = targets(ns, className, ProviderKind::Indication, true);
    if (found.empty()) {
        return noTarget(ns, className);
    }
    for (const Target& target : found) {
        std::string error;
        void* mi = loader_->mi(*target.reg, ProviderKind::Indication, &error);
        if (mi == nullptr) {
            return Outcome{CMPI_RC_ERR_FAILED, error, outcome.calls};
        }
        ProviderEntry* entry = loader_->provider(target.reg->provider);
        if (entry->indicationsEnabled == enable) {
            continue;  // one flag per provider, as sfcb keeps it
        }
        ++outcome.calls;
        entry->indicationsEnabled = enable;
        if (enable) {
            CallFrame frame(controlContext(Caller{}));
            callEnableIndications(mi, frame.ctx());
        } else {
            callDisableIndications(mi);
        }
    }
    return outcome;
}

}  // namespace orv::host::detail
