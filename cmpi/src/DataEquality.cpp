#include "DataEquality.h"

#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiString.h>

#include <cstring>
#include <optional>

namespace cmpibinding {

namespace {

bool isNull(const CMPIData& d) { return (d.state & CMPI_nullValue) != 0 || d.type == CMPI_null; }

std::optional<const char*> textOf(const CMPIData& d) {
    if (d.type == CMPI_chars) return d.value.chars != nullptr ? d.value.chars : "";
    if (d.type == CMPI_string) {
        const char* s = CmpiString(d.value.string).charPtr();
        return s != nullptr ? s : "";
    }
    return std::nullopt;
}

struct Integer {
    bool negative;
    CMPIUint64 magnitude;
    bool operator==(const Integer&) const = default;
};

Integer fromSigned(CMPISint64 v) {
    return v < 0 ? Integer{true, CMPIUint64(0) - static_cast<CMPIUint64>(v)} : Integer{false, CMPIUint64(v)};
}

std::optional<Integer> integerOf(const CMPIData& d) {
    switch (d.type) {
        case CMPI_uint8: return Integer{false, d.value.uint8};
        case CMPI_uint16: return Integer{false, d.value.uint16};
        case CMPI_uint32: return Integer{false, d.value.uint32};
        case CMPI_uint64: return Integer{false, d.value.uint64};
        case CMPI_sint8: return fromSigned(d.value.sint8);
        case CMPI_sint16: return fromSigned(d.value.sint16);
        case CMPI_sint32: return fromSigned(d.value.sint32);
        case CMPI_sint64: return fromSigned(d.value.sint64);
        default: return std::nullopt;
    }
}

bool sameTypedValue(const CMPIData& a, const CMPIData& b) {
    if (a.type != b.type) return false;
    switch (a.type) {
        case CMPI_boolean: return (a.value.boolean != 0) == (b.value.boolean != 0);
        case CMPI_char16: return a.value.char16 == b.value.char16;
        case CMPI_real32: return a.value.real32 == b.value.real32;
        case CMPI_real64: return a.value.real64 == b.value.real64;
        case CMPI_ref: return CmpiObjectPath(a.value.ref) == CmpiObjectPath(b.value.ref);
        case CMPI_dateTime: {
            CmpiDateTime x(a.value.dateTime);
            CmpiDateTime y(b.value.dateTime);
            return x.getDateTime() == y.getDateTime() && x.isInterval() == y.isInterval();
        }
        default: return std::memcmp(&a.value, &b.value, sizeof a.value) == 0;
    }
}

}  // namespace

bool dataEquals(const CMPIData& a, const CMPIData& b) {
    if (isNull(a) || isNull(b)) return isNull(a) && isNull(b);
    auto ta = textOf(a);
    auto tb = textOf(b);
    if (ta || tb) return ta && tb && std::strcmp(*ta, *tb) == 0;
    auto ia = integerOf(a);
    auto ib = integerOf(b);
    if (ia || ib) return ia && ib && *ia == *ib;
    return sameTypedValue(a, b);
}

}  // namespace cmpibinding
