// CmpiIndicationMI: base of indication providers. Every operation's default
// refuses the call with CMPI_RC_ERR_NOT_SUPPORTED.
//
// The parameter named ns receives the indication class name of the filter's
// query (what the CMPI table passes there); op carries the namespace.
#ifndef ORV_CMPI_CMPIINDICATIONMI_H
#define ORV_CMPI_CMPIINDICATIONMI_H

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiFactory.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiSelectExp.h>

class CmpiIndicationMI : virtual public CmpiBaseMI {
public:
    CmpiIndicationMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    virtual CmpiStatus authorizeFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                       const char* ns, const CmpiObjectPath& op,
                                       const char* user);
    virtual CmpiStatus mustPoll(const CmpiContext& ctx, const CmpiSelectExp& se, const char* ns,
                                const CmpiObjectPath& op);
    virtual CmpiStatus activateFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                      const char* ns, const CmpiObjectPath& op, CmpiBoolean first);
    virtual CmpiStatus deActivateFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                        const char* ns, const CmpiObjectPath& op, CmpiBoolean last);
    virtual CmpiStatus enableIndications(const CmpiContext& ctx);
    virtual CmpiStatus disableIndications(const CmpiContext& ctx);

    // Dispatchers, in the order of the indication function table.
    static CMPIStatus driveAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                           const CMPISelectExp* eSe, const char* className,
                                           const CMPIObjectPath* eOp, const char* owner);
    static CMPIStatus driveMustPoll(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                    const CMPISelectExp* eSe, const char* className,
                                    const CMPIObjectPath* eOp);
    static CMPIStatus driveActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                          const CMPISelectExp* eSe, const char* className,
                                          const CMPIObjectPath* eOp, CMPIBoolean first);
    static CMPIStatus driveDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                            const CMPISelectExp* eSe, const char* className,
                                            const CMPIObjectPath* eOp, CMPIBoolean last);
    static CMPIStatus driveEnableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx);
    static CMPIStatus driveDisableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx);
};

#endif
