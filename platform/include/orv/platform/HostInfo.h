/* Host identity and uptime, answered by the platform substitute in use. */
#ifndef ORV_PLATFORM_HOSTINFO_H
#define ORV_PLATFORM_HOSTINFO_H

#include <stddef.h>
#include <sys/sysinfo.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Fully qualified host name into buf (NUL-terminated). 0 on success; nonzero
 * when the platform cannot tell or buf is too small (buf then holds ""). */
int OrvHost_GetFqdn(char* buf, size_t size);

/* Short host name, same contract as OrvHost_GetFqdn. */
int OrvHost_GetHostName(char* buf, size_t size);

/* Same contract as sysinfo(2): 0 on success, -1 with errno set on failure.
 * The uptime field is the host's uptime in seconds. */
int OrvHost_Sysinfo(struct sysinfo* info);

#ifdef __cplusplus
}
#endif

#endif
