/* The ABI layout checks compiled as C11. */
#include <cmpi/cmpift.h>

#include "abi_assert.h"

#include "abi_constants.inc"
#include "abi_host_checks.inc"
#include "abi_layout.inc"
