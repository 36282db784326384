#include "orv/cimxml/method_encoder.hpp"

#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/object_encoder.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

// PARAMTYPE and EmbeddedObject of a value's element, then the value itself.
void writeTypedValue(XmlWriter& out, const CMPIData& data, ArrayNullElements nulls) {
    const CMPIType element = data.type & ~CMPI_ARRAY;
    out.attr("PARAMTYPE", xmlTypeName(element));
    if (element == CMPI_instance) {
        out.attr("EmbeddedObject", "instance");
    }
    if (isNullData(data)) {
        return;
    }
    if ((data.type & CMPI_ARRAY) != 0) {
        if (data.value.array != nullptr) {
            writeValueArray(out, data.value.array, nulls);
        }
    } else if (data.type == CMPI_ref) {
        if (data.value.ref != nullptr) {
            writeValueReference(out, data.value.ref);
        }
    } else {
        writeValue(out, data);
    }
}

bool hasXmlForm(const CMPIData& data) {
    return !xmlTypeName(data.type & ~CMPI_ARRAY).empty();
}

}  // namespace

void writeReturnValue(XmlWriter& out, const CMPIData& data, ArrayNullElements nulls) {
    if (!hasXmlForm(data)) {
        return;
    }
    out.open("RETURNVALUE");
    writeTypedValue(out, data, nulls);
    out.close();
}

void writeParamValue(XmlWriter& out, std::string_view name, const CMPIData& data, ArrayNullElements nulls) {
    if (!hasXmlForm(data)) {
        return;
    }
    out.open("PARAMVALUE").attr("NAME", name);
    writeTypedValue(out, data, nulls);
    out.close();
}

void writeOutArguments(XmlWriter& out, const CMPIArgs* args, ArrayNullElements nulls) {
    if (args == nullptr) {
        return;
    }
    const CMPICount count = args->ft->getArgCount(args, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* name = nullptr;
        const CMPIData data = args->ft->getArgAt(args, i, &name, nullptr);
        writeParamValue(out, cmpiString(name), data, nulls);
    }
}

}  // namespace orv::cimxml
