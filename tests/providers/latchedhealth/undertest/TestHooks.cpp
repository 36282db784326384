// Entry points that the latched health tests call in their own build of the
// provider family: one health pass or one IP check on the caller's thread,
// with the lock held as the monitor threads hold it, and what the tests need to
// know of the threads. The product library exports none of these.
#include <cmpi/CmpiBroker.h>

#include "VmLatchedHealth.h"

using VmLatchedHealth::state;

#define HOOK extern "C" __attribute__((visibility("default")))


HOOK void VmLatchedHealthTest_RunPass(const CMPIBroker* mb, const CMPIContext* ctx) {
    CmpiBroker broker(mb);
    OMC::MutexLock lock(state().healthMutex);
    VmLatchedHealth::RunHealthPass(broker, CmpiContext(ctx));
}

HOOK void VmLatchedHealthTest_RunIpCheck(const CMPIBroker* mb, const CMPIContext* ctx) {
    CmpiBroker broker(mb);
    OMC::MutexLock lock(state().healthMutex);
    VmLatchedHealth::RunKernelIpCheck(broker, CmpiContext(ctx));
}

HOOK unsigned long long VmLatchedHealthTest_CompletedPasses() {
    OMC::MutexLock lock(state().healthMutex);
    return state().completedPasses;
}

HOOK unsigned VmLatchedHealthTest_ThreadsRunning() {
    OMC::MutexLock lock(state().healthMutex);
    return state().threadStarted;
}

