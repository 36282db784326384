// The kernel IP monitor: every 30 seconds it asks the IP-change detector to
// look for replaced addresses and send the indications, under the latched
// health lock, so that a check never overlaps a health pass.
#include <syslog.h>

#include <cstdlib>
#include <exception>

#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

constexpr long kKernelIpPeriodSeconds = 30;

}  // namespace

void RunKernelIpCheck(CmpiBroker& broker, const CmpiContext& context) {
    try {
        state().ipIndication.testAndSend(context, &broker);
        ReleaseThreadMemory(context);
    } catch (const CmpiStatus&) {
        syslog(LOG_ERR, "Failed testAndSend operation");
    } catch (const std::exception&) {
        syslog(LOG_ERR, "Failed testAndSend operation");
    }
}

void* KernelIpMonitorThread(void* arg) {
    auto* argument = static_cast<ThreadArgument*>(arg);
    CmpiBroker broker(argument->broker);
    const CmpiContext context(argument->context);
    std::free(argument);
    try {
        broker.attachThread(context);
    } catch (const CmpiStatus&) {
    }
    LatchedState& s = state();
    OMC::MutexLock lock(s.healthMutex);
    ++s.threadStarted;
    while (!s.shuttingDown) {
        RunKernelIpCheck(broker, context);
        WaitForNextRound(lock, kKernelIpPeriodSeconds);
    }
    --s.threadStarted;
    return nullptr;
}

}  // namespace VmLatchedHealth
