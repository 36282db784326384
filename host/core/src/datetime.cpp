#include "datetime.hpp"

#include <sys/time.h>

#include <cstdio>
#include <ctime>

#include "string.hpp"

namespace orv::host::detail {

namespace {

constexpr CMPIUint64 kMicrosPerSecond = 1000000ULL;
constexpr CMPIUint64 kSecondsPerDay = 86400ULL;
constexpr std::size_t kLength = 25;

// The decimal number in text[pos, pos + count), or empty when not all digits.
std::optional<long long> digits(std::string_view text, std::size_t pos, std::size_t count) {
    long long value = 0;
    for (std::size_t i = pos; i < pos + count; ++i) {
        if (text[i] < '0' || text[i] > '9') {
            return std::nullopt;
        }
        value = value * 10 + (text[i] - '0');
    }
    return value;
}

std::optional<DateTimeImpl> parseInterval(std::string_view text) {
    auto days = digits(text, 0, 8);
    auto hours = digits(text, 8, 2);
    auto minutes = digits(text, 10, 2);
    auto seconds = digits(text, 12, 2);
    auto micros = digits(text, 15, 6);
    if (!days || !hours || !minutes || !seconds || !micros || text.substr(22, 3) != "000" ||
        *hours > 23 || *minutes > 59 || *seconds > 59) {
        return std::nullopt;
    }
    CMPIUint64 total = static_cast<CMPIUint64>(*days) * kSecondsPerDay +
                       static_cast<CMPIUint64>(*hours * 3600 + *minutes * 60 + *seconds);
    return DateTimeImpl{total * kMicrosPerSecond + static_cast<CMPIUint64>(*micros), true};
}

std::optional<DateTimeImpl> parsePoint(std::string_view text) {
    auto year = digits(text, 0, 4);
    auto month = digits(text, 4, 2);
    auto day = digits(text, 6, 2);
    auto hours = digits(text, 8, 2);
    auto minutes = digits(text, 10, 2);
    auto seconds = digits(text, 12, 2);
    auto micros = digits(text, 15, 6);
    auto offset = digits(text, 22, 3);
    if (!year || !month || !day || !hours || !minutes || !seconds || !micros || !offset ||
        *month < 1 || *month > 12 || *day < 1 || *day > 31 || *hours > 23 || *minutes > 59 ||
        *seconds > 60 || *year < 1970) {
        return std::nullopt;
    }
    std::tm parts{};
    parts.tm_year = static_cast<int>(*year - 1900);
    parts.tm_mon = static_cast<int>(*month - 1);
    parts.tm_mday = static_cast<int>(*day);
    parts.tm_hour = static_cast<int>(*hours);
    parts.tm_min = static_cast<int>(*minutes);
    parts.tm_sec = static_cast<int>(*seconds);
    long long utc = static_cast<long long>(timegm(&parts));
    long long shift = *offset * 60;
    utc += text[21] == '+' ? -shift : shift;  // local = UTC + offset
    if (utc < 0) {
        return std::nullopt;
    }
    return DateTimeImpl{static_cast<CMPIUint64>(utc) * kMicrosPerSecond + static_cast<CMPIUint64>(*micros), false};
}

CMPIStatus release(CMPIDateTime* dateTime) { return releaseAny(dateTime, &kDateTimeFT); }

CMPIDateTime* clone(const CMPIDateTime* dateTime, CMPIStatus* rc) {
    CMPIDateTime* copy = cloneDateTime(dateTime, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPIUint64 getBinaryFormat(const CMPIDateTime* dateTime, CMPIStatus* rc) {
    DateTimeImpl* dt = dateTimeImpl(dateTime);
    setRc(rc, dt != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return dt != nullptr ? dt->micros : 0;
}

CMPIString* getStringFormat(const CMPIDateTime* dateTime, CMPIStatus* rc) {
    DateTimeImpl* dt = dateTimeImpl(dateTime);
    if (dt == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newString(formatDateTime(*dt), Owner::Arena);
}

CMPIBoolean isInterval(const CMPIDateTime* dateTime, CMPIStatus* rc) {
    DateTimeImpl* dt = dateTimeImpl(dateTime);
    setRc(rc, dt != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return static_cast<CMPIBoolean>(dt != nullptr && dt->interval);
}

}  // namespace

const CMPIDateTimeFT kDateTimeFT = {1, release, clone, getBinaryFormat, getStringFormat, isInterval};

std::optional<DateTimeImpl> parseDateTime(std::string_view text) {
    if (text.size() != kLength || text[14] != '.') {
        return std::nullopt;
    }
    if (text[21] == ':') {
        return parseInterval(text);
    }
    if (text[21] == '+' || text[21] == '-') {
        return parsePoint(text);
    }
    return std::nullopt;
}

// The string form has four digits for the year and eight for the days of an
// interval. A binary value beyond them (a point in time after 9999, as a date
// before 1970 gives when its arithmetic wraps below zero; an interval of 10^8 days
// or more) is written as the largest value the form can carry, never as a longer
// or wrapped string.
constexpr CMPIUint64 kLastSecondOf9999 = 253402300799ULL;  // 9999-12-31 23:59:59 UTC
constexpr CMPIUint64 kIntervalDayLimit = 100000000ULL;
constexpr const char* kLatestPoint = "99991231235959.999999+000";
constexpr const char* kLongestInterval = "99999999235959.999999:000";

std::string formatDateTime(const DateTimeImpl& value) {
    char buffer[80];
    CMPIUint64 seconds = value.micros / kMicrosPerSecond;
    auto micros = static_cast<unsigned long>(value.micros % kMicrosPerSecond);
    if (value.interval) {
        CMPIUint64 days = seconds / kSecondsPerDay;
        CMPIUint64 rest = seconds % kSecondsPerDay;
        if (days >= kIntervalDayLimit) {
            return kLongestInterval;
        }
        std::snprintf(buffer, sizeof buffer, "%08llu%02llu%02llu%02llu.%06lu:000",
                      static_cast<unsigned long long>(days),
                      static_cast<unsigned long long>(rest / 3600),
                      static_cast<unsigned long long>(rest / 60 % 60),
                      static_cast<unsigned long long>(rest % 60), micros);
        return buffer;
    }
    if (seconds > kLastSecondOf9999) {
        return kLatestPoint;
    }
    auto time = static_cast<std::time_t>(seconds);
    std::tm parts{};
    gmtime_r(&time, &parts);
    std::snprintf(buffer, sizeof buffer, "%04d%02d%02d%02d%02d%02d.%06lu+000", parts.tm_year + 1900,
                  parts.tm_mon + 1, parts.tm_mday, parts.tm_hour, parts.tm_min, parts.tm_sec, micros);
    return buffer;
}

CMPIDateTime* newDateTime(CMPIUint64 micros, bool interval, Owner owner) {
    return makeObject<CMPIDateTime, DateTimeImpl>(&kDateTimeFT, owner, DateTimeImpl{micros, interval});
}

CMPIDateTime* newDateTimeNow(Owner owner) {
    timeval now{};
    gettimeofday(&now, nullptr);
    CMPIUint64 micros = static_cast<CMPIUint64>(now.tv_sec) * kMicrosPerSecond + static_cast<CMPIUint64>(now.tv_usec);
    return newDateTime(micros, false, owner);
}

DateTimeImpl* dateTimeImpl(const CMPIDateTime* dateTime) noexcept {
    return implOf<DateTimeImpl>(dateTime, &kDateTimeFT);
}

CMPIDateTime* cloneDateTime(const CMPIDateTime* dateTime, Owner owner) {
    DateTimeImpl* dt = dateTimeImpl(dateTime);
    return dt != nullptr ? newDateTime(dt->micros, dt->interval, owner) : nullptr;
}

std::string dateTimeText(const CMPIDateTime* dateTime) {
    DateTimeImpl* dt = dateTimeImpl(dateTime);
    return dt != nullptr ? formatDateTime(*dt) : std::string();
}

}  // namespace orv::host::detail
