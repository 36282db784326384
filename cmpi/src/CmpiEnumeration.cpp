#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiEnumeration.h>

#include "Check.h"

using cmpibinding::checked;

CmpiBoolean CmpiEnumeration::hasNext() const {
    CMPIEnumeration* e = getEnc();
    return checked([&](CMPIStatus* st) { return e->ft->hasNext(e, st); });
}

CmpiData CmpiEnumeration::getNext() {
    CMPIEnumeration* e = getEnc();
    return CmpiData(checked([&](CMPIStatus* st) { return e->ft->getNext(e, st); }));
}

CmpiData CmpiEnumeration::toArray() const {
    CMPIEnumeration* e = getEnc();
    CMPIArray* array = checked([&](CMPIStatus* st) { return e->ft->toArray(e, st); });
    return CmpiData(CmpiArray(array));
}
