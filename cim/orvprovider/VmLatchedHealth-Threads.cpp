// The frame of the two monitor threads: attached to the broker, they hold the
// latched health lock for each round and release it only while they wait for
// the next one, or for the broadcast of a terminating cleanup.
#include <sys/time.h>

#include <cstdlib>

#include "PreparedContext.h"
#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

// Waits until now + seconds (wall clock) or a broadcast of healthCond.
void WaitForNextRound(OMC::MutexLock& lock, long seconds) {
    timeval now{};
    gettimeofday(&now, nullptr);
    timespec deadline{};
    deadline.tv_sec = now.tv_sec + seconds;
    deadline.tv_nsec = now.tv_usec * 1000;
    (void)state().healthCond.timedWait(lock, deadline);
}

}  // namespace

void* RunMonitorThread(void* arg, MonitorRound round, long seconds) {
    auto* argument = static_cast<ThreadArgument*>(arg);
    CmpiBroker broker(argument->broker);
    const CmpiContext context(argument->context);
    std::free(argument);
    try {
        broker.attachThread(context);
    } catch (const CmpiStatus&) {
    }
    LatchedState& s = state();
    {
        OMC::MutexLock lock(s.healthMutex);
        ++s.threadStarted;
        while (!s.shuttingDown) {
            round(broker, context);
            WaitForNextRound(lock, seconds);
        }
        --s.threadStarted;
    }
    releasePreparedContext(context);
    return nullptr;
}

}  // namespace VmLatchedHealth
