// Short aliases of the C ABI types used throughout the binding's interface.
#ifndef ORV_CMPI_CMPIDEFS_H
#define ORV_CMPI_CMPIDEFS_H

#include <cmpidt.h>
#include <cmpift.h>

typedef CMPIBoolean CmpiBoolean;
typedef CMPIrc CmpiRc;

#endif
