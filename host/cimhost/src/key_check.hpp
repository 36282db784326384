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

// Throws CimError(CIM_ERR_INVALID_PARAMETER) for the faults above and returns the
// path's class. Paths of classes the repository does not know in `nameSpace` are not
// checked (nullptr).
const repository::ClassDecl* checkInstanceName(const repository::ClassRepository& classes,
                                               std::string_view nameSpace, const cimxml::ObjectPathModel& model);

// The class's only key; nullptr when the class is unknown (nullptr) or has no key or
// several.
const repository::PropertyDecl* soleKeyOf(const repository::ClassDecl* cls);

}  // namespace orv::cimhost::detail
