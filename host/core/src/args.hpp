// CMPIArgs: named method arguments in the order they were added.
#pragma once

#include "object.hpp"
#include "value.hpp"

namespace orv::host::detail {

extern const CMPIArgsFT kArgsFT;

CMPIArgs* newArgs(Owner owner);
CMPIArgs* cloneArgs(const CMPIArgs* args, Owner owner);
ValueList* argsImpl(const CMPIArgs* args) noexcept;

}  // namespace orv::host::detail
