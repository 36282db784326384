// CmpiContext: the invocation context the broker passes with every call.
#ifndef ORV_CMPI_CMPICONTEXT_H
#define ORV_CMPI_CMPICONTEXT_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>

class CmpiContext : public CmpiObject {
public:
    explicit CmpiContext(const CMPIContext* ctx) : CmpiObject(ctx) {}

    // Name of the entry holding the invocation flags (CMPIFlags bits).
    static const char* const invocationFlags;

    // The entry's value; a missing entry throws the broker's status.
    CmpiData getEntry(const char* name) const;

    // Frees what the broker allocated for the calling thread so far. Long-running
    // provider threads call it after each unit of work, with the context they
    // attached with. Only the embedded host offers this; with any other broker
    // (sfcb's context table ends before it) the call does nothing.
    void releaseThreadMemory() const;
    // Whether the broker behind this context offers releaseThreadMemory().
    bool hasThreadMemoryRelease() const;

    CMPIContext* getEnc() const { return static_cast<CMPIContext*>(enc); }

protected:
    CmpiContext() = default;
};

#endif
