// Indication control: filters and the enable/disable switch of indication providers.
#include "context.hpp"
#include "core.hpp"
#include "mi_calls.hpp"
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

// authorizeFilter, mustPoll (its answer is ignored, as in sfcb), activateFilter(first = true).
CMPIStatus activate(void* mi, const CMPIContext* ctx, const CMPISelectExp* se, const char* className,
                    const CMPIObjectPath* classPath, const char* owner) {
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
    return ft->activateFilter(imi, ctx, se, className, classPath, 1);
}

CMPIStatus deactivate(void* mi, const CMPIContext* ctx, const CMPISelectExp* se, const char* className,
                      const CMPIObjectPath* classPath) {
    const CMPIIndicationMIFT* ft = tableOf<CMPIIndicationMI>(mi);
    if (ft == nullptr || ft->deActivateFilter == nullptr) {
        return missingSlot("deActivateFilter");
    }
    return ft->deActivateFilter(static_cast<CMPIIndicationMI*>(mi), ctx, se, className, classPath, 1);
}

}  // namespace

Outcome CoreServices::filterControl(std::string_view ns, std::string_view query, std::string_view lang,
                                    const Caller& caller, bool activateIt) {
    Outcome outcome;
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
    for (const Target& target : found) {
        void* mi = loader_->mi(*target.reg, ProviderKind::Indication, &error);
        ++outcome.calls;
        if (mi == nullptr) {
            return Outcome{CMPI_RC_ERR_FAILED, error, outcome.calls};
        }
        CallFrame frame(controlContext(caller));
        CMPIStatus status{CMPI_RC_OK, nullptr};
        CMPISelectExp* se = newSelectExp(queryText.c_str(), language.c_str(), Owner::Arena, &status);
        if (se == nullptr) {
            return failure(status, outcome.calls);
        }
        CMPIObjectPath* classPath = newObjectPath(ns, target.className, this, Owner::Arena);
        status = activateIt ? activate(mi, frame.ctx(), se, target.className.c_str(), classPath, caller.principal.c_str())
                            : deactivate(mi, frame.ctx(), se, target.className.c_str(), classPath);
        if (status.rc != CMPI_RC_OK) {
            return failure(status, outcome.calls);
        }
        ProviderEntry* entry = loader_->provider(target.reg->provider);
        if (activateIt) {
            ++entry->activeFilters;
        } else if (entry->activeFilters > 0) {
            --entry->activeFilters;
        }
    }
    return outcome;
}

Outcome CoreServices::indicationSwitch(std::string_view ns, std::string_view className, bool enable) {
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
