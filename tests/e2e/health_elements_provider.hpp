// The test provider of the twelve watched hardware classes (it publishes the
// simulated host's "health" section), loaded beside the project's library by
// the end-to-end latched health tests. Where its library, registration and
// class files are is set by the build (tests/e2e/CMakeLists.txt).
#pragma once

#include <string>
#include <vector>

#include "sfcb_broker.hpp"

namespace orv::e2e {

// orv-cimhost arguments that load it (its library folder, registration and
// classes), to follow the project library's own.
std::vector<std::string> healthElementsHostArgs();

// What a private sfcbd stages to serve it: the library, its registration and
// class files, and the schema files of the four DMTF classes it serves itself,
// which sfcb would otherwise leave out of its repository.
SfcbStaging healthElementsStaging();

}  // namespace orv::e2e
