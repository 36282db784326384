// A result that turns each delivered object path (a CmpiObjectPath, or a
// CmpiData holding a reference) into an instance of the path's class, on that
// path, carrying the path's keys as properties, restricted to the requested
// property list (keys are kept), and passes that on; instances, other values
// and the end of the answer pass through. Serves enumInstances from a
// provider's enumInstanceNames, and stands between every instance request and
// the broker (CmpiInstanceMI).
#ifndef ORV_CMPI_CMPIRESULTPATHTOINSTANCEFILTER_H
#define ORV_CMPI_CMPIRESULTPATHTOINSTANCEFILTER_H

#include <cmpi/CmpiResult.h>

class CmpiResultPathToInstanceFilter : public CmpiResult {
public:
    // properties: the requested property list (null for all); it must outlive the filter.
    CmpiResultPathToInstanceFilter(CmpiResult& target, const char** properties = nullptr)
        : target_(target), properties_(properties) {}

    void returnData(const CmpiData& data) override;
    void returnData(const CmpiInstance& inst) override;
    void returnData(const CmpiObjectPath& path) override;
    void returnDone() override;

private:
    CmpiResult& target_;
    const char** properties_;
};

#endif
