#include <cmpi/CmpiDateTime.h>

#include "Check.h"
#include "GlobalBroker.h"

using cmpibinding::checked;
using cmpibinding::requireBroker;

namespace {

CMPIDateTime* newNow() {
    const CMPIBroker* b = requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newDateTime(b, st); });
}

CMPIDateTime* newFromBinary(CMPIUint64 binTime, CMPIBoolean interval) {
    const CMPIBroker* b = requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newDateTimeFromBinary(b, binTime, interval, st); });
}

CMPIDateTime* newFromChars(const char* text) {
    const CMPIBroker* b = requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newDateTimeFromChars(b, text, st); });
}

}  // namespace

CmpiDateTime::CmpiDateTime() : CmpiObject(newNow()) {}

CmpiDateTime::CmpiDateTime(const CmpiDateTime& other)
    : CmpiObject(other.isNull() ? nullptr : newFromBinary(other.getDateTime(), other.isInterval())) {}

CmpiDateTime::CmpiDateTime(const char* utcTime) : CmpiObject(newFromChars(utcTime)) {}

CmpiDateTime::CmpiDateTime(const CMPIUint64 binTime, const CmpiBoolean interval)
    : CmpiObject(newFromBinary(binTime, interval)) {}

CmpiBoolean CmpiDateTime::isInterval() const {
    CMPIDateTime* dt = getEnc();
    return checked([&](CMPIStatus* st) { return dt->ft->isInterval(dt, st); });
}

CMPIUint64 CmpiDateTime::getDateTime() const {
    CMPIDateTime* dt = getEnc();
    return checked([&](CMPIStatus* st) { return dt->ft->getBinaryFormat(dt, st); });
}

CmpiString CmpiDateTime::getStringFormat() const {
    CMPIDateTime* dt = getEnc();
    return CmpiString(checked([&](CMPIStatus* st) { return dt->ft->getStringFormat(dt, st); }));
}
