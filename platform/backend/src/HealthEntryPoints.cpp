// Hardware health elements, answered by the selected substitute.
#include "orv/platform/HealthElements.h"
#include "orv/platform/backend/Selector.h"

namespace orv::platform {

std::vector<HealthElement> healthElementsOf(const std::string& watchedClass)
{
    Backend& backend = activeBackend();
    backend.beginBatch();
    HealthBackend* health = backend.health();
    if (health == nullptr) {
        return {};
    }
    return health->elements(watchedClass);
}

} // namespace orv::platform
