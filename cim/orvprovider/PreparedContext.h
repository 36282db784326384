// The context a broker prepared for a provider thread (prepareAttachThread) is a
// copy that the thread owns: the thread releases it when it ends.
#pragma once

#include <cmpi/CmpiContext.h>

inline void releasePreparedContext(const CmpiContext& context) {
    CMPIContext* ctx = context.getEnc();
    if (ctx != nullptr) {
        (void)ctx->ft->release(ctx);
    }
}
