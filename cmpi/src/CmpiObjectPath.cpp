#include <cmpi/CmpiObjectPath.h>

#include "AbiValue.h"
#include "Check.h"
#include "GlobalBroker.h"

using cmpibinding::checked;
using cmpibinding::requireBroker;
using cmpibinding::throwOnError;
using cmpibinding::valuePointer;

namespace {

CMPIObjectPath* newBrokerPath(const char* ns, const char* cls) {
    const CMPIBroker* b = requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newObjectPath(b, ns, cls, st); });
}

}  // namespace

CmpiObjectPath::CmpiObjectPath(const char* ns, const char* cls) : CmpiObject(newBrokerPath(ns, cls)) {}

CmpiObjectPath::CmpiObjectPath(const CmpiString& ns, const char* cls)
    : CmpiObject(newBrokerPath(ns.charPtr(), cls)) {}

CmpiBoolean CmpiObjectPath::classPathIsA(const char* className) const {
    const CMPIBroker* b = requireBroker();
    CMPIObjectPath* op = getEnc();
    return checked([&](CMPIStatus* st) { return b->eft->classPathIsA(b, op, className, st); });
}

CmpiString CmpiObjectPath::getHostname() const {
    CMPIObjectPath* op = getEnc();
    return CmpiString(checked([&](CMPIStatus* st) { return op->ft->getHostname(op, st); }));
}

void CmpiObjectPath::setHostname(const char* hn) { throwOnError(getEnc()->ft->setHostname(getEnc(), hn)); }

CmpiString CmpiObjectPath::getNameSpace() const {
    CMPIObjectPath* op = getEnc();
    return CmpiString(checked([&](CMPIStatus* st) { return op->ft->getNameSpace(op, st); }));
}

void CmpiObjectPath::setNameSpace(const char* ns) { throwOnError(getEnc()->ft->setNameSpace(getEnc(), ns)); }

CmpiString CmpiObjectPath::getClassName() const {
    CMPIObjectPath* op = getEnc();
    return CmpiString(checked([&](CMPIStatus* st) { return op->ft->getClassName(op, st); }));
}

void CmpiObjectPath::setClassName(const char* cn) { throwOnError(getEnc()->ft->setClassName(getEnc(), cn)); }

unsigned int CmpiObjectPath::getKeyCount() const {
    CMPIObjectPath* op = getEnc();
    return checked([&](CMPIStatus* st) { return op->ft->getKeyCount(op, st); });
}

CmpiData CmpiObjectPath::getKey(const char* name) const {
    CMPIObjectPath* op = getEnc();
    return CmpiData(checked([&](CMPIStatus* st) { return op->ft->getKey(op, name, st); }));
}

CmpiData CmpiObjectPath::getKey(const int index, CmpiString* name) const {
    CMPIObjectPath* op = getEnc();
    CMPIString* keyName = nullptr;
    CmpiData value(checked([&](CMPIStatus* st) {
        return op->ft->getKeyAt(op, static_cast<CMPICount>(index), &keyName, st);
    }));
    if (name != nullptr) {
        *name = CmpiString(static_cast<const CMPIString*>(keyName));
    }
    return value;
}

void CmpiObjectPath::setKey(const char* name, const CmpiData data) {
    const CMPIData& d = data.getEncData();
    throwOnError(getEnc()->ft->addKey(getEnc(), name, valuePointer(d), d.type));
}
