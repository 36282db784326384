// A result that turns each delivered instance into its object path and
// passes that on; paths (also those handed over as reference values) go on as
// paths, other values and the end of the answer pass through.
// Serves enumInstanceNames from a provider's enumInstances.
#ifndef ORV_CMPI_CMPIRESULTINSTANCETOPATHFILTER_H
#define ORV_CMPI_CMPIRESULTINSTANCETOPATHFILTER_H

#include <cmpi/CmpiResult.h>

class CmpiResultInstanceToPathFilter : public CmpiResult {
public:
    explicit CmpiResultInstanceToPathFilter(CmpiResult& target) : target_(target) {}

    void returnData(const CmpiData& data) override;
    void returnData(const CmpiInstance& inst) override;
    void returnData(const CmpiObjectPath& path) override;
    void returnDone() override;

private:
    CmpiResult& target_;
};

#endif
