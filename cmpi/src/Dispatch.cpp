#include "Dispatch.h"

#include <syslog.h>

namespace cmpibinding {

CMPIStatus failedStatus(const char* miName, const char* operation, const char* text) {
    syslog(LOG_ERR, "%s: %s failed: %s", miName != nullptr ? miName : "", operation, text);
    return CmpiStatus(CMPI_RC_ERR_FAILED, text).status();
}

}  // namespace cmpibinding
