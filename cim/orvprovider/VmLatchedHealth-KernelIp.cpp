// The kernel IP monitor: every 30 seconds it asks the IP-change detector to
// look for replaced addresses and send the indications, under the latched
// health lock, so that a check never overlaps a health pass.
#include <syslog.h>

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

void* KernelIpMonitorThread(void* arg) { return RunMonitorThread(arg, RunKernelIpCheck, kKernelIpPeriodSeconds); }

}  // namespace VmLatchedHealth
