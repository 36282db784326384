// CmpiResult: where an operation delivers what it found. The operations are
// virtual so that a filter (CmpiResultInstanceToPathFilter,
// CmpiResultPathToInstanceFilter, or a provider's own) can stand in for the
// broker's result and pass on what it makes of each delivery.
#ifndef ORV_CMPI_CMPIRESULT_H
#define ORV_CMPI_CMPIRESULT_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObject.h>
#include <cmpi/CmpiObjectPath.h>

class CmpiResult : public CmpiObject {
public:
    explicit CmpiResult(const CMPIResult* r) : CmpiObject(r) {}
    virtual ~CmpiResult() = default;
    CmpiResult(const CmpiResult&) = default;
    CmpiResult& operator=(const CmpiResult&) = default;

    virtual void returnData(const CmpiData& data);
    virtual void returnData(const CmpiInstance& inst);
    virtual void returnData(const CmpiObjectPath& path);
    virtual void returnDone();

    CMPIResult* getEnc() const { return static_cast<CMPIResult*>(enc); }

protected:
    // For filters, which wrap no broker result of their own.
    CmpiResult() = default;
};

#endif
