// The machine's firmware identity, answered by the selected substitute.
#include "orv/platform/SystemIdentity.h"
#include "orv/platform/backend/Selector.h"

namespace orv::platform {

SystemIdentity systemIdentity()
{
    Backend& backend = activeBackend();
    backend.beginBatch();
    return backend.host().systemIdentity();
}

} // namespace orv::platform
