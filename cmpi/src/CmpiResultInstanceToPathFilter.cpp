#include <cmpi/CmpiResultInstanceToPathFilter.h>

void CmpiResultInstanceToPathFilter::returnData(const CmpiData& data) { target_.returnData(data); }

void CmpiResultInstanceToPathFilter::returnData(const CmpiInstance& inst) {
    target_.returnData(inst.getObjectPath());
}

void CmpiResultInstanceToPathFilter::returnData(const CmpiObjectPath& path) { target_.returnData(path); }

void CmpiResultInstanceToPathFilter::returnDone() { target_.returnDone(); }
