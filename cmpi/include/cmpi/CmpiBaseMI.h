// CmpiBaseMI: the virtual base of every provider object. Each MI class
// (CmpiInstanceMI, CmpiAssociationMI, CmpiIndicationMI, CmpiMethodMI)
// derives from it virtually, so a provider combining several holds one
// CmpiBaseMI and must name CmpiBaseMI(broker, ctx) in its own constructor.
//
// The dispatchers placed in the CMPI function tables are static members of
// these classes. Each wraps the C arguments, calls the provider's virtual
// operation and returns its status. A CmpiStatus thrown by the operation is
// returned as the call's status. Any other exception is answered with
// CMPI_RC_ERR_FAILED carrying the exception's text, and logged at LOG_ERR as
// "<function-table name>: <operation> failed: <text>"; nothing is thrown
// back into the broker.
#ifndef ORV_CMPI_CMPIBASEMI_H
#define ORV_CMPI_CMPIBASEMI_H

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiStatus.h>

#include <cmpift.h>

class CmpiProviderBase;
class CmpiInstanceMI;
class CmpiAssociationMI;
class CmpiIndicationMI;
class CmpiMethodMI;

class CmpiBaseMI {
public:
    CmpiBaseMI(const CmpiBroker& mbp, const CmpiContext& ctx);
    virtual ~CmpiBaseMI();
    CmpiBaseMI(const CmpiBaseMI&) = delete;
    CmpiBaseMI& operator=(const CmpiBaseMI&) = delete;

    // Records the provider name's shared holder and makes this provider's
    // broker the one the binding's object constructors use.
    void setProviderBase(CmpiProviderBase* base);
    CmpiProviderBase* getProviderBase() const { return providerBase; }

    // Called once, right after construction. Default: nothing to do, OK.
    virtual CmpiStatus initialize(const CmpiContext& ctx);
    // Called when the broker unloads the provider or shuts down
    // (terminating). A non-OK answer to a non-terminating cleanup keeps the
    // provider loaded. Default: nothing to do, OK.
    virtual CmpiStatus cleanup(const CmpiContext& ctx, CmpiBoolean terminating);
    // Whether the broker may unload the provider while it runs. Default: yes.
    virtual int isUnloadable() const;

    // The cleanup slot of every function table. The provider object is
    // shared by all MI kinds of one provider name and counts their uses:
    // - not terminating and not unloadable: CMPI_RC_NEVER_UNLOAD, nothing else;
    // - otherwise one use is released; while others remain, OK;
    // - at the last use the object's cleanup runs. A failing non-terminating
    //   cleanup keeps the object (and its use); otherwise the object is
    //   deleted. Cleanup's status is returned.
    template <class MIRecord>
    static CMPIStatus driveBaseCleanup(MIRecord* mi, const CMPIContext* eCtx, CMPIBoolean terminating) {
        return cleanupProvider(static_cast<const void*>(mi->hdl), mi->ft->miName, eCtx, terminating);
    }

    // The interfaces this provider object serves; each MI base registers
    // itself while it is built, so that the dispatchers find it whether the
    // provider inherits it publicly or not. Null for an interface not served.
    CmpiInstanceMI* instanceInterface() const { return instanceMI; }
    CmpiAssociationMI* associationInterface() const { return associationMI; }
    CmpiIndicationMI* indicationInterface() const { return indicationMI; }
    CmpiMethodMI* methodInterface() const { return methodMI; }

protected:
    CmpiBroker* broker;

private:
    friend class CmpiInstanceMI;
    friend class CmpiAssociationMI;
    friend class CmpiIndicationMI;
    friend class CmpiMethodMI;
    CmpiInstanceMI* instanceMI = nullptr;
    CmpiAssociationMI* associationMI = nullptr;
    CmpiIndicationMI* indicationMI = nullptr;
    CmpiMethodMI* methodMI = nullptr;

    static CMPIStatus cleanupProvider(const void* hdl, const char* miName, const CMPIContext* eCtx,
                                      CMPIBoolean terminating);
    CmpiProviderBase* providerBase;
};

#endif
