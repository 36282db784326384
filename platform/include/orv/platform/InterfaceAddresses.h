/* The host's interface-address list (getifaddrs), answered by the platform
 * substitute in use: the Linux substitute asks the kernel of the calling
 * thread's network namespace, the simulated host answers from its fixture. */
#ifndef ORV_PLATFORM_INTERFACEADDRESSES_H
#define ORV_PLATFORM_INTERFACEADDRESSES_H

#include <ifaddrs.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Same contract as getifaddrs(3): 0 with *list set to the first entry (NULL
 * for an empty list), which the caller releases with OrvHost_FreeIfAddrs.
 * On failure the answer is nonzero (getifaddrs answers -1 and sets errno;
 * an injected failure may answer another value) and *list is NULL. */
int OrvHost_GetIfAddrs(struct ifaddrs** list);

/* Releases a list that OrvHost_GetIfAddrs handed out; NULL is ignored. */
void OrvHost_FreeIfAddrs(struct ifaddrs* list);

#ifdef __cplusplus
}
#endif

#endif
