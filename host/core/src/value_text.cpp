#include "value_text.hpp"

#include <cstdio>

#include "datetime.hpp"
#include "object_path.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

std::string realText(double value) {
    char buffer[40];
    std::snprintf(buffer, sizeof buffer, "%.17g", value);
    return buffer;
}

bool isQuoted(CMPIType type) noexcept {
    return type == CMPI_string || type == CMPI_dateTime || type == CMPI_ref;
}

}  // namespace

std::string valueText(const CMPIData& data) {
    if ((data.state & CMPI_nullValue) != 0) {
        return {};
    }
    const CMPIValue& v = data.value;
    switch (data.type) {
    case CMPI_boolean: return v.boolean != 0 ? "true" : "false";
    case CMPI_char16: return std::to_string(v.char16);
    case CMPI_uint8: return std::to_string(v.uint8);
    case CMPI_uint16: return std::to_string(v.uint16);
    case CMPI_uint32: return std::to_string(v.uint32);
    case CMPI_uint64: return std::to_string(v.uint64);
    case CMPI_sint8: return std::to_string(v.sint8);
    case CMPI_sint16: return std::to_string(v.sint16);
    case CMPI_sint32: return std::to_string(v.sint32);
    case CMPI_sint64: return std::to_string(v.sint64);
    case CMPI_real32: return realText(v.real32);
    case CMPI_real64: return realText(v.real64);
    case CMPI_string: {
        const char* text = stringText(v.string);
        return text != nullptr ? text : "";
    }
    case CMPI_dateTime: return dateTimeText(v.dateTime);
    case CMPI_ref: {
        ObjectPathImpl* path = objectPathImpl(v.ref);
        return path != nullptr ? objectPathText(*path) : "";
    }
    default: return {};
    }
}

std::string keyText(const CMPIData& data) {
    std::string text = valueText(data);
    if (!isQuoted(data.type)) {
        return text;
    }
    std::string quoted = "\"";
    for (char c : text) {
        if (c == '"' || c == '\\') {
            quoted += '\\';
        }
        quoted += c;
    }
    quoted += '"';
    return quoted;
}

}  // namespace orv::host::detail
