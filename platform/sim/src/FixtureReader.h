// Turns fixture text into a host model, or a message naming the file, the
// JSON path and the problem.
#pragma once

#include <memory>
#include <string>

#include "HostModel.h"

namespace orv::platform::sim {

struct FixtureResult {
    std::shared_ptr<const HostModel> host;  // null when the fixture was rejected
    std::string error;                      // "<file>: <JSON path>: <problem>"
};

FixtureResult parseFixture(const std::string& text, const std::string& fileName);
FixtureResult readFixtureFile(const std::string& path);

} // namespace orv::platform::sim
