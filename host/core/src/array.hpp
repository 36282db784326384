// CMPIArray: a fixed-size array of one element type; every element starts null.
#pragma once

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIArrayFT kArrayFT;

// The elements live where the array lives (memberHome() when it is made).
struct ArrayImpl {
    CMPIType elementType = CMPI_null;  // CMPI_chars is kept as CMPI_string
    CMPICount size = 0;
    CMPIData* elements = nullptr;
    Arena* home = nullptr;

    ArrayImpl(CMPICount count, CMPIType type);
    ArrayImpl(const ArrayImpl& other);
    ~ArrayImpl();
    ArrayImpl& operator=(const ArrayImpl&) = delete;

private:
    void allocate(CMPICount count);
};

CMPIArray* newArray(CMPICount size, CMPIType elementType, Owner owner);
CMPIArray* cloneArray(const CMPIArray* array, Owner owner);
// Element type of one of our arrays; CMPI_null for anything else.
CMPIType arrayElementType(const CMPIArray* array) noexcept;
ArrayImpl* arrayImpl(const CMPIArray* array) noexcept;

}  // namespace orv::host::detail
