#include <cmpi/CmpiMethodMI.h>

#include "Dispatch.h"

CmpiMethodMI::CmpiMethodMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {
    methodMI = this;
}

CmpiStatus CmpiMethodMI::invokeMethod(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                      const CmpiArgs&, CmpiArgs&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMPIStatus CmpiMethodMI::driveInvokeMethod(CMPIMethodMI* mi, const CMPIContext* eCtx, const CMPIResult* eRslt,
                                           const CMPIObjectPath* eOp, const char* methodName, const CMPIArgs* eIn,
                                           CMPIArgs* eOut) {
    return cmpibinding::dispatch<CmpiMethodMI>(mi, "invokeMethod", [&](CmpiMethodMI& p) {
        CmpiResult rslt(eRslt);
        CmpiArgs out(eOut);
        return p.invokeMethod(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), methodName, CmpiArgs(eIn), out);
    });
}
