// Golden output files of the end-to-end tests: read them, or rewrite them when
// ORV_UPDATE_GOLDEN is set.
#pragma once

#include <string>

namespace orv::e2e {

std::string readFile(const std::string& path);
// The golden file's text; with ORV_UPDATE_GOLDEN set, `output` is written there first.
std::string goldenText(const std::string& path, const std::string& output);

}  // namespace orv::e2e
