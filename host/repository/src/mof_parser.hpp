// Recursive-descent parser for MOF: pragmas, qualifier declarations and class
// declarations. Instance declarations are refused.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "mof_syntax.hpp"

namespace orv::repository::mof {

// Throws MofError ("file:line: what was expected").
std::vector<Production> parse(std::string_view source, const std::string& fileName);

}  // namespace orv::repository::mof
