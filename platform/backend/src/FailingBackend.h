// The substitute in place when the run-time choice failed: every call fails
// as the real libraries fail, carrying the reason where the call has room.
#pragma once

#include <memory>
#include <string>

#include "orv/platform/backend/Backend.h"

namespace orv::platform {

std::unique_ptr<Backend> makeFailingBackend(std::string reason);

} // namespace orv::platform
