// The health monitor: every 120 seconds it reads the HealthState of every
// instance of the watched classes through the broker, keeps the worst state of
// the pass as the host's roll-up, and latches every element whose state is not
// OK, as a new record or as an escalation of its record.
#include <syslog.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <new>

#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

constexpr long kHealthPeriodSeconds = 120;

const char* orEmpty(const char* text) { return text != nullptr ? text : ""; }

void logDropped(CMPIUint16 hs, const HealthInfo* info) {
    syslog(LOG_ERR, "Failed to copy object, dropping health state %u for %s\n", hs, info->className);
}

void logKeyAllocationFailure() { syslog(LOG_ERR, "Latched health state failed to allocate memory for object keys\n"); }

char* copyText(const char* text) {
    const std::size_t length = std::strlen(text);
    char* copy = static_cast<char*>(std::malloc(length + 1));
    if (copy == nullptr) {
        throw std::bad_alloc();
    }
    std::memcpy(copy, text, length + 1);
    return copy;
}

// The instance's HealthState; false when the property is absent or null.
bool GetHealthState(const CmpiInstance& instance, CMPIUint16& hs) {
    CmpiData value;
    try {
        value = instance.getProperty("HealthState");
    } catch (const CmpiStatus& status) {
        if (status.rc() == CMPI_RC_ERR_NO_SUCH_PROPERTY || status.rc() == CMPI_RC_ERR_NOT_FOUND) {
            return false;
        }
        throw;
    }
    if (value.isNullValue() || value.isNotFound()) {
        return false;
    }
    hs = static_cast<unsigned short>(value);
    return true;
}

// Raises the record to hs with a new event number when hs is worse.
void UpdateLatchedState(HealthInfo* record, CMPIUint16 hs) {
    LatchedState& s = state();
    if (record->healthState < hs) {
        record->healthState = hs;
        record->eventId = s.globalEventID++;
        record->dateTime = std::time(nullptr);
    }
}

// Copies the keys of cop into info->copKeys (allocated, cleared, count n).
// False when a key is not a string, after freeing what was copied; a key
// without a value ends the process.
bool GetCopKeys(const CmpiObjectPath& cop, HealthInfo* info, ObjectPathKey* keys, unsigned int n) {
    for (unsigned int j = 0; j < n; ++j) {
        CmpiString name;
        const CmpiData value = cop.getKey(static_cast<int>(j), &name);
        if (value.isNullValue() || value.isNotFound()) {
            logKeyAllocationFailure();
            std::abort();
        }
        CmpiString text;
        try {
            text = value;
        } catch (const CmpiStatus&) {
            syslog(LOG_ERR, "%s has a non string key, this in not supported\n", info->className);
            FreeCopKeys(keys, j);
            return false;
        }
        keys[j].name = copyText(orEmpty(name.charPtr()));
        keys[j].value = copyText(orEmpty(text.charPtr()));
    }
    return true;
}

// Hands the copied keys to the record.
void SetCopKeys(HealthInfo* info, ObjectPathKey* keys, unsigned int n) {
    info->copKeyCount = n;
    info->copKeys = keys;
}

void readHostName(const CmpiObjectPath& cop, HealthInfo* info) {
    try {
        const CmpiString host = cop.getHostname();
        std::snprintf(info->hostname, sizeof info->hostname, "%s", host.isNull() ? "NULL" : orEmpty(host.charPtr()));
    } catch (const CmpiStatus&) {
        info->hostname[0] = '\0';
    }
}

