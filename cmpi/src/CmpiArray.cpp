#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiStatus.h>
#include <cmpi/CmpiString.h>

#include "Check.h"
#include "GlobalBroker.h"

using cmpibinding::checked;
using cmpibinding::throwOnError;

namespace {

CMPIArray* newBrokerArray(CMPICount max, CMPIType elementType) {
    const CMPIBroker* b = cmpibinding::requireBroker();
    return checked([&](CMPIStatus* st) { return b->eft->newArray(b, max, elementType, st); });
}

}  // namespace

CmpiArray::CmpiArray(CMPICount max, CMPIType elementType) : CmpiObject(newBrokerArray(max, elementType)) {}

CMPICount CmpiArray::size() const {
    if (isNull()) {
        return 0;
    }
    CMPIArray* a = getEnc();
    return checked([&](CMPIStatus* st) { return a->ft->getSize(a, st); });
}

CMPIType CmpiArray::getSimpleType() const {
    CMPIArray* a = getEnc();
    return checked([&](CMPIStatus* st) { return a->ft->getSimpleType(a, st); });
}

CmpiArrayIdx& CmpiArrayIdx::operator=(const CmpiData& v) {
    if (array_.getSimpleType() != v.getType()) {
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    }
    CMPIArray* a = array_.getEnc();
    throwOnError(a->ft->setElementAt(a, index_, &v.getEncData().value, v.getType()));
    return *this;
}

CmpiData CmpiArrayIdx::getData() const {
    CMPIArray* a = array_.getEnc();
    return CmpiData(checked([&](CMPIStatus* st) { return a->ft->getElementAt(a, index_, st); }));
}

CmpiArrayIdx::operator CmpiString() const { return getData(); }
CmpiArrayIdx::operator const char*() const { return getData(); }
CmpiArrayIdx::operator CmpiDateTime() const { return getData(); }
CmpiArrayIdx::operator CmpiInstance() const { return getData(); }
CmpiArrayIdx::operator CmpiObjectPath() const { return getData(); }
CmpiArrayIdx::operator CMPISint8() const { return getData(); }
CmpiArrayIdx::operator CMPISint16() const { return getData(); }
CmpiArrayIdx::operator CMPISint32() const { return getData(); }
CmpiArrayIdx::operator CMPISint64() const { return getData(); }
CmpiArrayIdx::operator unsigned char() const { return getData(); }
CmpiArrayIdx::operator unsigned short() const { return getData(); }
CmpiArrayIdx::operator CMPIUint32() const { return getData(); }
CmpiArrayIdx::operator CMPIUint64() const { return getData(); }
CmpiArrayIdx::operator CMPIReal32() const { return getData(); }
CmpiArrayIdx::operator CMPIReal64() const { return getData(); }
