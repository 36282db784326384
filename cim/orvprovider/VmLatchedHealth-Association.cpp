// "Orvane_LatchedHealthAssociation": from a latched health state to the
// element whose health was latched. Lookups go one way only, from the latched
// state; a request from any other class is answered with nothing.
#include <strings.h>

#include <cstdio>

#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

constexpr std::size_t kExplanationSize = 80;

}  // namespace

VmLatchedHealthAssociation::VmLatchedHealthAssociation(const CmpiBroker& mbp, const CmpiContext& ctx)
    : CmpiBaseMI(mbp, ctx), OMC::SimpleAssociationMI(mbp, ctx) {}

// The association class, result class and roles are not examined.
CmpiStatus VmLatchedHealthAssociation::doReferences(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                                                    const char*, const char*, const char*, const char*) {
    CmpiInstance association(CmpiObjectPath(path.getNameSpace(), kAssociationClass));
    const char* className = path.getClassName().charPtr();
    if (className == nullptr || ::strcasecmp(className, kLatchedClass) != 0) {
        // The explanation is built for nobody: such requests simply find nothing.
        char explanation[kExplanationSize];
        std::snprintf(explanation, sizeof explanation, "lookups only supported for dependents of %s class\n",
                      kLatchedClass);
        (void)explanation;
        return CmpiStatus(CMPI_RC_OK);
    }
    unsigned int eventId = 0;
    if (!GetEventId(path, &eventId)) {
        return CmpiStatus(CMPI_RC_ERR_FAILED, "Invalid event id");
    }
    association.setProperty("Antecedent", CmpiData(path));
    bool returned = false;
    {
        LatchedState& s = state();
        OMC::MutexLock lock(s.healthMutex);
        HealthInfo* record = FindRecordByEventId(eventId);
        if (record != nullptr) {
            CmpiObjectPath element(record->ns, record->className);
            if (SetCopInfo(record, element)) {
                association.setProperty("Dependent", CmpiData(element));
                rslt.returnData(association);
                returned = true;
            }
        }
    }
    if (!returned) {
        return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, "Requested event id not found");
    }
    rslt.returnDone();
    return CmpiStatus(CMPI_RC_OK);
}

int VmLatchedHealthAssociation::isUnloadable() const { return false; }

}  // namespace VmLatchedHealth
