// Value pieces shared by the instance and method encoders.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <optional>
#include <string>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// The text a VALUE carries for one item: scalars, or the markup of an embedded instance.
std::optional<std::string> itemText(const CMPIData& item);
// <VALUE.ARRAY> with a VALUE per element; NULL elements are left out or
// written as VALUE.NULL, as `nulls` says.
void writeValueArray(XmlWriter& out, const CMPIArray* array, ArrayNullElements nulls);

}  // namespace orv::cimxml
