#include "orv/cimxml/cmpi_value.hpp"

#include <charconv>
#include <string>

namespace orv::cimxml {

std::string cmpiString(const CMPIString* text) {
    return std::string(cmpiChars(text));
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

namespace {

// Writes the UTF-8 form of a UTF-16 code unit (a lone surrogate becomes U+FFFD); returns
// the end of what it wrote (at most three bytes).
char* writeUtf8(char* out, CMPIChar16 unit) noexcept {
    if (unit >= 0xD800 && unit <= 0xDFFF) {
        unit = 0xFFFD;
    }
    if (unit < 0x80) {
        *out++ = static_cast<char>(unit);
    } else if (unit < 0x800) {
        *out++ = static_cast<char>(0xC0 | (unit >> 6));
        *out++ = static_cast<char>(0x80 | (unit & 0x3F));
    } else {
        *out++ = static_cast<char>(0xE0 | (unit >> 12));
        *out++ = static_cast<char>(0x80 | ((unit >> 6) & 0x3F));
        *out++ = static_cast<char>(0x80 | (unit & 0x3F));
    }
    return out;
}

template <typename Number>
ScalarChars numberChars(Number value, ScalarBuffer& buffer) noexcept {
    const auto result = std::to_chars(buffer.chars, buffer.chars + sizeof buffer.chars, value);
    return ScalarChars{std::string_view(buffer.chars, static_cast<std::size_t>(result.ptr - buffer.chars)), true};
}

// Padded to kPlainTextRoom like the numbers in a ScalarBuffer.
constexpr char kTrue[kPlainTextRoom] = "TRUE";
constexpr char kFalse[kPlainTextRoom] = "FALSE";

ScalarChars booleanChars(bool value) noexcept {
    return value ? ScalarChars{std::string_view(kTrue, 4), true} : ScalarChars{std::string_view(kFalse, 5), true};
}

std::optional<ScalarChars> charsOf(const char* chars) noexcept {
    return chars == nullptr ? std::nullopt : std::optional<ScalarChars>(ScalarChars{chars, false});
}

std::optional<ScalarChars> stringChars(const CMPIString* text) noexcept {
    return text == nullptr ? std::nullopt : std::optional<ScalarChars>(ScalarChars{cmpiChars(text), false});
}

std::optional<ScalarChars> dateTimeChars(const CMPIDateTime* dateTime) {
    if (dateTime == nullptr || dateTime->ft == nullptr) {
        return std::nullopt;
    }
    return ScalarChars{cmpiChars(dateTime->ft->getStringFormat(dateTime, nullptr)), false};
}

}  // namespace

std::string char16ToUtf8(CMPIChar16 unit) {
    char chars[3];
    return std::string(chars, writeUtf8(chars, unit));
}

std::optional<ScalarChars> scalarChars(const CMPIData& data, ScalarBuffer& buffer) {
    if (isNullData(data)) {
        return std::nullopt;
    }
    const CMPIValue& v = data.value;
    switch (data.type) {
        case CMPI_boolean: return booleanChars(v.boolean != 0);
        case CMPI_char16:
            return ScalarChars{std::string_view(buffer.chars,
                                                static_cast<std::size_t>(writeUtf8(buffer.chars, v.char16) - buffer.chars)),
                               false};
        case CMPI_real32: return numberChars(v.real32, buffer);
        case CMPI_real64: return numberChars(v.real64, buffer);
        case CMPI_uint8: return numberChars(v.uint8, buffer);
        case CMPI_uint16: return numberChars(v.uint16, buffer);
        case CMPI_uint32: return numberChars(v.uint32, buffer);
        case CMPI_uint64: return numberChars(v.uint64, buffer);
        case CMPI_sint8: return numberChars(v.sint8, buffer);
        case CMPI_sint16: return numberChars(v.sint16, buffer);
        case CMPI_sint32: return numberChars(v.sint32, buffer);
        case CMPI_sint64: return numberChars(v.sint64, buffer);
        case CMPI_string: return stringChars(v.string);
        case CMPI_chars: return charsOf(v.chars);
        case CMPI_charsptr: return charsOf(static_cast<const char*>(v.dataPtr.ptr));
        case CMPI_dateTime: return dateTimeChars(v.dateTime);
        default: return std::nullopt;
    }
}

std::optional<std::string> scalarText(const CMPIData& data) {
    ScalarBuffer buffer;
    const std::optional<ScalarChars> chars = scalarChars(data, buffer);
    return chars ? std::optional<std::string>(chars->text) : std::nullopt;
}

}  // namespace orv::cimxml
