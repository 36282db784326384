// Value pieces shared by the instance, path and method encoders.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// The escaped text of one non-null scalar item (scalarText's forms); false, writing
// nothing, for NULL and for types without a text form.
bool writeScalarText(XmlWriter& out, const CMPIData& item);
// <VALUE> for one item: a scalar, or the escaped markup of an embedded instance; false,
// writing nothing, when the item has no text (NULL).
bool writeValue(XmlWriter& out, const CMPIData& item);
// <VALUE.ARRAY> with a VALUE per element; NULL elements are left out or
// written as VALUE.NULL, as `nulls` says.
void writeValueArray(XmlWriter& out, const CMPIArray* array, ArrayNullElements nulls);

}  // namespace orv::cimxml
