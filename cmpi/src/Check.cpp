#include "Check.h"

#include <cmpi/CmpiStatus.h>

namespace cmpibinding {

void throwStatus(const CMPIStatus& st) { throw CmpiStatus(st); }

}  // namespace cmpibinding
