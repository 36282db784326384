// CmpiBroker: the up-calls a provider makes into the broker.
#ifndef ORV_CMPI_CMPIBROKER_H
#define ORV_CMPI_CMPIBROKER_H

#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiEnumeration.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObject.h>
#include <cmpi/CmpiObjectPath.h>

class CmpiBroker : public CmpiObject {
public:
    explicit CmpiBroker(const CMPIBroker* b) : CmpiObject(b) {}

    // A context for a thread the provider starts; hand it to the thread.
    CmpiContext prepareAttachThread(const CmpiContext& ctx);
    // Called first in the started thread with the prepared context.
    void attachThread(const CmpiContext& ctx);
    // Called last in the started thread; the broker releases the context.
    void detachThread(const CmpiContext& ctx);

    void deliverIndication(const CmpiContext& ctx, const char* ns, const CmpiInstance& ind);

    CmpiEnumeration enumInstanceNames(const CmpiContext& ctx, const CmpiObjectPath& op);
    CmpiEnumeration enumInstances(const CmpiContext& ctx, const CmpiObjectPath& op,
                                  const char** properties);
    CmpiInstance getInstance(const CmpiContext& ctx, const CmpiObjectPath& op,
                             const char** properties);
    CmpiObjectPath createInstance(const CmpiContext& ctx, const CmpiObjectPath& op,
                                  const CmpiInstance& inst);
    void setInstance(const CmpiContext& ctx, const CmpiObjectPath& op, const CmpiInstance& inst,
                     const char** properties);
    void deleteInstance(const CmpiContext& ctx, const CmpiObjectPath& op);

    // Whether op's class is className or one of its subclasses.
    CmpiBoolean classPathIsA(const CmpiObjectPath& op, const char* className);

    CMPIBroker* getEnc() const { return static_cast<CMPIBroker*>(enc); }
};

#endif
