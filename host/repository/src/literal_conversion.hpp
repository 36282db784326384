// Turns untyped MOF literals into values of a declared type, and infers the
// type of a qualifier's value when no declaration of it is known.
#pragma once

#include <string>
#include <string_view>

#include "mof_syntax.hpp"
#include "orv/repository/cim_type.hpp"
#include "orv/repository/value.hpp"

namespace orv::repository::mof {

// Throws MofError at value.line naming `what` (e.g. "property 'Speed'") when a
// literal does not fit the type.
Value toValue(const ValueSyntax& value, const DataType& type, const std::string& file,
              std::string_view what);

// The type a literal implies: no value is boolean, an integer is sint64 when
// negative and uint64 otherwise, a real is real64, "{...}" makes an array.
DataType inferType(const ValueSyntax& value);

}  // namespace orv::repository::mof
