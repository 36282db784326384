// Release date of a hypervisor image from the build date of its version
// record ("Jul 5 2016").
#include <cctype>
#include <cstdio>
#include <cstring>
#include <ctime>

#include "HypervisorSWID-Version.h"

namespace HypervisorSWID {
namespace {

constexpr std::uint64_t kMicrosecondsPerSecond = 1000000;
constexpr int kFirstYearBeyondOffset = 1901;
constexpr int kTmYearBase = 1900;

// The letter at index, lower-cased; NUL past the end of the name.
char letterAt(const char* name, std::size_t index) {
    for (std::size_t i = 0; i < index; ++i) {
        if (name[i] == '\0') {
            return '\0';
        }
    }
    return static_cast<char>(std::tolower(static_cast<unsigned char>(name[index])));
}

int aMonth(const char* name) {
    switch (letterAt(name, 1)) {
    case 'p': return 3;
    case 'u': return 7;
    default: return 0;
    }
}

int jMonth(const char* name) {
    if (letterAt(name, 1) == 'a') {
        return 0;
    }
    switch (letterAt(name, 2)) {
    case 'n': return 5;
    case 'l': return 6;
    default: return 0;
    }
}

int mMonth(const char* name) {
    switch (letterAt(name, 2)) {
    case 'r': return 2;
    case 'y': return 4;
    default: return 0;
    }
}

}  // namespace

int charToNumMonth(const char* month) {
    switch (month[0]) {
    case 'A': return aMonth(month);
    case 'D': return 11;
    case 'F': return 1;
    case 'J': return jMonth(month);
    case 'M': return mMonth(month);
    case 'N': return 10;
    case 'O': return 9;
    case 'S': return 8;
    default: return 0;
    }
}

bool releaseDateOf(const char* buildDate, std::uint64_t& microseconds) {
    char month[32] = {};
    int day = 0;
    int year = 0;
    if (std::sscanf(buildDate, "%31s %d %d", month, &day, &year) != 3) {
        return false;
    }
    std::tm date{};
    date.tm_mday = day;
    date.tm_mon = charToNumMonth(month);
    date.tm_year = year >= kFirstYearBeyondOffset ? year - kTmYearBase : year;
    date.tm_isdst = 0;
    std::time_t seconds = std::mktime(&date);
    std::tm local{};
    ::localtime_r(&seconds, &local);
    seconds = std::mktime(&local);
    microseconds = static_cast<std::uint64_t>(seconds) * kMicrosecondsPerSecond;
    return true;
}

}  // namespace HypervisorSWID
