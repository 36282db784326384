// Request arguments as CMPI objects: object paths and instances built with the broker's
// factory functions, values converted to the types the class declares.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "orv/cimxml/request.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost::detail {

// The path in `nameSpace` (the model's own namespace wins when it has one). Keys take
// the declared type of the key property; keys of classes the repository does not
// know take the type their VALUETYPE suggests. Throws CimError(CIM_ERR_INVALID_PARAMETER)
// for keys that do not fit the class (key_check.hpp) and values that do not fit the
// declared type.
CMPIObjectPath* buildObjectPath(const CMPIBroker* broker, const repository::ClassRepository& classes,
                                std::string_view nameSpace, const cimxml::ObjectPathModel& model);

// An instance of the model's class whose object path is `path`.
CMPIInstance* buildInstance(const CMPIBroker* broker, const repository::ClassRepository& classes,
                            std::string_view nameSpace, const cimxml::InstanceModel& model,
                            const CMPIObjectPath* path);

// The input arguments of `method` from the PARAMVALUEs of a method call, each converted
// to its declared type. Unknown or output-only parameters and values of the wrong kind
// throw CimError(CIM_ERR_INVALID_PARAMETER).
CMPIArgs* buildArgs(const CMPIBroker* broker, const repository::ClassRepository& classes, std::string_view nameSpace,
                    const repository::MethodDecl& method,
                    const std::vector<std::pair<std::string, cimxml::ParamValue>>& params);

}  // namespace orv::cimhost::detail
