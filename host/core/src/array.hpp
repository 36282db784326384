// CMPIArray: a fixed-size array of one element type; every element starts null.
#pragma once

#include <vector>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIArrayFT kArrayFT;

struct ArrayImpl {
    CMPIType elementType = CMPI_null;  // CMPI_chars is kept as CMPI_string
    std::vector<CMPIData> elements;

    ArrayImpl(CMPICount size, CMPIType type);
    ArrayImpl(const ArrayImpl& other);
    ~ArrayImpl();
};

CMPIArray* newArray(CMPICount size, CMPIType elementType, Owner owner);
CMPIArray* cloneArray(const CMPIArray* array, Owner owner);
// Element type of one of our arrays; CMPI_null for anything else.
CMPIType arrayElementType(const CMPIArray* array) noexcept;
ArrayImpl* arrayImpl(const CMPIArray* array) noexcept;

}  // namespace orv::host::detail
