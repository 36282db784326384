// CMPIEnumeration: what an up-call returned, read once from the front.
#pragma once

#include <vector>

#include "object.hpp"

namespace orv::host::detail {

extern const CMPIEnumerationFT kEnumerationFT;

struct EnumerationImpl {
    std::vector<CMPIData> items;  // owned stored values
    std::size_t cursor = 0;

    EnumerationImpl() = default;
    EnumerationImpl(const EnumerationImpl& other);
    ~EnumerationImpl();
};

CMPIEnumeration* newEnumeration(Owner owner);
CMPIEnumeration* cloneEnumeration(const CMPIEnumeration* enumeration, Owner owner);
EnumerationImpl* enumerationImpl(const CMPIEnumeration* enumeration) noexcept;

}  // namespace orv::host::detail
