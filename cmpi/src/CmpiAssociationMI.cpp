#include <cmpi/CmpiAssociationMI.h>

#include "Dispatch.h"

using cmpibinding::dispatch;

CmpiAssociationMI::CmpiAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {
    associationMI = this;
}

CmpiStatus CmpiAssociationMI::associators(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                          const char*, const char*, const char*, const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::associatorNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                              const char*, const char*, const char*) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::references(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                         const char*, const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::referenceNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                             const char*) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMPIStatus CmpiAssociationMI::driveAssociators(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                               const char* assocClass, const char* resultClass, const char* role,
                                               const char* resultRole, const char** properties) {
    return dispatch<CmpiAssociationMI>(mi, "associators", [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.associators(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), assocClass, resultClass, role,
                             resultRole, properties);
    });
}

CMPIStatus CmpiAssociationMI::driveAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                                   const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                                   const char* assocClass, const char* resultClass,
                                                   const char* role, const char* resultRole) {
    return dispatch<CmpiAssociationMI>(mi, "associatorNames", [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.associatorNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), assocClass, resultClass, role,
                                 resultRole);
    });
}

CMPIStatus CmpiAssociationMI::driveReferences(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                              const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                              const char* resultClass, const char* role, const char** properties) {
    return dispatch<CmpiAssociationMI>(mi, "references", [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.references(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), resultClass, role, properties);
    });
}

CMPIStatus CmpiAssociationMI::driveReferenceNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                                  const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                                  const char* resultClass, const char* role) {
    return dispatch<CmpiAssociationMI>(mi, "referenceNames", [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.referenceNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), resultClass, role);
    });
}
