// CmpiDateTime: a CIM date-time, either a point in time (microseconds since
// 1970-01-01 00:00:00 UTC) or an interval (a duration in microseconds).
#ifndef ORV_CMPI_CMPIDATETIME_H
#define ORV_CMPI_CMPIDATETIME_H

#include <cmpi/CmpiObject.h>
#include <cmpi/CmpiString.h>

class CmpiDateTime : public CmpiObject {
public:
    // The current time.
    CmpiDateTime();
    explicit CmpiDateTime(const CMPIDateTime* dt) : CmpiObject(dt) {}
    // A new broker date-time with the same value and interval flag.
    CmpiDateTime(const CmpiDateTime& other);
    CmpiDateTime& operator=(const CmpiDateTime& other) = default;
    // From the CIM text form "yyyymmddhhmmss.mmmmmmsutc" or the interval form
    // "ddddddddhhmmss.mmmmmm:000". Throws on a malformed text.
    CmpiDateTime(const char* utcTime);
    // From binary microseconds; interval selects a duration over a point in time.
    CmpiDateTime(const CMPIUint64 binTime, const CmpiBoolean interval);

    CmpiBoolean isInterval() const;
    // Binary microseconds.
    CMPIUint64 getDateTime() const;
    // The CIM text form.
    CmpiString getStringFormat() const;

    CMPIDateTime* getEnc() const { return static_cast<CMPIDateTime*>(enc); }
};

#endif
