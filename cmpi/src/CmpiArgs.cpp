#include <cmpi/CmpiArgs.h>
#include <cmpi/CmpiStatus.h>

#include "AbiValue.h"
#include "Check.h"
#include "MissingData.h"
#include "GlobalBroker.h"

using cmpibinding::checked;
using cmpibinding::freshStatus;

namespace {

CMPIArgs* newBrokerArgs() {
    const CMPIBroker* b = cmpibinding::requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newArgs(b, st); });
}


}  // namespace

CmpiArgs::CmpiArgs() : CmpiObject(newBrokerArgs()) {}

unsigned int CmpiArgs::getArgCount() const {
    CMPIArgs* a = getEnc();
    return checked([&](CMPIStatus* st) { return a->ft->getArgCount(a, st); });
}

CmpiData CmpiArgs::getArg(const char* name) const {
    CMPIStatus st = freshStatus();
    CMPIData d = getEnc()->ft->getArg(getEnc(), name, &st);
    return cmpibinding::dataOrMissing(d, st, name);
}

CmpiData CmpiArgs::getArg(const int index, CmpiString* name) const {
    CMPIStatus st = freshStatus();
    CMPIString* argName = nullptr;
    CMPIData d = getEnc()->ft->getArgAt(getEnc(), static_cast<CMPICount>(index), &argName, &st);
    CmpiData value = cmpibinding::dataOrMissing(d, st, nullptr);
    if (name != nullptr) {
        *name = CmpiString(static_cast<const CMPIString*>(argName));
    }
    return value;
}

void CmpiArgs::setArg(const char* name, const CmpiData& data) {
    const CMPIData& d = data.getEncData();
    cmpibinding::throwOnError(getEnc()->ft->addArg(getEnc(), name, cmpibinding::valuePointer(d), d.type));
}
