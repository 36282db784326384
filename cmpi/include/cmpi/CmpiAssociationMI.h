// CmpiAssociationMI: base of association providers. Every operation's
// default refuses the call with CMPI_RC_ERR_NOT_SUPPORTED.
#ifndef ORV_CMPI_CMPIASSOCIATIONMI_H
#define ORV_CMPI_CMPIASSOCIATIONMI_H

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiFactory.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiResult.h>

class CmpiAssociationMI : virtual public CmpiBaseMI {
public:
    CmpiAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    virtual CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& op, const char* assocClass,
                                   const char* resultClass, const char* role,
                                   const char* resultRole, const char** properties);
    virtual CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt,
                                       const CmpiObjectPath& op, const char* assocClass,
                                       const char* resultClass, const char* role,
                                       const char* resultRole);
    virtual CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt,
                                  const CmpiObjectPath& op, const char* resultClass,
                                  const char* role, const char** properties);
    virtual CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& op, const char* resultClass,
                                      const char* role);

    // Dispatchers, in the order of the association function table.
    static CMPIStatus driveAssociators(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                       const char* assocClass, const char* resultClass,
                                       const char* role, const char* resultRole,
                                       const char** properties);
    static CMPIStatus driveAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                           const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                           const char* assocClass, const char* resultClass,
                                           const char* role, const char* resultRole);
    static CMPIStatus driveReferences(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                      const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                      const char* resultClass, const char* role,
                                      const char** properties);
    static CMPIStatus driveReferenceNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                          const char* resultClass, const char* role);
};

#endif
