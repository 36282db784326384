#include <cmpi/CmpiObject.h>

#include "Check.h"
#include "GlobalBroker.h"

CmpiString CmpiObject::toString() const {
    const CMPIBroker* broker = cmpibinding::requireBroker();
    return CmpiString(cmpibinding::checked([&](CMPIStatus* st) { return broker->eft->toString(broker, enc, st); }));
}

CmpiBoolean CmpiObject::isA(const char* typeName) const {
    const CMPIBroker* broker = cmpibinding::requireBroker();
    return cmpibinding::checked([&](CMPIStatus* st) { return broker->eft->isOfType(broker, enc, typeName, st); });
}
