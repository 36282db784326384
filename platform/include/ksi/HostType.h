/* Which operating system kernel the host runs. */
#ifndef ORV_KSI_HOSTTYPE_H
#define ORV_KSI_HOSTTYPE_H

#include <stdbool.h>

#ifdef __cplusplus
extern "C" {
#endif

/* True when the host runs the hypervisor kernel. */
bool HostType_OSIsTMK(void);

#ifdef __cplusplus
}
#endif

#endif
