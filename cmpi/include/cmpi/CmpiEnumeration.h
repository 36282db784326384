// CmpiEnumeration: what a broker up-call returned, read one element at a time.
#ifndef ORV_CMPI_CMPIENUMERATION_H
#define ORV_CMPI_CMPIENUMERATION_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>

class CmpiEnumeration : public CmpiObject {
public:
    explicit CmpiEnumeration(const CMPIEnumeration* e) : CmpiObject(e) {}

    CmpiBoolean hasNext() const;
    // The next element; convert it to CmpiInstance or CmpiObjectPath.
    CmpiData getNext();
    // All remaining elements as one array value.
    CmpiData toArray() const;

    CMPIEnumeration* getEnc() const { return static_cast<CMPIEnumeration*>(enc); }
};

#endif
