// How orv-cimlistener prints an indication: one line of text or one JSON object.
//
// Text:  CLASS NAME=VALUE NAME=VALUE ...
//   in the order of the INSTANCE's properties. Strings, char16 and datetime values
//   are quoted with JSON escapes (so a line never breaks), booleans are true or
//   false, other values are bare as received,
//   a null value is NULL, an array is [V,V,...], a reference is its object path
//   quoted (//host/namespace:Class.Key="v"), and an embedded instance is expanded
//   as CLASS{NAME=VALUE ...}.
// JSON:  {"class":"CLASS","properties":{"NAME":VALUE,...}}
//   integers and reals are numbers, booleans true/false, null is null, strings,
//   char16, datetime and references are strings, arrays are arrays and embedded
//   instances are nested objects of the same shape.
#pragma once

#include <string>

#include "orv/cimxml/request.hpp"

namespace orv::listener {

std::string formatText(const cimxml::InstanceModel& instance);
std::string formatJson(const cimxml::InstanceModel& instance);

// "//host/namespace:Class.Key=\"v\",Key2=1" (host and namespace when the path has them).
std::string objectPathText(const cimxml::ObjectPathModel& path);

}  // namespace orv::listener
