// Typed access to the parameters of an intrinsic method call. A parameter of the wrong
// kind, or one the operation does not know, is the client's error: CimError with
// CIM_ERR_INVALID_PARAMETER.
#pragma once

#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/cimxml/request.hpp"

namespace orv::cimxml {

// Throws unless every parameter of the request is one of `known` (any case).
void checkParameterNames(const CimRequest& request, std::initializer_list<std::string_view> known);

// VALUE "true" / "false" in any case; `fallback` when absent or null.
bool boolParam(const CimRequest& request, std::string_view name, bool fallback);
// VALUE text; nullopt when absent or null.
std::optional<std::string> stringParam(const CimRequest& request, std::string_view name);
// CLASSNAME; nullopt when absent or null.
std::optional<std::string> classNameParam(const CimRequest& request, std::string_view name);
// VALUE.ARRAY of property names; nullopt (every property) when absent or null.
std::optional<std::vector<std::string>> propertyListParam(const CimRequest& request,
                                                          std::string_view name);
// INSTANCENAME (or a VALUE.REFERENCE to an instance); required.
const ObjectPathModel& instanceNameParam(const CimRequest& request, std::string_view name);
// CLASSNAME or INSTANCENAME; required. A class name comes back without keys.
ObjectPathModel objectNameParam(const CimRequest& request, std::string_view name);
// INSTANCE; required.
const InstanceModel& instanceParam(const CimRequest& request, std::string_view name);
// VALUE.NAMEDINSTANCE; required.
const NamedInstanceModel& namedInstanceParam(const CimRequest& request, std::string_view name);

}  // namespace orv::cimxml
