// VALUE and VALUE.ARRAY elements written straight from CMPI data.
#include "orv/cimxml/cmpi_value.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

void writeChars(XmlWriter& out, const ScalarChars& chars) {
    if (chars.plain) {
        out.raw(chars.text);
    } else {
        out.text(chars.text);
    }
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
    if (item.type == CMPI_instance) {
        if (isNullData(item) || item.value.inst == nullptr) {
            return false;
        }
        out.raw("<VALUE>").text(instanceText(item.value.inst)).raw("</VALUE>");
        return true;
    }
    ScalarBuffer buffer;
    const std::optional<ScalarChars> chars = scalarChars(item, buffer);
    if (chars) {
        out.raw("<VALUE>");
        writeChars(out, *chars);
        out.raw("</VALUE>");
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
