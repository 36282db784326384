// Text forms of stored values, used by toString and query evaluation.
#pragma once

#include <cmpidt.h>

#include <string>

namespace orv::host::detail {

// Numbers in decimal, booleans "true"/"false", strings as they are, date-times
// in CIM string form, object paths in their toString form. Null: "".
std::string valueText(const CMPIData& data);
// valueText quoted for a key binding: strings, date-times and references in
// double quotes with '"' and '\' escaped.
std::string keyText(const CMPIData& data);

}  // namespace orv::host::detail
