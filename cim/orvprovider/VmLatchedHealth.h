// The latched health state: records of every watched element whose
// HealthState was ever other than OK, the twelve watched classes, and the
// process-wide state that the two monitor threads and the three providers of
// this family share under one mutex.
#pragma once

#include <pthread.h>

#include <atomic>
#include <cstdint>
#include <ctime>
#include <list>
#include <string>
#include <unordered_map>
#include <vector>

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiIndicationMI.h>
#include <cmpi/CmpiInstanceMI.h>
#include <omc/Condition.h>
#include <omc/Mutex.h>
#include <omc/SimpleAssociationMI.h>

#include "KernelIpIndication.h"

namespace VmLatchedHealth {

constexpr CMPIUint16 HEALTH_STATE_UNKNOWN = 0;
constexpr CMPIUint16 HEALTH_STATE_OK = 5;
constexpr CMPIUint16 HEALTH_STATE_DEGRADED_WARNING = 10;
constexpr CMPIUint16 HEALTH_STATE_MINOR_FAILURE = 15;
constexpr CMPIUint16 HEALTH_STATE_MAJOR_FAILURE = 20;
constexpr CMPIUint16 HEALTH_STATE_CRITICAL_FAILURE = 25;
constexpr CMPIUint16 HEALTH_STATE_NON_RECOVERABLE_ERROR = 30;
constexpr CMPIUint16 HEALTH_STATE_DMTF_RESERVED_FIRST = 31;

constexpr const char* kLatchedClass = "Orvane_LatchedHealthState";
constexpr const char* kRollupClass = "Orvane_RollupHealthState";
constexpr const char* kAssociationClass = "Orvane_LatchedHealthAssociation";

struct MonitoredClass {
    const char* cn;
    const char* ns;
};

constexpr unsigned numMonitoredClasses = 12;
extern const MonitoredClass monitoredClasses[numMonitoredClasses];

struct ObjectPathKey {
    char* name;
    char* value;
};

constexpr std::size_t kClassNameSize = 80;
constexpr std::size_t kNameSpaceSize = 32;
constexpr std::size_t kHostNameSize = 80;

struct HealthInfo {
    char className[kClassNameSize];
    char ns[kNameSpaceSize];
    char hostname[kHostNameSize];
    uint32_t copKeyCount;
    ObjectPathKey* copKeys;
    CMPIUint32 eventId;
    CMPIUint16 healthState;
    time_t dateTime;
};

// Where to look first for an element's record: the records whose rebuilt path
// has the same canonical form as the element's path, in list order. A lookup
// still decides a match with the record comparisons, so the first matching
// record of the list wins as in a walk from the front; the index only skips
// records that cannot compare equal.
class RecordIndex {
public:
    // The records to try for cop, in list order; null when cop has a key of
    // another type than string, for which every record must be tried.
    const std::vector<HealthInfo*>* candidates(const CmpiObjectPath& cop, std::string& canonical) const;
    void add(const std::string& canonical, HealthInfo* record) { buckets_[canonical].push_back(record); }
    // The canonical form of a path whose keys are all strings; false otherwise.
    static bool canonicalForm(const CmpiObjectPath& path, std::string& out);

private:
    std::unordered_map<std::string, std::vector<HealthInfo*>> buckets_;
};

// Everything the monitor threads and the providers share, guarded by
// healthMutex. One object per process, built by the library's static
// initialisation and never rebuilt.
struct LatchedState {
    LatchedState() = default;
    // Records live as long as the library: they are freed when it is unloaded.
    ~LatchedState();
    LatchedState(const LatchedState&) = delete;
    LatchedState& operator=(const LatchedState&) = delete;

