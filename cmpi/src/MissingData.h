// Reads of properties and arguments answer a missing name with a value
// marked not-found instead of throwing.
#ifndef ORV_CMPI_SRC_MISSINGDATA_H
#define ORV_CMPI_SRC_MISSINGDATA_H

#include <cmpi/CmpiData.h>

namespace cmpibinding {

// d when st is OK; a null-typed not-found value when the broker reported the
// name missing; otherwise throws st, with name as message when st has none.
CmpiData dataOrMissing(const CMPIData& d, const CMPIStatus& st, const char* name);

}  // namespace cmpibinding

#endif
