#include <cmpi/CmpiResult.h>

#include "AbiValue.h"
#include "Check.h"

using cmpibinding::throwOnError;

void CmpiResult::returnData(const CmpiData& data) {
    const CMPIData& d = data.getEncData();
    throwOnError(getEnc()->ft->returnData(getEnc(), cmpibinding::valuePointer(d), d.type));
}

void CmpiResult::returnData(const CmpiInstance& inst) {
    throwOnError(getEnc()->ft->returnInstance(getEnc(), inst.getEnc()));
}

void CmpiResult::returnData(const CmpiObjectPath& path) {
    throwOnError(getEnc()->ft->returnObjectPath(getEnc(), path.getEnc()));
}

void CmpiResult::returnDone() { throwOnError(getEnc()->ft->returnDone(getEnc())); }
