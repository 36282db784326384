#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiStatus.h>
#include <cmpi/CmpiString.h>

#include "Check.h"
#include "GlobalBroker.h"

using cmpibinding::checked;

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

// The value's type must be the element type. Brokers store a value of any other
// type only when it is CMPI_chars or CMPI_null (as a string, as a null element),
// so those two are checked first; for the others the broker's own check is
// enough, and a failed store is answered as a mismatch when the types differ.
CmpiArrayIdx& CmpiArrayIdx::operator=(const CmpiData& v) {
    const CMPIType type = v.getType();
    if ((type == CMPI_chars || type == CMPI_null) && array_.getSimpleType() != type) {
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    }
    CMPIArray* a = array_.getEnc();
    const CMPIStatus st = a->ft->setElementAt(a, index_, &v.getEncData().value, type);
    if (st.rc != CMPI_RC_OK) [[unlikely]] {
        if (array_.getSimpleType() != type) {
            throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
        }
        cmpibinding::throwStatus(st);
    }
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
