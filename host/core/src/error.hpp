// CMPIError: an extended error report with every field of the 2.0 table.
#pragma once

#include <string>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIErrorFT kErrorFT;

struct ErrorImpl {
    CMPIErrorType type = UnknownErrorType;
    std::string otherType;
    std::string owningEntity;
    std::string messageId;
    std::string message;
    CMPIErrorSeverity severity = ErrorSevUnknown;
    CMPIErrorProbableCause cause = ErrorProbCauseUnknown;
    std::string causeDescription;
    std::string source;
    CMPIErrorSrcFormat sourceFormat = CMPIErrSrcUnknown;
    std::string otherSourceFormat;
    CMPIrc statusCode = CMPI_RC_OK;
    std::string statusCodeDescription;
    CMPIArray* recommendedActions = nullptr;  // parent-owned copies
    CMPIArray* messageArguments = nullptr;

    ErrorImpl() = default;
    ErrorImpl(const ErrorImpl& other);
    ~ErrorImpl();
};

CMPIError* newError(ErrorImpl fields, Owner owner);
CMPIError* cloneError(const CMPIError* error, Owner owner);

}  // namespace orv::host::detail
