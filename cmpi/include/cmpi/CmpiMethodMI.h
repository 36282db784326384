// CmpiMethodMI: base of method providers. The default refuses the call with
// CMPI_RC_ERR_NOT_SUPPORTED.
#ifndef ORV_CMPI_CMPIMETHODMI_H
#define ORV_CMPI_CMPIMETHODMI_H

#include <cmpi/CmpiArgs.h>
#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiFactory.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiResult.h>

class CmpiMethodMI : virtual public CmpiBaseMI {
public:
    CmpiMethodMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    virtual CmpiStatus invokeMethod(const CmpiContext& ctx, CmpiResult& rslt,
                                    const CmpiObjectPath& ref, const char* methodName,
                                    const CmpiArgs& in, CmpiArgs& out);

    static CMPIStatus driveInvokeMethod(CMPIMethodMI* mi, const CMPIContext* eCtx,
                                        const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                        const char* methodName, const CMPIArgs* eIn,
                                        CMPIArgs* eOut);
};

#endif
