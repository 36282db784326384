// VALUE and VALUE.ARRAY elements written straight from CMPI data.
#include <cstring>

#include "orv/cimxml/cmpi_value.hpp"
#include "markup.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

constexpr std::string_view kValueStart = "<VALUE>";
constexpr std::string_view kValueEnd = "</VALUE>";

// Text needing no escape (numbers, booleans) is short and copied as it is; other text is
// escaped, and where it is long, in pieces.
void writeChars(XmlWriter& out, const ScalarChars& chars) {
    if (chars.plain) {
        out.raw(chars.text);
    } else {
        out.text(chars.text);
    }
}

// <VALUE>text</VALUE> in one claim of room for short text.
void writeValueElement(XmlWriter& out, const ScalarChars& chars) {
    if (!chars.plain && chars.text.size() > detail::kEscapePiece) {
        out.raw(kValueStart).text(chars.text).raw(kValueEnd);
        return;
    }
    char* at = put(out.claim(kValueStart.size() + escapedRoom(chars.text) + kPlainTextRoom + kValueEnd.size()),
                   kValueStart);
    if (chars.plain) {
        std::memcpy(at, chars.text.data(), kPlainTextRoom);
        at += chars.text.size();
    } else {
        at = putEscaped(at, chars.text);
    }
    out.commit(put(at, kValueEnd));
}

}  // namespace

bool writeScalarText(XmlWriter& out, const CMPIData& item) {
    ScalarBuffer buffer;
    const std::optional<ScalarChars> chars = scalarChars(item, buffer);
    if (chars) {
        writeChars(out, *chars);
    }
    return chars.has_value();
}

bool writeValue(XmlWriter& out, const CMPIData& item) {
    if (item.type == CMPI_string && !isNullData(item) && item.value.string != nullptr) {
        writeValueElement(out, ScalarChars{cmpiChars(item.value.string), false});  // the common case, directly
        return true;
    }
    if (item.type == CMPI_instance) {
        if (isNullData(item) || item.value.inst == nullptr) {
            return false;
        }
        out.raw(kValueStart).text(instanceText(item.value.inst)).raw(kValueEnd);
        return true;
    }
    ScalarBuffer buffer{};  // all of it defined: plain text is copied kPlainTextRoom bytes at a time
    const std::optional<ScalarChars> chars = scalarChars(item, buffer);
    if (chars) {
        writeValueElement(out, *chars);
    }
    return chars.has_value();
}

void writeValueArray(XmlWriter& out, const CMPIArray* array, ArrayNullElements nulls) {
    out.raw("<VALUE.ARRAY>");
    const CMPICount size = array->ft->getSize(array, nullptr);
    for (CMPICount i = 0; i < size; ++i) {
        const CMPIData item = array->ft->getElementAt(array, i, nullptr);
        if (!writeValue(out, item) && nulls == ArrayNullElements::ValueNull) {
            out.raw("<VALUE.NULL></VALUE.NULL>");
        }
    }
    out.raw("</VALUE.ARRAY>");
}

}  // namespace orv::cimxml
