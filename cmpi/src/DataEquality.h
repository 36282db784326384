// Whether two typed values are the same value, as key bindings compare.
#ifndef ORV_CMPI_SRC_DATAEQUALITY_H
#define ORV_CMPI_SRC_DATAEQUALITY_H

#include <cmpidt.h>

namespace cmpibinding {

// Null values equal only null values. Text compares by characters whether
// held as string or chars; integers by numeric value whatever their width
// and sign; references as object paths; date-times by value and interval
// flag; other values by type and contents.
bool dataEquals(const CMPIData& a, const CMPIData& b);

}  // namespace cmpibinding

#endif
