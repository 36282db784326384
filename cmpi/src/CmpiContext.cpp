#include <cmpi/CmpiContext.h>

#include <cmpimacs.h>

#include "Check.h"

const char* const CmpiContext::invocationFlags = CMPIInvocationFlags;

CmpiData CmpiContext::getEntry(const char* name) const {
    CMPIContext* ctx = getEnc();
    return CmpiData(cmpibinding::checked([&](CMPIStatus* st) { return ctx->ft->getEntry(ctx, name, st); }));
}

bool CmpiContext::hasThreadMemoryRelease() const { return CMHasHostExtensions(getEnc()) != 0; }

void CmpiContext::releaseThreadMemory() const {
    if (hasThreadMemoryRelease()) {
        cmpibinding::throwOnError(CMReleaseThreadMemory(getEnc()));
    }
}
