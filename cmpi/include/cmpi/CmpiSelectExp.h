// CmpiSelectExp: the select expression of an indication filter.
#ifndef ORV_CMPI_CMPISELECTEXP_H
#define ORV_CMPI_CMPISELECTEXP_H

#include <cmpi/CmpiObject.h>

class CmpiSelectExp : public CmpiObject {
public:
    explicit CmpiSelectExp(const CMPISelectExp* se) : CmpiObject(se) {}

    // The query text of the filter.
    CmpiString getString() const;

    CMPISelectExp* getEnc() const { return static_cast<CMPISelectExp*>(enc); }
};

#endif
