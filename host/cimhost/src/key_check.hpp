// Checks of the keys of an instance name a request carries, against the class: a
// key the class does not declare as a key, a key given twice, a KEYVALUE whose
// VALUETYPE or TYPE does not fit the key's declared type, or an instance name
// without any key of a class that has keys, is the client's error
// (CIM_ERR_INVALID_PARAMETER). The keys that pass reach the providers as sent: a
// provider may find its instance by some of them.
#pragma once

#include <string>
#include <string_view>

#include "orv/cimxml/request.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost::detail {

// Throws CimError(CIM_ERR_INVALID_PARAMETER) for the faults above. Paths of classes
// the repository does not know in `nameSpace` are not checked.
void checkInstanceName(const repository::ClassRepository& classes, std::string_view nameSpace,
                       const cimxml::ObjectPathModel& model);

// The name of the class's only key; empty when the class is unknown or has no key
// or several.
std::string soleKeyName(const repository::ClassRepository& classes, std::string_view nameSpace,
                        std::string_view className);

}  // namespace orv::cimhost::detail
