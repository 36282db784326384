// The heartbeat indication provider. From the moment the provider is
// initialised, a thread of its own delivers one Orvane_CIMHeartbeat every
// theHEARTBEAT_INTERVAL seconds, whether or not anyone subscribed, until the
// broker terminates the provider. Filter and enable calls change nothing.
#include <pthread.h>
#include <sys/time.h>
#include <syslog.h>
#include <unistd.h>

#include <cstdlib>
#include <ctime>

#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiIndicationMI.h>
#include <cmpi/CmpiInstance.h>
#include <omc/Condition.h>
#include <omc/Mutex.h>

#include "PreparedContext.h"
#include "Heartbeat-Config.h"
#include "Heartbeat-Deadline.h"

namespace Heartbeat {

// Process-wide state of the one heartbeat thread.
OMC::Mutex heartbeatMutex;     // guards the flags below and the thread's waits
OMC::Condition heartbeatCond;  // wakes the thread early at shutdown
bool threadStarted = false;    // set and cleared by the thread while it runs
bool shuttingDown = false;     // set once by a terminating cleanup, never cleared
pthread_t thread;

void* heartBeatThread(void* arg);

namespace {

constexpr const char* kNamespace = "root/cimv2";
constexpr const char* kClassName = "Orvane_CIMHeartbeat";
constexpr const char* kStartFailure = "Failed to start heartbeat indication thread";
constexpr std::size_t kHostNameLength = 80;
constexpr CMPIUint64 kMicrosecondsPerSecond = 1000000;

// A thread was created and nobody has joined it yet. Guarded by
// heartbeatMutex. The thread sets threadStarted only once it runs, so a
// terminating cleanup that comes before that still finds a thread to stop
// and join here: the library must not be unloaded under a running thread.
bool threadJoinable = false;

// What the starter hands the thread (two pointers: 8 bytes on a 32-bit build),
// malloc'ed, freed by the thread on entry.
struct StartRecord {
    const CMPIBroker* broker;
    CMPIContext* context;  // from prepareAttachThread, released by the thread at its end
};

// The indication instance, with the host name set once per thread run.
CmpiInstance newHeartbeat() {
    CmpiInstance heartbeat(CmpiObjectPath(kNamespace, kClassName));
    char hostName[kHostNameLength] = {};
    (void)gethostname(hostName, sizeof hostName - 1);
    heartbeat.setProperty("hostname", CmpiData(static_cast<const char*>(hostName)));
    return heartbeat;
}

void releaseDateTime(const CmpiDateTime& when) {
    CMPIDateTime* dt = when.getEnc();
    if (dt != nullptr) {
        (void)dt->ft->release(dt);
    }
}

// One cycle's indication: this heartbeat's stamp and the current time.
void sendHeartbeat(CmpiBroker& broker, const CmpiContext& context, CmpiInstance& heartbeat, CMPIUint32 stamp) {
    const CmpiDateTime when(static_cast<CMPIUint64>(std::time(nullptr)) * kMicrosecondsPerSecond, false);
    heartbeat.setProperty("stamp", CmpiData(stamp));
    heartbeat.setProperty("IndicationTime", CmpiData(when));
    try {
        broker.deliverIndication(context, kNamespace, heartbeat);
    } catch (const CmpiStatus&) {
        syslog(LOG_ERR, "Failed to deliver indication\n");
    }
    releaseDateTime(when);
}

// The heartbeat loop. The mutex is held except while waiting, so a cleanup
// waits for at most one delivery before its broadcast reaches the wait. Any
// exception other than a failed delivery unlocks and leaves the loop.
void beat(CmpiBroker& broker, const CmpiContext& context, CmpiInstance& heartbeat) {
    OMC::MutexLock lock(heartbeatMutex);
    // Set under the mutex: initialize and cleanup read it under the mutex.
    threadStarted = true;
    for (CMPIUint32 counter = 0; !shuttingDown; ++counter) {
        sendHeartbeat(broker, context, heartbeat, counter);
        timeval now{};
        gettimeofday(&now, nullptr);
        // Timeout, broadcast or spurious wake-up: the loop test decides.
        (void)heartbeatCond.timedWait(lock, heartbeatDeadline(now, theHEARTBEAT_INTERVAL));
    }
    threadStarted = false;
}

[[noreturn]] void failToStart() {
    syslog(LOG_ERR, "%s", kStartFailure);
    throw CmpiStatus(CMPI_RC_ERR_FAILED, kStartFailure);
}

// Starts the thread; heartbeatMutex is held by the caller.
void startThread(CmpiBroker& broker, const CmpiContext& ctx) {
    auto* record = static_cast<StartRecord*>(std::malloc(sizeof(StartRecord)));
    if (record == nullptr) {
        failToStart();
    }
    record->broker = broker.getEnc();
    record->context = broker.prepareAttachThread(ctx).getEnc();
    if (pthread_create(&thread, nullptr, heartBeatThread, record) != 0) {
        releasePreparedContext(CmpiContext(record->context));
        std::free(record);
        failToStart();
    }
    threadJoinable = true;
}

}  // namespace

void* heartBeatThread(void* arg) {
    auto* record = static_cast<StartRecord*>(arg);
    CmpiBroker broker(record->broker);
    const CmpiContext context(record->context);
    std::free(record);
    try {
        CmpiInstance heartbeat = newHeartbeat();
        beat(broker, context, heartbeat);
    } catch (...) {
        // Nothing to report to: the thread ends, as the broker would end it.
    }
    releasePreparedContext(context);
    return nullptr;
}

class HeartbeatProvider : public CmpiIndicationMI {
public:
    HeartbeatProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiIndicationMI(mbp, ctx) {}

    CmpiStatus initialize(const CmpiContext& ctx) override {
        LoadHeartBeatConfig();
        CmpiBroker& mb = *broker;
        OMC::MutexLock lock(heartbeatMutex);
        if (!threadStarted && !threadJoinable) {
            startThread(mb, ctx);
        }
        return CmpiStatus(CMPI_RC_OK);
    }

    // Terminating: stops the thread and returns once it has ended. Otherwise
    // the library must stay loaded while the thread runs.
    CmpiStatus cleanup(const CmpiContext& /*ctx*/, CmpiBoolean terminating) override {
        if (!terminating) {
            return CmpiStatus(CMPI_RC_NEVER_UNLOAD);
        }
        OMC::MutexLock lock(heartbeatMutex);
        shuttingDown = true;
        if (threadJoinable) {  // covers threadStarted, and a thread not yet running
            heartbeatCond.notifyAll();
            const pthread_t running = thread;
            threadJoinable = false;
            lock.release();  // the thread needs the mutex to leave its wait
            pthread_join(running, nullptr);
            lock.lock();
        }
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*, const CmpiObjectPath&,
                               const char*) override {
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*, const CmpiObjectPath&) override {
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*, const CmpiObjectPath&,
                              CmpiBoolean) override {
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*, const CmpiObjectPath&,
                                CmpiBoolean) override {
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus enableIndications(const CmpiContext&) override { return CmpiStatus(CMPI_RC_OK); }
    CmpiStatus disableIndications(const CmpiContext&) override { return CmpiStatus(CMPI_RC_OK); }
};

}  // namespace Heartbeat

CMProviderBase(Orvane_CIMHeartbeat);

CMIndicationMIFactory(Heartbeat::HeartbeatProvider, Orvane_CIMHeartbeat)