// Latches an element never seen before; an element whose keys cannot be
// copied is dropped with a log line.
void CreateRecord(const CmpiObjectPath& cop, CMPIUint16 hs) {
    LatchedState& s = state();
    HealthInfo* info = static_cast<HealthInfo*>(std::calloc(1, sizeof(HealthInfo)));
    if (info == nullptr) {
        throw std::bad_alloc();
    }
    std::snprintf(info->className, sizeof info->className, "%s", orEmpty(cop.getClassName().charPtr()));
    std::snprintf(info->ns, sizeof info->ns, "%s", orEmpty(cop.getNameSpace().charPtr()));
    info->eventId = s.globalEventID++;
    info->healthState = hs;
    info->dateTime = std::time(nullptr);
    readHostName(cop, info);

    const unsigned int n = cop.getKeyCount();
    if (n == 0) {
        logDropped(hs, info);
        std::free(info);
        return;
    }
    auto* keys = static_cast<ObjectPathKey*>(std::calloc(n, sizeof(ObjectPathKey)));
    if (keys == nullptr) {
        logKeyAllocationFailure();
        logDropped(hs, info);
        std::free(info);
        return;
    }
    if (!GetCopKeys(cop, info, keys, n)) {
        logDropped(hs, info);
        std::free(info);
        return;
    }
    SetCopKeys(info, keys, n);

    CmpiObjectPath rebuilt(info->ns, info->className);
    if (!SetCopInfo(info, rebuilt) || rebuilt != cop) {
        std::abort();
    }
    std::string canonical;
    if (RecordIndex::canonicalForm(rebuilt, canonical)) {
        s.index.add(canonical, info);
    }
    s.healthInfo.push_back(info);
}

// Escalates the first record of the element, in list order; false when the
// element has none.
bool LatchKnownElement(const CmpiObjectPath& cop, CMPIUint16 hs) {
    LatchedState& s = state();
    std::string canonical;
    const std::vector<HealthInfo*>* candidates = s.index.candidates(cop, canonical);
    if (candidates == nullptr) {
        for (HealthInfo* record : s.healthInfo) {
            if (RecordMatches(record, cop)) {
                UpdateLatchedState(record, hs);
                return true;
            }
        }
        return false;
    }
    for (HealthInfo* record : *candidates) {
        if (RecordMatches(record, cop)) {
            UpdateLatchedState(record, hs);
            return true;
        }
    }
    return false;
}

void CheckInstance(const CmpiInstance& instance) {
    LatchedState& s = state();
    CMPIUint16 hs = 0;
    if (!GetHealthState(instance, hs)) {
        return;
    }
    if (hs > s.pendingRollUpHealthState) {
        s.pendingRollUpHealthState = hs;
    }
    if (hs == HEALTH_STATE_OK) {
        return;
    }
    const CmpiObjectPath cop = instance.getObjectPath();
    if (!LatchKnownElement(cop, hs)) {
        CreateRecord(cop, hs);
    }
}

// Reads every instance of one watched class; false when the broker could not
// enumerate it.
bool CheckHealthStatus(CmpiBroker& broker, const CmpiContext& context, const char* cn, const char* ns) {
    try {
        CmpiEnumeration instances = broker.enumInstances(context, CmpiObjectPath(ns, cn), nullptr);
        while (instances.hasNext()) {
            const CmpiInstance instance = instances.getNext();
            try {
                CheckInstance(instance);
            } catch (const CmpiStatus&) {
            } catch (const std::bad_alloc&) {
            }
        }
    } catch (const CmpiStatus&) {
        syslog(LOG_ERR, "Failed to check health status of class %s\n", cn);
        return false;
    }
    return true;
}

}  // namespace

void ReleaseThreadMemory(const CmpiContext& context) { context.releaseThreadMemory(); }

void RunHealthPass(CmpiBroker& broker, const CmpiContext& context) {
    LatchedState& s = state();
    s.pendingRollUpHealthState = 0;
    for (const MonitoredClass& watched : monitoredClasses) {
        if (CheckHealthStatus(broker, context, watched.cn, watched.ns)) {
            try {
                ReleaseThreadMemory(context);
            } catch (const CmpiStatus&) {
            }
        }
    }
    s.rollUpHealthState.store(s.pendingRollUpHealthState, std::memory_order_relaxed);
    ++s.completedPasses;
}

void* HealthMonitorThread(void* arg) { return RunMonitorThread(arg, RunHealthPass, kHealthPeriodSeconds); }

}  // namespace VmLatchedHealth
