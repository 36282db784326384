// How a typed value is handed to the broker's set/add/return functions.
#ifndef ORV_CMPI_SRC_ABIVALUE_H
#define ORV_CMPI_SRC_ABIVALUE_H

#include <cmpidt.h>

namespace cmpibinding {

// The value pointer the ABI expects: for chars the characters themselves,
// for every other type the address of the value union.
inline const CMPIValue* valuePointer(const CMPIData& d) {
    return d.type == CMPI_chars ? reinterpret_cast<const CMPIValue*>(d.value.chars) : &d.value;
}

}  // namespace cmpibinding

#endif
