// "Orvane_LatchedHealthState" and "Orvane_RollupHealthState": the latched
// records and the host-wide roll-up as instances. The same class is the
// IP-changed indication provider; its first initialize starts both monitor
// threads and a terminating cleanup stops them.
#include <strings.h>
#include <syslog.h>

#include <cstdio>
#include <cstdlib>

#include <cmpi/CmpiDateTime.h>

#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

constexpr const char* kRollupName = "Orvane Rollup Health State";
constexpr std::size_t kEventIdSize = 16;

const char* kLatchedKeys[] = {"EventId", nullptr};
const char* kRollupKeys[] = {"Name", nullptr};

bool isClass(const CmpiObjectPath& cop, const char* className) {
    const char* requested = cop.getClassName().charPtr();
    return requested != nullptr && ::strcasecmp(requested, className) == 0;
}

struct EventIdText {
    explicit EventIdText(CMPIUint32 id) { std::snprintf(text, sizeof text, "%u", id); }
    char text[kEventIdSize];
};

void MakeLatchedHealthInstance(const CmpiObjectPath& cop, const char** properties, const HealthInfo* record,
                               CmpiResult& rslt) {
    CmpiInstance instance(cop);
    instance.setPropertyFilter(properties, kLatchedKeys);
    instance.setProperty("LatchedClassName", CmpiData(record->className));
    instance.setProperty("LatchedNamespace", CmpiData(record->ns));
    instance.setProperty("EventId", CmpiData(EventIdText(record->eventId).text));
    instance.setProperty("HealthState", CmpiData(record->healthState));
    const CMPIUint64 microseconds = static_cast<CMPIUint64>(record->dateTime) * 1000000ULL;
    instance.setProperty("Timestamp", CmpiData(CmpiDateTime(microseconds, false)));
    rslt.returnData(instance);
}

void returnRollup(const CmpiObjectPath& cop, const char** properties, CmpiResult& rslt) {
    CmpiInstance instance(cop);
    instance.setPropertyFilter(properties, kRollupKeys);
    instance.setProperty("Name", CmpiData(kRollupName));
    instance.setProperty("HealthState", CmpiData(state().rollUpHealthState.load(std::memory_order_relaxed)));
    rslt.returnData(instance);
    rslt.returnDone();
}

// Returns something for every record, in list order, under the lock; done is
// signalled only when there was a record (an empty answer signals nothing).
template <class ReturnOne>
void returnEveryRecord(CmpiResult& rslt, ReturnOne returnOne) {
    LatchedState& s = state();
    OMC::MutexLock lock(s.healthMutex);
    for (const HealthInfo* record : s.healthInfo) {
        returnOne(record);
    }
    if (!s.healthInfo.empty()) {
        rslt.returnDone();
    }
}

using ThreadBody = void* (*)(void*);

// Starts one monitor thread with a context prepared for it; false when the
// thread cannot be created.
bool startThread(CmpiBroker& broker, const CmpiContext& context, ThreadBody body, pthread_t& handle) {
    auto* argument = static_cast<ThreadArgument*>(std::malloc(sizeof(ThreadArgument)));
    if (argument == nullptr) {
        return false;
    }
    argument->broker = broker.getEnc();
    argument->context = broker.prepareAttachThread(context).getEnc();
    return pthread_create(&handle, nullptr, body, argument) == 0;
}

// A monitor thread that cannot be created ends the process.
void StartHealthMonitorThread(CmpiBroker& broker, const CmpiContext& context) {
    if (!startThread(broker, context, HealthMonitorThread, state().healthThread)) {
        syslog(LOG_ERR, "%s failed to start health monitoring thread\n", "StartHealthMonitorThread");
        std::abort();
    }
}

void StartKernelIpMonitorThread(CmpiBroker& broker, const CmpiContext& context) {
    if (!startThread(broker, context, KernelIpMonitorThread, state().kernelIpThread)) {
        syslog(LOG_ERR, "%s failed to start Kernel Ip monitoring thread\n", "StartKernelIpMonitorThread");
        std::abort();
    }
}

}  // namespace

