/* Kernel system-information interface: typed reads of kernel nodes and the
 * parameter lists that address node instances. Every call that returns a
 * KSI_Status answers KSI_OK (0) on success and a nonzero code on failure. */
#ifndef ORV_KSI_KSI_H
#define ORV_KSI_KSI_H

#include <stdint.h>

#include "ksi/KsiNodes.h"
#include "ksi/KsiRecords.h"

#ifdef __cplusplus
extern "C" {
#endif

typedef int KSI_Status;

#define KSI_OK 0
#define KSI_ERR_FAILURE 1       /* the kernel could not answer */
#define KSI_ERR_NOT_FOUND 2     /* no such node or node instance */
#define KSI_ERR_BAD_PARAM 3     /* wrong number or kind of parameters */
#define KSI_ERR_BUFFER_SIZE 4   /* the buffer size is not the node's record size */
#define KSI_ERR_SIGNATURE 5     /* the caller's signature was refused */
#define KSI_ERR_NO_MEMORY 6

/* The signature a caller presents to KSI_CheckSig: KSI_SIGNATURE_LENGTH bytes
 * including the terminating NUL. */
#define KSI_SIGNATURE "KSI:orv-host-ifc:001"
#define KSI_SIGNATURE_LENGTH 21
/* What KSI_CheckSig reports in its out word on success. */
#define KSI_INTERFACE_VERSION 1u

/* Opaque parameter list; also the form of every instance list. */
typedef struct KSI_ParamList KSI_ParamList;
/* Opaque parameter: a 64-bit integer or a string. */
typedef struct KSI_Param KSI_Param;

/* Checks the caller's signature; on success stores KSI_INTERFACE_VERSION in *result. */
KSI_Status KSI_CheckSig(const void* signature, uint32_t length, uint32_t* result);

/* Reads one node (instance) into out, whose size must be the node's record size. */
KSI_Status KSI_Get(KSI_NodeId node, const KSI_ParamList* params, void* out, uint32_t outSize);

/* Lists the instances of node under params. *list may come back NULL (no
 * instance list at all); otherwise the caller destroys it. */
KSI_Status KSI_GetInstanceListAlloc(KSI_NodeId node, const KSI_ParamList* params, KSI_ParamList** list);

/* A new, empty list with room for initialCount parameters, growing by growBy;
 * NULL when out of memory. */
KSI_ParamList* KSI_ParamListCreate(uint32_t initialCount, uint32_t growBy);
void KSI_ParamListDestroy(KSI_ParamList* list);
uint32_t KSI_ParamListUsedCount(const KSI_ParamList* list);
KSI_Status KSI_ParamListAddString(KSI_ParamList* list, const char* value);
KSI_Status KSI_ParamListAddInt(KSI_ParamList* list, int64_t value);
KSI_Status KSI_ParamListRemoveLastParam(KSI_ParamList* list);
/* The parameter at index, or NULL when the slot holds none. Valid until the list changes. */
const KSI_Param* KSI_ParamListGetParam(const KSI_ParamList* list, uint32_t index);
/* The 32-bit instance number held at index. */
KSI_Status KSI_ParamListGetInt32(const KSI_ParamList* list, uint32_t index, int32_t* value);
/* The text of a string parameter, or NULL when param holds none. */
const char* KSI_ParamGetString(const KSI_Param* param);

#ifdef __cplusplus
}
#endif

#endif
