// Value pieces shared by the instance and method encoders.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <optional>
#include <string>

#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// The text a VALUE carries for one item: scalars, or the markup of an embedded instance.
std::optional<std::string> itemText(const CMPIData& item);
// <VALUE.ARRAY> with a VALUE or VALUE.NULL per element.
void writeValueArray(XmlWriter& out, const CMPIArray* array);

}  // namespace orv::cimxml