VmLatchedHealthState::VmLatchedHealthState(const CmpiBroker& mbp, const CmpiContext& ctx)
    : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx), CmpiIndicationMI(mbp, ctx) {}

CmpiStatus VmLatchedHealthState::enumInstanceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) {
    if (isClass(cop, kLatchedClass)) {
        const CmpiString nameSpace = cop.getNameSpace();
        const CmpiString className = cop.getClassName();
        returnEveryRecord(rslt, [&](const HealthInfo* record) {
            CmpiObjectPath name(nameSpace, className.charPtr());
            name.setKey("EventId", CmpiData(EventIdText(record->eventId).text));
            rslt.returnData(name);
        });
        return CmpiStatus(CMPI_RC_OK);
    }
    if (isClass(cop, kRollupClass)) {
        CmpiObjectPath name(cop.getNameSpace(), kRollupClass);
        name.setKey("Name", CmpiData(kRollupName));
        rslt.returnData(name);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
    return CmpiStatus(CMPI_RC_ERR_FAILED, "invalid class name");
}

CmpiStatus VmLatchedHealthState::enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                                               const char** properties) {
    if (isClass(cop, kLatchedClass)) {
        returnEveryRecord(rslt, [&](const HealthInfo* record) {
            MakeLatchedHealthInstance(cop, properties, record, rslt);
        });
        return CmpiStatus(CMPI_RC_OK);
    }
    if (isClass(cop, kRollupClass)) {
        returnRollup(cop, properties, rslt);
        return CmpiStatus(CMPI_RC_OK);
    }
    return CmpiStatus(CMPI_RC_ERR_FAILED, "invalid class name");
}

CmpiStatus VmLatchedHealthState::getInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                                             const char** properties) {
    if (isClass(cop, kLatchedClass)) {
        unsigned int eventId = 0;
        if (!GetEventId(cop, &eventId)) {
            return CmpiStatus(CMPI_RC_ERR_FAILED, "failed to get instances");
        }
        LatchedState& s = state();
        OMC::MutexLock lock(s.healthMutex);
        const HealthInfo* record = FindRecordByEventId(eventId);
        if (record == nullptr) {
            return CmpiStatus(CMPI_RC_ERR_FAILED, "failed to get instances");
        }
        MakeLatchedHealthInstance(cop, properties, record, rslt);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
    if (isClass(cop, kRollupClass)) {
        returnRollup(cop, properties, rslt);
        return CmpiStatus(CMPI_RC_OK);
    }
    return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, "invalid class name");
}

CmpiStatus VmLatchedHealthState::initialize(const CmpiContext& ctx) {
    LatchedState& s = state();
    OMC::MutexLock lock(s.healthMutex);
    if (s.threadStarted == 0) {
        StartHealthMonitorThread(*broker, ctx);
        StartKernelIpMonitorThread(*broker, ctx);
    }
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::cleanup(const CmpiContext&, CmpiBoolean terminating) {
    if (!terminating) {
        return CmpiStatus(CMPI_RC_NEVER_UNLOAD);
    }
    LatchedState& s = state();
    OMC::MutexLock lock(s.healthMutex);
    s.shuttingDown = true;
    if (s.threadStarted != 0) {
        s.healthCond.notifyAll();
        lock.release();
        pthread_join(s.kernelIpThread, nullptr);
        pthread_join(s.healthThread, nullptr);
        lock.lock();
    }
    return CmpiStatus(CMPI_RC_OK);
}

int VmLatchedHealthState::isUnloadable() const { return false; }

CmpiStatus VmLatchedHealthState::mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*,
                                          const CmpiObjectPath&) {
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                                 const CmpiObjectPath&, const char*) {
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                                const CmpiObjectPath&, CmpiBoolean) {
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                                  const CmpiObjectPath&, CmpiBoolean) {
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::enableIndications(const CmpiContext&) {
    state().ipIndication.enableIndication();
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus VmLatchedHealthState::disableIndications(const CmpiContext&) {
    state().ipIndication.disableIndication();
    return CmpiStatus(CMPI_RC_OK);
}

}  // namespace VmLatchedHealth
