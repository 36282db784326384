#include "orv/cimxml/cmpi_value.hpp"

#include <charconv>
#include <string>

namespace orv::cimxml {

std::string cmpiString(const CMPIString* text) {
    if (text == nullptr || text->ft == nullptr) {
        return {};
    }
    const char* chars = text->ft->getCharPtr(text, nullptr);
    return chars == nullptr ? std::string() : std::string(chars);
}

std::string_view xmlTypeName(CMPIType type) noexcept {
    switch (type & ~CMPI_ARRAY) {
        case CMPI_boolean: return "boolean";
        case CMPI_char16: return "char16";
        case CMPI_real32: return "real32";
        case CMPI_real64: return "real64";
        case CMPI_uint8: return "uint8";
        case CMPI_uint16: return "uint16";
        case CMPI_uint32: return "uint32";
        case CMPI_uint64: return "uint64";
        case CMPI_sint8: return "sint8";
        case CMPI_sint16: return "sint16";
        case CMPI_sint32: return "sint32";
        case CMPI_sint64: return "sint64";
        case CMPI_string:
        case CMPI_chars:
        case CMPI_charsptr:
        case CMPI_instance: return "string";
        case CMPI_dateTime: return "datetime";
        case CMPI_ref: return "reference";
        default: return {};
    }
}

std::string_view keyValueType(CMPIType type) noexcept {
    if (type == CMPI_boolean) {
        return "boolean";
    }
    if ((type & (CMPI_UINT | CMPI_SINT | CMPI_REAL)) != 0 && (type & CMPI_ARRAY) == 0 &&
        type < CMPI_instance) {
        return "numeric";
    }
    return "string";
}

bool isNullData(const CMPIData& data) noexcept {
    return (data.state & (CMPI_nullValue | CMPI_notFound | CMPI_badValue)) != 0;
}

std::string char16ToUtf8(CMPIChar16 unit) {
    std::string out;
    if (unit >= 0xD800 && unit <= 0xDFFF) {
        unit = 0xFFFD;
    }
    if (unit < 0x80) {
        out += static_cast<char>(unit);
    } else if (unit < 0x800) {
        out += static_cast<char>(0xC0 | (unit >> 6));
        out += static_cast<char>(0x80 | (unit & 0x3F));
    } else {
        out += static_cast<char>(0xE0 | (unit >> 12));
        out += static_cast<char>(0x80 | ((unit >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (unit & 0x3F));
    }
    return out;
}

namespace {

template <typename Number>
std::string numberText(Number value) {
    char buffer[64];
    auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    return std::string(buffer, result.ptr);
}

std::optional<std::string> dateTimeText(const CMPIDateTime* dateTime) {
    if (dateTime == nullptr || dateTime->ft == nullptr) {
        return std::nullopt;
    }
    return cmpiString(dateTime->ft->getStringFormat(dateTime, nullptr));
}

std::optional<std::string> charsText(const char* chars) {
    return chars == nullptr ? std::nullopt : std::optional<std::string>(chars);
}

std::optional<std::string> stringText(const CMPIString* text) {
    return text == nullptr ? std::nullopt : std::optional<std::string>(cmpiString(text));
}

}  // namespace

std::optional<std::string> scalarText(const CMPIData& data) {
    if (isNullData(data)) {
        return std::nullopt;
    }
    const CMPIValue& v = data.value;
    switch (data.type) {
        case CMPI_boolean: return std::string(v.boolean != 0 ? "TRUE" : "FALSE");
        case CMPI_char16: return char16ToUtf8(v.char16);
        case CMPI_real32: return numberText(v.real32);
        case CMPI_real64: return numberText(v.real64);
        case CMPI_uint8: return numberText(v.uint8);
        case CMPI_uint16: return numberText(v.uint16);
        case CMPI_uint32: return numberText(v.uint32);
        case CMPI_uint64: return numberText(v.uint64);
        case CMPI_sint8: return numberText(v.sint8);
        case CMPI_sint16: return numberText(v.sint16);
        case CMPI_sint32: return numberText(v.sint32);
        case CMPI_sint64: return numberText(v.sint64);
        case CMPI_string: return stringText(v.string);
        case CMPI_chars: return charsText(v.chars);
        case CMPI_charsptr: return charsText(static_cast<const char*>(v.dataPtr.ptr));
        case CMPI_dateTime: return dateTimeText(v.dateTime);
        default: return std::nullopt;
    }
}

}  // namespace orv::cimxml
