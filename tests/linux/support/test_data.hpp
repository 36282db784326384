// Helpers of the replay tests: where the captured answers are, and the errno a
// reader call failed with.
#pragma once

#include <functional>
#include <string>

namespace orv::linuxtest {

// A path under tests/linux/data of the source tree (ORV_SOURCE_DIR, else the
// tree the tests were built from); throws std::runtime_error when that folder is missing.
std::string testData(const std::string& name);
// The errno of the LinuxCallError the call threw; 0 when it returned.
int errorOf(const std::function<void()>& call);

}  // namespace orv::linuxtest
