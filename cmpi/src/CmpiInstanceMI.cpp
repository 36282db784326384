#include <cmpi/CmpiInstanceMI.h>

#include <cmpi/CmpiResultPathToInstanceFilter.h>

#include "Dispatch.h"

using cmpibinding::dispatch;

CmpiInstanceMI::CmpiInstanceMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {
    instanceMI = this;
}

CmpiStatus CmpiInstanceMI::enumInstanceNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::enumInstances(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::getInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::createInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                          const CmpiInstance&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::setInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const CmpiInstance&,
                                       const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::deleteInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::execQuery(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                     const char*) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMPIStatus CmpiInstanceMI::driveEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                                  const CMPIResult* eRslt, const CMPIObjectPath* eCop) {
    return dispatch<CmpiInstanceMI>(mi, "enumInstanceNames", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.enumInstanceNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop));
    });
}

CMPIStatus CmpiInstanceMI::driveEnumInstances(CMPIInstanceMI* mi, const CMPIContext* eCtx, const CMPIResult* eRslt,
                                              const CMPIObjectPath* eCop, const char** properties) {
    return dispatch<CmpiInstanceMI>(mi, "enumInstances", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        CmpiResultPathToInstanceFilter instancesOnly(rslt);
        return p.enumInstances(CmpiContext(eCtx), instancesOnly, CmpiObjectPath(eCop), properties);
    });
}

CMPIStatus CmpiInstanceMI::driveGetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx, const CMPIResult* eRslt,
                                            const CMPIObjectPath* eCop, const char** properties) {
    return dispatch<CmpiInstanceMI>(mi, "getInstance", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        CmpiResultPathToInstanceFilter instancesOnly(rslt);
        return p.getInstance(CmpiContext(eCtx), instancesOnly, CmpiObjectPath(eCop), properties);
    });
}

CMPIStatus CmpiInstanceMI::driveCreateInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                               const CMPIInstance* eInst) {
    return dispatch<CmpiInstanceMI>(mi, "createInstance", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.createInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), CmpiInstance(eInst));
    });
}

CMPIStatus CmpiInstanceMI::driveSetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx, const CMPIResult* eRslt,
                                            const CMPIObjectPath* eCop, const CMPIInstance* eInst,
                                            const char** properties) {
    return dispatch<CmpiInstanceMI>(mi, "setInstance", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.setInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), CmpiInstance(eInst), properties);
    });
}

CMPIStatus CmpiInstanceMI::driveDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eCop) {
    return dispatch<CmpiInstanceMI>(mi, "deleteInstance", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.deleteInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop));
    });
}

CMPIStatus CmpiInstanceMI::driveExecQuery(CMPIInstanceMI* mi, const CMPIContext* eCtx, const CMPIResult* eRslt,
                                          const CMPIObjectPath* eCop, const char* query, const char* language) {
    return dispatch<CmpiInstanceMI>(mi, "execQuery", [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.execQuery(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), language, query);
    });
}
