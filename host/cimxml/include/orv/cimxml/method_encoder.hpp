// DSP0201 encoding of what an extrinsic method returned: RETURNVALUE and one
// PARAMVALUE per output argument.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <string_view>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// NULL elements of array values are written as `nulls` says (ArrayNullElements).
// <RETURNVALUE PARAMTYPE=...> with the value; nothing for data without a CIM-XML type.
void writeReturnValue(XmlWriter& out, const CMPIData& data, ArrayNullElements nulls = ArrayNullElements::Drop);
// <PARAMVALUE NAME=... PARAMTYPE=...> with VALUE, VALUE.ARRAY or VALUE.REFERENCE
// (nothing inside for a null value); embedded instances carry EmbeddedObject="instance".
void writeParamValue(XmlWriter& out, std::string_view name, const CMPIData& data,
                     ArrayNullElements nulls = ArrayNullElements::Drop);
// One PARAMVALUE per argument, in the order the provider added them.
void writeOutArguments(XmlWriter& out, const CMPIArgs* args, ArrayNullElements nulls = ArrayNullElements::Drop);

}  // namespace orv::cimxml