    OMC::Mutex healthMutex;
    OMC::Condition healthCond;
    std::list<HealthInfo*> healthInfo;
    RecordIndex index;
    CMPIUint32 globalEventID = 0;
    // Read by roll-up requests without the lock: one 16-bit value, kept atomic.
    std::atomic<CMPIUint16> rollUpHealthState{0};
    CMPIUint16 pendingRollUpHealthState = 0;
    uint32_t threadStarted = 0;  // monitor threads running
    bool shuttingDown = false;   // set once by a terminating cleanup
    pthread_t healthThread{};
    pthread_t kernelIpThread{};
    ORV::KernelIpIndication ipIndication;
    // Passes completed since load (read by tests to know a pass has run).
    uint64_t completedPasses = 0;
};

LatchedState& state();

// Completes path (built from info's namespace and class name) with info's host
// name and keys. False when a key cannot be set; aborts on a key entry without
// a name or value.
bool SetCopInfo(HealthInfo* info, CmpiObjectPath& path);

// Frees count key entries and the array that holds them.
void FreeCopKeys(ObjectPathKey* keys, uint32_t count);

// The number in the "EventId" key of path (C library base-10 conversion of
// its leading digits); false when the key is absent or null.
bool GetEventId(const CmpiObjectPath& path, unsigned int* id);

// The first record with the event number, or null. Call with healthMutex held.
HealthInfo* FindRecordByEventId(unsigned int eventId);

// Whether the record is the element's: the class names agree over
// kClassNameSize characters and the path rebuilt from the record equals cop.
bool RecordMatches(HealthInfo* record, const CmpiObjectPath& cop);

// One pass over the watched classes (healthMutex held by the caller).
void RunHealthPass(CmpiBroker& broker, const CmpiContext& context);
// One check for replaced IP addresses (healthMutex held by the caller).
void RunKernelIpCheck(CmpiBroker& broker, const CmpiContext& context);

void* HealthMonitorThread(void* arg);
void* KernelIpMonitorThread(void* arg);

// What a starter hands to a monitor thread; the thread frees it.
struct ThreadArgument {
    CMPIBroker* broker;
    CMPIContext* context;
};

// The body of both monitor threads: attach to the broker with the prepared
// context of arg (freed here), then, holding healthMutex except while waiting,
// run one round and wait on healthCond until now + seconds or a broadcast,
// until shuttingDown is set. threadStarted counts the thread while it runs.
using MonitorRound = void (*)(CmpiBroker& broker, const CmpiContext& context);
void* RunMonitorThread(void* arg, MonitorRound round, long seconds);

// Frees what the broker allocated for the thread so far, where the broker
// offers it; a failure is the caller's to report.
void ReleaseThreadMemory(const CmpiContext& context);

class VmLatchedHealthState : public CmpiInstanceMI, private CmpiIndicationMI {
public:
    VmLatchedHealthState(const CmpiBroker& mbp, const CmpiContext& ctx);

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override;
    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override;
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override;
    CmpiStatus initialize(const CmpiContext& ctx) override;
    CmpiStatus cleanup(const CmpiContext& ctx, CmpiBoolean terminating) override;
    int isUnloadable() const override;

    CmpiStatus mustPoll(const CmpiContext& ctx, const CmpiSelectExp& se, const char* ns,
                        const CmpiObjectPath& op) override;
    CmpiStatus authorizeFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* ns,
                               const CmpiObjectPath& op, const char* user) override;
    CmpiStatus activateFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* ns,
                              const CmpiObjectPath& op, CmpiBoolean first) override;
    CmpiStatus deActivateFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* ns,
                                const CmpiObjectPath& op, CmpiBoolean last) override;
    CmpiStatus enableIndications(const CmpiContext& ctx) override;
    CmpiStatus disableIndications(const CmpiContext& ctx) override;
};

class VmLatchedHealthAssociation : public virtual OMC::SimpleAssociationMI {
public:
    VmLatchedHealthAssociation(const CmpiBroker& mbp, const CmpiContext& ctx);

    CmpiStatus doReferences(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                            const char* assocClass, const char* resultClass, const char* role,
                            const char* resultRole) override;
    int isUnloadable() const override;
};

}  // namespace VmLatchedHealth
