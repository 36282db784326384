/* System version service: the running hypervisor's product and build record,
 * and the status codes the service answers. */
#ifndef ORV_TMKUSER_VERSION_H
#define ORV_TMKUSER_VERSION_H

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef uint32_t TmkuserStatus_Code;

#define TMKUSER_STATUS_OK 0u

typedef struct TmkuserVersion_SystemVersionInfo {
    char product[32];
    char productVersion[32];
    char buildVersion[32];
    char buildDate[32];
    char buildTime[32];
    uint32_t talmekBuild;
} TmkuserVersion_SystemVersionInfo;

/* Fills *info with the running system's record; TMKUSER_STATUS_OK or a failure code. */
TmkuserStatus_Code TmkuserVersion_GetSystemVersion(TmkuserVersion_SystemVersionInfo* info);

/* The error number (errno value) that corresponds to code. */
int TmkuserStatus_CodeToErrno(TmkuserStatus_Code code);

/* Writes the text of code into buffer (at most bufferSize bytes, always
 * NUL-terminated when bufferSize > 0) and returns buffer. */
const char* TmkuserStatus_CodeToString(TmkuserStatus_Code code, char* buffer, size_t bufferSize);

#ifdef __cplusplus
#define ORV_TMKUSER_ASSERT static_assert
#else
#define ORV_TMKUSER_ASSERT _Static_assert
#endif
ORV_TMKUSER_ASSERT(sizeof(TmkuserVersion_SystemVersionInfo) == 164, "the version record is 164 bytes");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, product) == 0, "product at 0");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, productVersion) == 32, "productVersion at 32");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, buildVersion) == 64, "buildVersion at 64");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, buildDate) == 96, "buildDate at 96");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, buildTime) == 128, "buildTime at 128");
ORV_TMKUSER_ASSERT(offsetof(TmkuserVersion_SystemVersionInfo, talmekBuild) == 160, "talmekBuild at 160");
#undef ORV_TMKUSER_ASSERT

#ifdef __cplusplus
}
#endif

#endif
