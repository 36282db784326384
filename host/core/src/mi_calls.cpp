#include "mi_calls.hpp"

#include <string>

#include "context.hpp"

namespace orv::host::detail {

namespace {

// The cleanup slot of an MI of type MI.
template <class MI>
CMPIStatus cleanupOf(void* mi, const CMPIContext* ctx, bool terminating) {
    auto* ft = tableOf<MI>(mi);
    if (ft == nullptr || ft->cleanup == nullptr) {
        return missingSlot("cleanup");
    }
    return ft->cleanup(static_cast<MI*>(mi), ctx, static_cast<CMPIBoolean>(terminating));
}

}  // namespace

CallFrame::~CallFrame() { disposeObject(ctx_); }

CMPIStatus missingSlot(const char* slot) {
    return makeStatus(CMPI_RC_ERR_FAILED, (std::string("the provider's MI function table has no ") + slot).c_str());
}

bool miHasTable(const void* mi) noexcept {
    return mi != nullptr && static_cast<const CMPIInstanceMI*>(mi)->ft != nullptr;
}

CMPIStatus callCleanup(void* mi, ProviderKind kind, bool terminating) {
    CallFrame frame(newContext(Owner::Caller));
    switch (kind) {
    case ProviderKind::Instance: return cleanupOf<CMPIInstanceMI>(mi, frame.ctx(), terminating);
    case ProviderKind::Association: return cleanupOf<CMPIAssociationMI>(mi, frame.ctx(), terminating);
    case ProviderKind::Method: return cleanupOf<CMPIMethodMI>(mi, frame.ctx(), terminating);
    case ProviderKind::Property: return cleanupOf<CMPIPropertyMI>(mi, frame.ctx(), terminating);
    case ProviderKind::Indication: return cleanupOf<CMPIIndicationMI>(mi, frame.ctx(), terminating);
    default: return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
    }
}

CMPIStatus callEnableIndications(void* mi, const CMPIContext* ctx) {
    auto* ft = tableOf<CMPIIndicationMI>(mi);
    if (ft == nullptr || ft->enableIndications == nullptr) {
        return missingSlot("enableIndications");
    }
    return ft->enableIndications(static_cast<CMPIIndicationMI*>(mi), ctx);
}

CMPIStatus callDisableIndications(void* mi) {
    CallFrame frame(newContext(Owner::Caller));
    auto* ft = tableOf<CMPIIndicationMI>(mi);
    if (ft == nullptr || ft->disableIndications == nullptr) {
        return missingSlot("disableIndications");
    }
    return ft->disableIndications(static_cast<CMPIIndicationMI*>(mi), frame.ctx());
}

}  // namespace orv::host::detail
