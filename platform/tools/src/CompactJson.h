// JSON text that stays readable for large fixtures: short values share lines,
// long ones are broken up and indented.
#pragma once

#include <nlohmann/json.hpp>

#include <string>

namespace orv::platform::simgen {

std::string compactJson(const nlohmann::ordered_json& value, size_t width = 100);

} // namespace orv::platform::simgen
