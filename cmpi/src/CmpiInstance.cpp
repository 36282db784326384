#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiStatus.h>

#include "AbiValue.h"
#include "Check.h"
#include "MissingData.h"
#include "GlobalBroker.h"

using cmpibinding::checked;
using cmpibinding::freshStatus;
using cmpibinding::throwOnError;

namespace {

CMPIInstance* newBrokerInstance(const CmpiObjectPath& op) {
    const CMPIBroker* b = cmpibinding::requireBroker();
    CMPIObjectPath* path = op.getEnc();
    return checked([&](CMPIStatus* st) { return b->eft->newInstance(b, path, st); });
}


}  // namespace

CmpiInstance::CmpiInstance(const CmpiObjectPath& op) : CmpiObject(newBrokerInstance(op)) {}

CmpiBoolean CmpiInstance::instanceIsA(const char* className) const {
    return getObjectPath().classPathIsA(className);
}

unsigned int CmpiInstance::getPropertyCount() const {
    CMPIInstance* inst = getEnc();
    return checked([&](CMPIStatus* st) { return inst->ft->getPropertyCount(inst, st); });
}

CmpiData CmpiInstance::getProperty(const char* name) const {
    CMPIStatus st = freshStatus();
    CMPIData d = getEnc()->ft->getProperty(getEnc(), name, &st);
    return cmpibinding::dataOrMissing(d, st, name);
}

CmpiData CmpiInstance::getProperty(const int index, CmpiString* name) const {
    CMPIStatus st = freshStatus();
    CMPIString* propName = nullptr;
    CMPIData d = getEnc()->ft->getPropertyAt(getEnc(), static_cast<CMPICount>(index), &propName, &st);
    CmpiData value = cmpibinding::dataOrMissing(d, st, nullptr);
    if (name != nullptr) {
        *name = CmpiString(static_cast<const CMPIString*>(propName));
    }
    return value;
}

void CmpiInstance::setProperty(const char* name, const CmpiData data) {
    const CMPIData& d = data.getEncData();
    throwOnError(getEnc()->ft->setProperty(getEnc(), name, cmpibinding::valuePointer(d), d.type));
}

void CmpiInstance::setPropertyFilter(const char** properties, const char** keys) {
    static const char* noKeys[] = {nullptr};
    throwOnError(getEnc()->ft->setPropertyFilter(getEnc(), properties, keys != nullptr ? keys : noKeys));
}

CmpiObjectPath CmpiInstance::getObjectPath() const {
    CMPIInstance* inst = getEnc();
    return CmpiObjectPath(checked([&](CMPIStatus* st) { return inst->ft->getObjectPath(inst, st); }));
}
