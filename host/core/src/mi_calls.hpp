// Calls into MI function tables that never trust the provider: a missing
// table or slot answers CMPI_RC_ERR_FAILED instead of crashing the core.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include "memory.hpp"
#include "orv/repository/registration.hpp"

namespace orv::host::detail {

using orv::repository::ProviderKind;

// Everything the broker makes for one MI call: a work arena that is current
// while the call runs and is freed afterwards, and the call's context.
class CallFrame {
public:
    explicit CallFrame(CMPIContext* ctx) noexcept : guard_(work_), ctx_(ctx) {}
    ~CallFrame();
    CallFrame(const CallFrame&) = delete;
    CallFrame& operator=(const CallFrame&) = delete;
    CMPIContext* ctx() const noexcept { return ctx_; }

private:
    Arena work_;
    ArenaGuard guard_;
    CMPIContext* ctx_;
};

// The status for an MI whose table lacks `slot`.
CMPIStatus missingSlot(const char* slot);

// True when the MI object has a function table.
bool miHasTable(const void* mi) noexcept;

// The table of an MI of type MI, or nullptr.
template <class MI>
auto tableOf(void* mi) noexcept -> decltype(static_cast<MI*>(mi)->ft) {
    return mi != nullptr ? static_cast<MI*>(mi)->ft : nullptr;
}

// cleanup with an empty context, as sfcb does.
CMPIStatus callCleanup(void* mi, ProviderKind kind, bool terminating);
CMPIStatus callEnableIndications(void* mi, const CMPIContext* ctx);
CMPIStatus callDisableIndications(void* mi);

}  // namespace orv::host::detail
