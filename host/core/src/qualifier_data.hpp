// Qualifiers from the class repository as CMPIData, for the object path's
// qualifier getters.
#pragma once

#include <cmpidt.h>

#include <string_view>

#include "orv/repository/class_decl.hpp"

namespace orv::host::detail {

// The qualifier list of the class ('c'), a property ('p'), a method ('m') or a
// parameter ('a', element "method.parameter"); nullptr when the element is missing.
const orv::repository::QualifierList* qualifierList(const orv::repository::ClassDecl& cls, char elementKind,
                                                    std::string_view element);
// A scalar qualifier value (strings in the current arena); array values answer
// CMPI_RC_ERR_NOT_SUPPORTED.
CMPIData qualifierData(const orv::repository::Qualifier& qualifier, CMPIrc* rc);

}  // namespace orv::host::detail
