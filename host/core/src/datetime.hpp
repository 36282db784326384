// CMPIDateTime: a point in time (microseconds since 1970-01-01 00:00:00 UTC)
// or an interval (microseconds), with the CIM string forms
//   point:    "yyyymmddhhmmss.mmmmmmsutc"  (s = '+' or '-', utc = offset minutes)
//   interval: "ddddddddhhmmss.mmmmmm:000"
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIDateTimeFT kDateTimeFT;

struct DateTimeImpl {
    CMPIUint64 micros = 0;
    bool interval = false;
};

// Parses either string form; empty for anything malformed.
std::optional<DateTimeImpl> parseDateTime(std::string_view text);
// The string form (points in UTC, offset "+000").
std::string formatDateTime(const DateTimeImpl& value);

CMPIDateTime* newDateTime(CMPIUint64 micros, bool interval, Owner owner);
// The current time.
CMPIDateTime* newDateTimeNow(Owner owner);
CMPIDateTime* cloneDateTime(const CMPIDateTime* dateTime, Owner owner);
DateTimeImpl* dateTimeImpl(const CMPIDateTime* dateTime) noexcept;
// formatDateTime of one of ours, "" otherwise.
std::string dateTimeText(const CMPIDateTime* dateTime);

}  // namespace orv::host::detail
