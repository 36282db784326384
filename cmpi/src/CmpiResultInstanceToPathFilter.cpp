#include <cmpi/CmpiResultInstanceToPathFilter.h>

void CmpiResultInstanceToPathFilter::returnData(const CmpiData& data) {
    // A path handed over as a reference value is delivered as the path it is.
    if (data.getType() == CMPI_ref && !data.isNullValue()) {
        target_.returnData(static_cast<CmpiObjectPath>(data));
        return;
    }
    target_.returnData(data);
}

void CmpiResultInstanceToPathFilter::returnData(const CmpiInstance& inst) {
    target_.returnData(inst.getObjectPath());
}

void CmpiResultInstanceToPathFilter::returnData(const CmpiObjectPath& path) { target_.returnData(path); }

void CmpiResultInstanceToPathFilter::returnDone() { target_.returnDone(); }
