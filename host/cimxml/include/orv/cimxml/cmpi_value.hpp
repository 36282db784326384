// CMPI data as CIM-XML text: type names and the text of scalar values.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <optional>
#include <string>
#include <string_view>

namespace orv::cimxml {

// The characters of a CMPI string; "" for a NULL string.
std::string cmpiString(const CMPIString* text);

// The TYPE attribute for a CMPI type with the array flag removed: "uint16", "string",
// "datetime", ... (strings, chars and embedded instances are "string"; references
// "reference"). Empty for types CIM-XML cannot carry.
std::string_view xmlTypeName(CMPIType type) noexcept;

// The VALUE text of one non-null scalar item: booleans "TRUE"/"FALSE", integers in
// decimal, reals in their shortest round-trip form, char16 as UTF-8, datetimes in
// the 25-character interval or timestamp form. nullopt for null data, references,
// instances and types without a text form.
std::optional<std::string> scalarText(const CMPIData& data);

// Room for the text of a number, a boolean or a char16.
struct ScalarBuffer {
    char chars[64];
};
// How many bytes from the start of plain text may be read (at least its size): it is
// copied in one move of that many bytes.
inline constexpr std::size_t kPlainTextRoom = 32;
static_assert(sizeof(ScalarBuffer::chars) >= kPlainTextRoom);
// The same text without a copy: a view of the item's own characters (strings, chars,
// datetimes) or of `buffer`. `plain` is true where the text can hold nothing XML escapes
// (numbers and booleans); kPlainTextRoom bytes may then be read from its start.
struct ScalarChars {
    std::string_view text;
    bool plain = false;
};
std::optional<ScalarChars> scalarChars(const CMPIData& data, ScalarBuffer& buffer);

// The characters of a CMPI string without a copy; "" for a NULL string. Valid while the
// string is.
inline std::string_view cmpiChars(const CMPIString* text) noexcept {
    if (text == nullptr || text->ft == nullptr) {
        return {};
    }
    const char* chars = text->ft->getCharPtr(text, nullptr);
    return chars == nullptr ? std::string_view() : std::string_view(chars);
}

// The VALUETYPE of a key of this type: "string", "boolean" or "numeric".
std::string_view keyValueType(CMPIType type) noexcept;

// True for the NULL states (null value, not found).
inline bool isNullData(const CMPIData& data) noexcept {
    return (data.state & (CMPI_nullValue | CMPI_notFound | CMPI_badValue)) != 0;
}

// A UTF-16 code unit as UTF-8 (a lone surrogate becomes U+FFFD).
std::string char16ToUtf8(CMPIChar16 unit);

}  // namespace orv::cimxml
