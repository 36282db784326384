// CmpiStatus: the outcome of every provider operation, and the exception type
// that binding calls and providers throw on failure.
#ifndef ORV_CMPI_CMPISTATUS_H
#define ORV_CMPI_CMPISTATUS_H

#include <cmpi/CmpiDefs.h>

#include <string>

class CmpiStatus {
public:
    // A status carrying the broker's return code and message (if any).
    CmpiStatus(const CMPIStatus st);
    // A status with the given code and no message.
    CmpiStatus(const CMPIrc rc);
    // A status with the given code and message text.
    CmpiStatus(const CMPIrc rc, const char* msg);

    CMPIrc rc() const { return rc_; }
    // The message text, or null when the status carries none.
    const char* msg() const { return hasMsg_ ? msg_.c_str() : nullptr; }

    // The raw status handed back to the broker; the message becomes a broker
    // string owned by the current invocation.
    CMPIStatus status() const;

private:
    CMPIrc rc_;
    bool hasMsg_;
    std::string msg_;
};

#endif
