#include <cmpi/CmpiIndicationMI.h>

#include "Dispatch.h"

using cmpibinding::dispatch;

CmpiIndicationMI::CmpiIndicationMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {
    indicationMI = this;
}

CmpiStatus CmpiIndicationMI::authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                             const CmpiObjectPath&, const char*) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*, const CmpiObjectPath&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                            const CmpiObjectPath&, CmpiBoolean) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                              const CmpiObjectPath&, CmpiBoolean) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::enableIndications(const CmpiContext&) { return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED); }

CmpiStatus CmpiIndicationMI::disableIndications(const CmpiContext&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMPIStatus CmpiIndicationMI::driveAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                  const CMPISelectExp* eSe, const char* className,
                                                  const CMPIObjectPath* eOp, const char* owner) {
    return dispatch<CmpiIndicationMI>(mi, "authorizeFilter", [&](CmpiIndicationMI& p) {
        return p.authorizeFilter(CmpiContext(eCtx), CmpiSelectExp(eSe), className, CmpiObjectPath(eOp), owner);
    });
}

CMPIStatus CmpiIndicationMI::driveMustPoll(CMPIIndicationMI* mi, const CMPIContext* eCtx, const CMPISelectExp* eSe,
                                           const char* className, const CMPIObjectPath* eOp) {
    return dispatch<CmpiIndicationMI>(mi, "mustPoll", [&](CmpiIndicationMI& p) {
        return p.mustPoll(CmpiContext(eCtx), CmpiSelectExp(eSe), className, CmpiObjectPath(eOp));
    });
}

CMPIStatus CmpiIndicationMI::driveActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                 const CMPISelectExp* eSe, const char* className,
                                                 const CMPIObjectPath* eOp, CMPIBoolean first) {
    return dispatch<CmpiIndicationMI>(mi, "activateFilter", [&](CmpiIndicationMI& p) {
        return p.activateFilter(CmpiContext(eCtx), CmpiSelectExp(eSe), className, CmpiObjectPath(eOp), first);
    });
}

CMPIStatus CmpiIndicationMI::driveDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                   const CMPISelectExp* eSe, const char* className,
                                                   const CMPIObjectPath* eOp, CMPIBoolean last) {
    return dispatch<CmpiIndicationMI>(mi, "deActivateFilter", [&](CmpiIndicationMI& p) {
        return p.deActivateFilter(CmpiContext(eCtx), CmpiSelectExp(eSe), className, CmpiObjectPath(eOp), last);
    });
}

CMPIStatus CmpiIndicationMI::driveEnableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx) {
    return dispatch<CmpiIndicationMI>(mi, "enableIndications",
                                      [&](CmpiIndicationMI& p) { return p.enableIndications(CmpiContext(eCtx)); });
}

CMPIStatus CmpiIndicationMI::driveDisableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx) {
    return dispatch<CmpiIndicationMI>(mi, "disableIndications",
                                      [&](CmpiIndicationMI& p) { return p.disableIndications(CmpiContext(eCtx)); });
}
