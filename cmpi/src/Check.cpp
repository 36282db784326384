#include "Check.h"

#include <cmpi/CmpiStatus.h>

namespace cmpibinding {

void throwOnError(const CMPIStatus& st) {
    if (st.rc != CMPI_RC_OK) {
        throw CmpiStatus(st);
    }
}

}  // namespace cmpibinding
