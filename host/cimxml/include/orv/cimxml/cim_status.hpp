// CIM status codes carried in ERROR elements, and the error that carries one.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

namespace orv::cimxml {

// The codes a CIM-XML response uses; they are the same numbers as the CMPI return codes.
enum class CimStatus : int {
    Ok = 0,
    Failed = 1,
    AccessDenied = 2,
    InvalidNamespace = 3,
    InvalidParameter = 4,
    InvalidClass = 5,
    NotFound = 6,
    NotSupported = 7,
    ClassHasChildren = 8,
    ClassHasInstances = 9,
    InvalidSuperclass = 10,
    AlreadyExists = 11,
    NoSuchProperty = 12,
    TypeMismatch = 13,
    QueryLanguageNotSupported = 14,
    InvalidQuery = 15,
    MethodNotAvailable = 16,
    MethodNotFound = 17,
    // The pull operations' codes (DSP0200 1.3).
    InvalidEnumerationContext = 21,
    InvalidOperationTimeout = 22,
    PullHasBeenAbandoned = 23,
    PullCannotBeAbandoned = 24,
    FilteredEnumerationNotSupported = 25,
    ContinuationOnErrorNotSupported = 26,
    ServerLimitsExceeded = 27,
    ServerIsShuttingDown = 28,
};

// "CIM_ERR_NOT_SUPPORTED" and so on; "CIM_ERR_FAILED" for codes it does not know.
std::string_view statusName(int code) noexcept;

// An operation failed with a CIM status; the description goes into the ERROR element.
class CimError : public std::runtime_error {
public:
    CimError(CimStatus status, std::string description)
        : CimError(static_cast<int>(status), std::move(description)) {}
    CimError(int code, std::string description)
        : std::runtime_error(description), code_(code), description_(std::move(description)) {}

    int code() const noexcept { return code_; }
    const std::string& description() const noexcept { return description_; }

private:
    int code_;
    std::string description_;
};

}  // namespace orv::cimxml
