// CmpiInstanceMI: base of instance providers. Every operation's default
// refuses the call with CMPI_RC_ERR_NOT_SUPPORTED.
//
// The binding's rule for instance requests: while enumInstances or getInstance
// runs, an object path the provider delivers to the result (returnData with a
// CmpiObjectPath, or a CmpiData holding a reference) reaches the broker as an
// instance made from that path: the path's keys as its properties, on that
// path. A broker never sees a path in the answer to an instance request (sfcb
// crashes on one), and the client gets the instance it asked for.
// enumInstanceNames delivers what the provider returns, unchanged.
#ifndef ORV_CMPI_CMPIINSTANCEMI_H
#define ORV_CMPI_CMPIINSTANCEMI_H

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiFactory.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiResult.h>

class CmpiInstanceMI : virtual public CmpiBaseMI {
public:
    CmpiInstanceMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    virtual CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                         const CmpiObjectPath& cop);
    virtual CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt,
                                     const CmpiObjectPath& cop, const char** properties);
    virtual CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& cop, const char** properties);
    virtual CmpiStatus createInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& cop, const CmpiInstance& inst);
    virtual CmpiStatus setInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& cop, const CmpiInstance& inst,
                                   const char** properties);
    virtual CmpiStatus deleteInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& cop);
    virtual CmpiStatus execQuery(const CmpiContext& ctx, CmpiResult& rslt,
                                 const CmpiObjectPath& cop, const char* language,
                                 const char* query);

    // Dispatchers, in the order of the instance function table.
    static CMPIStatus driveEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                             const CMPIResult* eRslt, const CMPIObjectPath* eCop);
    static CMPIStatus driveEnumInstances(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                         const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                         const char** properties);
    static CMPIStatus driveGetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                       const char** properties);
    static CMPIStatus driveCreateInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                          const CMPIInstance* eInst);
    static CMPIStatus driveSetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                       const CMPIInstance* eInst, const char** properties);
    static CMPIStatus driveDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eCop);
    static CMPIStatus driveExecQuery(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                     const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                     const char* query, const char* language);
};

#endif
