#include "object.hpp"

#include "string.hpp"

namespace orv::host::detail {

CMPIStatus makeStatus(CMPIrc rc, const char* message) {
    CMPIStatus status{rc, nullptr};
    if (message != nullptr) {
        status.msg = newString(message, Owner::Arena);
    }
    return status;
}

CMPIData nullData(CMPIValueState state) noexcept {
    CMPIData data{};
    data.type = CMPI_null;
    data.state = state;
    return data;
}

CMPIStatus releaseAny(const void* pub, const void* ft) noexcept {
    const auto* shell = static_cast<const ObjectBase*>(pub);
    if (shell == nullptr || shell->ft != ft) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (!releaseObject(baseOf(pub))) {
        return CMPIStatus{CMPI_RC_ERR_FAILED, nullptr};  // released before
    }
    return okStatus();
}

void disposeObject(const void* pub) noexcept {
    ObjectBase* base = baseOf(pub);
    if (base != nullptr && !base->released) {
        base->destroy(base);
    }
}

}  // namespace orv::host::detail
