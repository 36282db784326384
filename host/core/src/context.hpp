// CMPIContext: named entries, and this host's extended function table whose
// entry after addEntry frees what the broker allocated for the calling thread.
#pragma once

#include "object.hpp"
#include "value.hpp"

namespace orv::host::detail {

extern const CMPIContextFTExt kContextFT;

CMPIContext* newContext(Owner owner);
// A deep copy of the entries in a new caller-owned context (prepareAttachThread).
CMPIContext* copyContext(const CMPIContext* context);
ValueList* contextImpl(const CMPIContext* context) noexcept;

}  // namespace orv::host::detail
