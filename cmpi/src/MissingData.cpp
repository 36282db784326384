#include "MissingData.h"

#include <cmpi/CmpiStatus.h>

namespace cmpibinding {

CmpiData dataOrMissing(const CMPIData& d, const CMPIStatus& st, const char* name) {
    if (st.rc == CMPI_RC_OK) {
        return CmpiData(d);
    }
    if (st.rc == CMPI_RC_ERR_NOT_FOUND || st.rc == CMPI_RC_ERR_NO_SUCH_PROPERTY) {
        CMPIData missing = d;
        missing.type = CMPI_null;
        missing.state = CMPI_notFound;
        return CmpiData(missing);
    }
    if (st.msg == nullptr && name != nullptr) {
        throw CmpiStatus(st.rc, name);
    }
    throw CmpiStatus(st);
}

}  // namespace cmpibinding
