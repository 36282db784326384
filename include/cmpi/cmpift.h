/*
 * cmpift.h - CMPI function tables: the encapsulated data types handed out by
 * the broker, the broker itself with its four tables, and the management
 * instrumentation (provider) objects with their tables.
 *
 * Every encapsulated object is a {hdl, ft} pair: hdl is the implementation's
 * private data, ft its function table. Every encapsulated table starts with a
 * 4-byte ftVersion followed by function pointers from offset 8; every MI
 * table starts with ftVersion, miVersion and miName, functions from offset 16.
 * The slot order below is the binary interface; never reorder or insert.
 */
#ifndef CMPIFT_H
#define CMPIFT_H

#include "cmpidt.h"

#include <stddef.h>

#if defined(__cplusplus)
extern "C" {
#endif

struct timespec;

/* ====================================================================== */
/* The broker                                                             */
/* ====================================================================== */

/* The broker object given to every provider factory. */
struct _CMPIBroker {
    void* hdl;
    CMPIBrokerFT* bft;  /* up-calls and thread attach */
    CMPIBrokerEncFT* eft; /* factories of encapsulated objects, logging */
    CMPIBrokerExtFT* xft; /* thread, mutex and condition services */
#if defined(CMPI_VER_200)
    CMPIBrokerMemFT* mft; /* memory services; may be NULL */
#endif
};

/* Up-calls into the broker. Note: no ftVersion; execQuery precedes
 * enumerateInstances. */
struct _CMPIBrokerFT {
    unsigned int brokerCapabilities;
    unsigned int brokerVersion;
    const char* brokerName;

    CMPIContext* (*prepareAttachThread)(const CMPIBroker* mb, const CMPIContext* ctx);
    CMPIStatus (*attachThread)(const CMPIBroker* mb, const CMPIContext* ctx);
    CMPIStatus (*detachThread)(const CMPIBroker* mb, const CMPIContext* ctx);
    CMPIStatus (*deliverIndication)(const CMPIBroker* mb, const CMPIContext* ctx,
                                    const char* ns, const CMPIInstance* ind);

    CMPIEnumeration* (*enumerateInstanceNames)(const CMPIBroker* mb, const CMPIContext* ctx,
                                               const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIInstance* (*getInstance)(const CMPIBroker* mb, const CMPIContext* ctx,
                                 const CMPIObjectPath* op, const char** properties,
                                 CMPIStatus* rc);
    CMPIObjectPath* (*createInstance)(const CMPIBroker* mb, const CMPIContext* ctx,
                                      const CMPIObjectPath* op, const CMPIInstance* inst,
                                      CMPIStatus* rc);
    CMPIStatus (*modifyInstance)(const CMPIBroker* mb, const CMPIContext* ctx,
                                 const CMPIObjectPath* op, const CMPIInstance* inst,
                                 const char** properties);
    CMPIStatus (*deleteInstance)(const CMPIBroker* mb, const CMPIContext* ctx,
                                 const CMPIObjectPath* op);
    CMPIEnumeration* (*execQuery)(const CMPIBroker* mb, const CMPIContext* ctx,
                                  const CMPIObjectPath* op, const char* query,
                                  const char* lang, CMPIStatus* rc);
    CMPIEnumeration* (*enumerateInstances)(const CMPIBroker* mb, const CMPIContext* ctx,
                                           const CMPIObjectPath* op, const char** properties,
                                           CMPIStatus* rc);
    CMPIEnumeration* (*associators)(const CMPIBroker* mb, const CMPIContext* ctx,
                                    const CMPIObjectPath* op, const char* assocClass,
                                    const char* resultClass, const char* role,
                                    const char* resultRole, const char** properties,
                                    CMPIStatus* rc);
    CMPIEnumeration* (*associatorNames)(const CMPIBroker* mb, const CMPIContext* ctx,
                                        const CMPIObjectPath* op, const char* assocClass,
                                        const char* resultClass, const char* role,
                                        const char* resultRole, CMPIStatus* rc);
    CMPIEnumeration* (*references)(const CMPIBroker* mb, const CMPIContext* ctx,
                                   const CMPIObjectPath* op, const char* resultClass,
                                   const char* role, const char** properties, CMPIStatus* rc);
    CMPIEnumeration* (*referenceNames)(const CMPIBroker* mb, const CMPIContext* ctx,
                                       const CMPIObjectPath* op, const char* resultClass,
                                       const char* role, CMPIStatus* rc);
    CMPIData (*invokeMethod)(const CMPIBroker* mb, const CMPIContext* ctx,
                             const CMPIObjectPath* op, const char* method, const CMPIArgs* in,
                             CMPIArgs* out, CMPIStatus* rc);
    CMPIStatus (*setProperty)(const CMPIBroker* mb, const CMPIContext* ctx,
                              const CMPIObjectPath* op, const char* name,
                              const CMPIValue* value, CMPIType type);
    CMPIData (*getProperty)(const CMPIBroker* mb, const CMPIContext* ctx,
                            const CMPIObjectPath* op, const char* name, CMPIStatus* rc);
};

/* Factories of encapsulated objects, type queries, messages and logging. */
struct _CMPIBrokerEncFT {
    int ftVersion;

    CMPIInstance* (*newInstance)(const CMPIBroker* mb, const CMPIObjectPath* op,
                                 CMPIStatus* rc);
    CMPIObjectPath* (*newObjectPath)(const CMPIBroker* mb, const char* ns, const char* cn,
                                     CMPIStatus* rc);
    CMPIArgs* (*newArgs)(const CMPIBroker* mb, CMPIStatus* rc);
    CMPIString* (*newString)(const CMPIBroker* mb, const char* data, CMPIStatus* rc);
    CMPIArray* (*newArray)(const CMPIBroker* mb, CMPICount max, CMPIType type, CMPIStatus* rc);
    CMPIDateTime* (*newDateTime)(const CMPIBroker* mb, CMPIStatus* rc);
    CMPIDateTime* (*newDateTimeFromBinary)(const CMPIBroker* mb, CMPIUint64 binTime,
                                           CMPIBoolean interval, CMPIStatus* rc);
    CMPIDateTime* (*newDateTimeFromChars)(const CMPIBroker* mb, const char* utcTime,
                                          CMPIStatus* rc);
    CMPISelectExp* (*newSelectExp)(const CMPIBroker* mb, const char* query, const char* lang,
                                   CMPIArray** projection, CMPIStatus* st);
    CMPIBoolean (*classPathIsA)(const CMPIBroker* mb, const CMPIObjectPath* op,
                                const char* type, CMPIStatus* rc);
    CMPIString* (*toString)(const CMPIBroker* mb, const void* object, CMPIStatus* rc);
    CMPIBoolean (*isOfType)(const CMPIBroker* mb, const void* object, const char* type,
                            CMPIStatus* rc);
    CMPIString* (*getType)(const CMPIBroker* mb, const void* object, CMPIStatus* rc);
    /* The variable part is `count` pairs of (type code as int, value); see
     * the CMFmt... macros of cmpimacs.h. */
    CMPIString* (*getMessage)(const CMPIBroker* mb, const char* msgId, const char* defMsg,
                              CMPIStatus* rc, CMPICount count, ...);
    CMPIStatus (*logMessage)(const CMPIBroker* mb, int severity, const char* id,
                             const char* text, const CMPIString* string);
    CMPIStatus (*trace)(const CMPIBroker* mb, int level, const char* component,
                        const char* text, const CMPIString* string);
#if defined(CMPI_VER_200)
    CMPIError* (*newCMPIError)(const CMPIBroker* mb, const char* owner, const char* msgID,
                               const char* msg, const CMPIErrorSeverity sev,
                               const CMPIErrorProbableCause pc, const CMPIrc cimStatusCode,
                               CMPIStatus* rc);
    CMPIStatus (*openMessageFile)(const CMPIBroker* mb, const char* msgFile,
                                  CMPIMsgFileHandle* msgFileHandle);
    CMPIStatus (*closeMessageFile)(const CMPIBroker* mb, const CMPIMsgFileHandle msgFileHandle);
    CMPIString* (*getMessage2)(const CMPIBroker* mb, const char* msgId,
                               const CMPIMsgFileHandle msgFileHandle, const char* defMsg,
                               CMPIStatus* rc, CMPICount count, ...);
#endif
};

/* Operating-system services: threads, thread-specific data, mutexes and
 * conditions. */
struct _CMPIBrokerExtFT {
    int ftVersion;

    char* (*resolveFileName)(const char* filename);

    CMPI_THREAD_TYPE (*newThread)(CMPI_THREAD_RETURN (CMPI_THREAD_CDECL* start)(void*),
                                  void* parm, int detached);
    int (*joinThread)(CMPI_THREAD_TYPE thread, CMPI_THREAD_RETURN* retval);
    int (*exitThread)(CMPI_THREAD_RETURN returnCode);
    int (*cancelThread)(CMPI_THREAD_TYPE thread);
    int (*threadSleep)(CMPIUint32 msec);
    int (*threadOnce)(int* once, void (*init)(void));

    int (*createThreadKey)(CMPI_THREAD_KEY_TYPE* key, void (*cleanup)(void*));
    int (*destroyThreadKey)(CMPI_THREAD_KEY_TYPE key);
    void* (*getThreadSpecific)(CMPI_THREAD_KEY_TYPE key);
    int (*setThreadSpecific)(CMPI_THREAD_KEY_TYPE key, void* value);

    CMPI_MUTEX_TYPE (*newMutex)(int opt);
    void (*destroyMutex)(CMPI_MUTEX_TYPE mutex);
    void (*lockMutex)(CMPI_MUTEX_TYPE mutex);
    void (*unlockMutex)(CMPI_MUTEX_TYPE mutex);

    CMPI_COND_TYPE (*newCondition)(int opt);
    void (*destroyCondition)(CMPI_COND_TYPE cond);
    int (*condWait)(CMPI_COND_TYPE cond, CMPI_MUTEX_TYPE mutex);
    int (*timedCondWait)(CMPI_COND_TYPE cond, CMPI_MUTEX_TYPE mutex, struct timespec* wait);
    int (*signalCondition)(CMPI_COND_TYPE cond);
};

#if defined(CMPI_VER_200)
/* Memory services: objects created after mark() are freed by release(). */
struct _CMPIBrokerMemFT {
    int ftVersion;

    CMPIGcStat* (*mark)(const CMPIBroker* mb, CMPIStatus* rc);
    CMPIStatus (*release)(const CMPIBroker* mb, const CMPIGcStat* gc);
    void* (*cmpiMalloc)(const CMPIBroker* mb, size_t size);
    void* (*cmpiCalloc)(const CMPIBroker* mb, size_t nElems, size_t sizeElem);
    void* (*cmpiRealloc)(const CMPIBroker* mb, void* ptr, size_t size);
    char* (*cmpiStrDup)(const CMPIBroker* mb, const char* str);
    void (*cmpiFree)(const CMPIBroker* mb, void* ptr);
    void (*freeInstance)(const CMPIBroker* mb, CMPIInstance* inst);
    void (*freeObjectPath)(const CMPIBroker* mb, CMPIObjectPath* obj);
    void (*freeArgs)(const CMPIBroker* mb, CMPIArgs* args);
    void (*freeString)(const CMPIBroker* mb, CMPIString* str);
    void (*freeArray)(const CMPIBroker* mb, CMPIArray* array);
    void (*freeDateTime)(const CMPIBroker* mb, CMPIDateTime* date);
    void (*freeSelectExp)(const CMPIBroker* mb, CMPISelectExp* se);
};
#endif

/* ====================================================================== */
/* Encapsulated data types                                                */
/* ====================================================================== */

/* ---- Context: named entries that travel with an invocation ----------- */

struct _CMPIContext {
    void* hdl;
    CMPIContextFT* ft;
};

struct _CMPIContextFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIContext* ctx);
    CMPIContext* (*clone)(const CMPIContext* ctx, CMPIStatus* rc);
    CMPIData (*getEntry)(const CMPIContext* ctx, const char* name, CMPIStatus* rc);
    CMPIData (*getEntryAt)(const CMPIContext* ctx, CMPICount index, CMPIString** name,
                           CMPIStatus* rc);
    CMPICount (*getEntryCount)(const CMPIContext* ctx, CMPIStatus* rc);
    CMPIStatus (*addEntry)(const CMPIContext* ctx, const char* name, const CMPIValue* value,
                           const CMPIType type);
};

/*
 * Context table of this project's embedded host: the standard table followed
 * by the host's own entries. A context's ft points at the `std` member, so
 * ordinary code sees a standard CMPIContextFT.
 *
 * releaseThreadMemory frees what the broker has allocated for the calling
 * thread so far; long-running provider threads call it after each unit of
 * work. Other brokers (sfcb's context table ends at addEntry) do not have
 * it: call it ONLY when the context carries the CMPI_ORV_HostExtensions
 * entry with a value of at least 1 (see CMHasHostExtensions and
 * CMReleaseThreadMemory in cmpimacs.h).
 */
typedef struct _CMPIContextFTExt {
    CMPIContextFT std;
    CMPIStatus (*releaseThreadMemory)(const CMPIContext* ctx);
} CMPIContextFTExt;

/* ---- Result: what a provider returns to the broker ------------------- */

struct _CMPIResult {
    void* hdl;
    CMPIResultFT* ft;
};

struct _CMPIResultFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIResult* rslt);
    CMPIResult* (*clone)(const CMPIResult* rslt, CMPIStatus* rc);
    CMPIStatus (*returnData)(const CMPIResult* rslt, const CMPIValue* value, const CMPIType type);
    CMPIStatus (*returnInstance)(const CMPIResult* rslt, const CMPIInstance* inst);
    CMPIStatus (*returnObjectPath)(const CMPIResult* rslt, const CMPIObjectPath* ref);
    CMPIStatus (*returnDone)(const CMPIResult* rslt);
#if defined(CMPI_VER_200)
    CMPIStatus (*returnError)(const CMPIResult* rslt, const CMPIError* er);
#endif
};

#if defined(CMPI_VER_200)
/* ---- Error: an extended error report (level 200) --------------------- */

struct _CMPIError {
    void* hdl;
    CMPIErrorFT* ft;
};

struct _CMPIErrorFT {
    CMPISint32 ftVersion;

    CMPIStatus (*release)(CMPIError* er);
    CMPIError* (*clone)(const CMPIError* er, CMPIStatus* rc);
    CMPIErrorType (*getErrorType)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getOtherErrorType)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getOwningEntity)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getMessageID)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getMessage)(const CMPIError* er, CMPIStatus* rc);
    CMPIErrorSeverity (*getPerceivedSeverity)(const CMPIError* er, CMPIStatus* rc);
    CMPIErrorProbableCause (*getProbableCause)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getProbableCauseDescription)(const CMPIError* er, CMPIStatus* rc);
    CMPIArray* (*getRecommendedActions)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getErrorSource)(const CMPIError* er, CMPIStatus* rc);
    CMPIErrorSrcFormat (*getErrorSourceFormat)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getOtherErrorSourceFormat)(const CMPIError* er, CMPIStatus* rc);
    CMPIrc (*getCIMStatusCode)(const CMPIError* er, CMPIStatus* rc);
    CMPIString* (*getCIMStatusCodeDescription)(const CMPIError* er, CMPIStatus* rc);
    CMPIArray* (*getMessageArguments)(const CMPIError* er, CMPIStatus* rc);
    CMPIStatus (*setErrorType)(CMPIError* er, const CMPIErrorType et);
    CMPIStatus (*setOtherErrorType)(CMPIError* er, const char* ot);
    CMPIStatus (*setProbableCauseDescription)(CMPIError* er, const char* pcd);
    CMPIStatus (*setRecommendedActions)(CMPIError* er, const CMPIArray* ra);
    CMPIStatus (*setErrorSource)(CMPIError* er, const char* es);
    CMPIStatus (*setErrorSourceFormat)(CMPIError* er, const CMPIErrorSrcFormat esf);
    CMPIStatus (*setOtherErrorSourceFormat)(CMPIError* er, const char* oef);
    CMPIStatus (*setCIMStatusCodeDescription)(CMPIError* er, const char* scd);
    CMPIStatus (*setMessageArguments)(CMPIError* er, CMPIArray* values);
};
#endif

/* ---- Instance --------------------------------------------------------- */

struct _CMPIInstance {
    void* hdl;
    CMPIInstanceFT* ft;
};

struct _CMPIInstanceFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIInstance* inst);
    CMPIInstance* (*clone)(const CMPIInstance* inst, CMPIStatus* rc);
    CMPIData (*getProperty)(const CMPIInstance* inst, const char* name, CMPIStatus* rc);
    CMPIData (*getPropertyAt)(const CMPIInstance* inst, CMPICount index, CMPIString** name,
                              CMPIStatus* rc);
    CMPICount (*getPropertyCount)(const CMPIInstance* inst, CMPIStatus* rc);
    CMPIStatus (*setProperty)(const CMPIInstance* inst, const char* name,
                              const CMPIValue* value, CMPIType type);
    CMPIObjectPath* (*getObjectPath)(const CMPIInstance* inst, CMPIStatus* rc);
    CMPIStatus (*setPropertyFilter)(CMPIInstance* inst, const char** propertyList,
                                    const char** keys);
    CMPIStatus (*setObjectPath)(CMPIInstance* inst, const CMPIObjectPath* op);
#if defined(CMPI_VER_200)
    CMPIStatus (*setPropertyWithOrigin)(const CMPIInstance* inst, const char* name,
                                        const CMPIValue* value, const CMPIType type,
                                        const char* origin);
#endif
};

/* ---- Object path ------------------------------------------------------ */

struct _CMPIObjectPath {
    void* hdl;
    CMPIObjectPathFT* ft;
};

/* Setters and getters alternate: namespace, host name, class name. */
struct _CMPIObjectPathFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIObjectPath* op);
    CMPIObjectPath* (*clone)(const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIStatus (*setNameSpace)(CMPIObjectPath* op, const char* ns);
    CMPIString* (*getNameSpace)(const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIStatus (*setHostname)(CMPIObjectPath* op, const char* hn);
    CMPIString* (*getHostname)(const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIStatus (*setClassName)(CMPIObjectPath* op, const char* cn);
    CMPIString* (*getClassName)(const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIStatus (*addKey)(CMPIObjectPath* op, const char* name, const CMPIValue* value,
                         const CMPIType type);
    CMPIData (*getKey)(const CMPIObjectPath* op, const char* name, CMPIStatus* rc);
    CMPIData (*getKeyAt)(const CMPIObjectPath* op, CMPICount index, CMPIString** name,
                         CMPIStatus* rc);
    CMPICount (*getKeyCount)(const CMPIObjectPath* op, CMPIStatus* rc);
    CMPIStatus (*setNameSpaceFromObjectPath)(CMPIObjectPath* op, const CMPIObjectPath* src);
    CMPIStatus (*setHostAndNameSpaceFromObjectPath)(CMPIObjectPath* op,
                                                    const CMPIObjectPath* src);
    CMPIData (*getClassQualifier)(const CMPIObjectPath* op, const char* qName, CMPIStatus* rc);
    CMPIData (*getPropertyQualifier)(const CMPIObjectPath* op, const char* pName,
                                     const char* qName, CMPIStatus* rc);
    CMPIData (*getMethodQualifier)(const CMPIObjectPath* op, const char* methodName,
                                   const char* qName, CMPIStatus* rc);
    CMPIData (*getParameterQualifier)(const CMPIObjectPath* op, const char* mName,
                                      const char* pName, const char* qName, CMPIStatus* rc);
    CMPIString* (*toString)(const CMPIObjectPath* op, CMPIStatus* rc);
};

/* ---- Method arguments ------------------------------------------------- */

struct _CMPIArgs {
    void* hdl;
    CMPIArgsFT* ft;
};

struct _CMPIArgsFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIArgs* as);
    CMPIArgs* (*clone)(const CMPIArgs* as, CMPIStatus* rc);
    CMPIStatus (*addArg)(const CMPIArgs* as, const char* name, const CMPIValue* value,
                         const CMPIType type);
    CMPIData (*getArg)(const CMPIArgs* as, const char* name, CMPIStatus* rc);
    CMPIData (*getArgAt)(const CMPIArgs* as, CMPICount index, CMPIString** name,
                         CMPIStatus* rc);
    CMPICount (*getArgCount)(const CMPIArgs* as, CMPIStatus* rc);
};

/* ---- String: hdl is the NUL-terminated character buffer -------------- */

struct _CMPIString {
    void* hdl;
    CMPIStringFT* ft;
};

struct _CMPIStringFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIString* st);
    CMPIString* (*clone)(const CMPIString* st, CMPIStatus* rc);
    char* (*getCharPtr)(const CMPIString* st, CMPIStatus* rc);
};

/* ---- Array ------------------------------------------------------------ */

struct _CMPIArray {
    void* hdl;
    CMPIArrayFT* ft;
};

struct _CMPIArrayFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIArray* ar);
    CMPIArray* (*clone)(const CMPIArray* ar, CMPIStatus* rc);
    CMPICount (*getSize)(const CMPIArray* ar, CMPIStatus* rc);
    CMPIType (*getSimpleType)(const CMPIArray* ar, CMPIStatus* rc);
    CMPIData (*getElementAt)(const CMPIArray* ar, CMPICount index, CMPIStatus* rc);
    CMPIStatus (*setElementAt)(CMPIArray* ar, CMPICount index, const CMPIValue* value,
                               CMPIType type);
};

/* ---- Enumeration ------------------------------------------------------ */

struct _CMPIEnumeration {
    void* hdl;
    CMPIEnumerationFT* ft;
};

struct _CMPIEnumerationFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIEnumeration* en);
    CMPIEnumeration* (*clone)(const CMPIEnumeration* en, CMPIStatus* rc);
    CMPIData (*getNext)(const CMPIEnumeration* en, CMPIStatus* rc);
    CMPIBoolean (*hasNext)(const CMPIEnumeration* en, CMPIStatus* rc);
    CMPIArray* (*toArray)(const CMPIEnumeration* en, CMPIStatus* rc);
};

/* ---- Date and time: binary form is microseconds since the epoch (UTC)
 *      or, for an interval, a number of microseconds ------------------- */

struct _CMPIDateTime {
    void* hdl;
    CMPIDateTimeFT* ft;
};

struct _CMPIDateTimeFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIDateTime* dt);
    CMPIDateTime* (*clone)(const CMPIDateTime* dt, CMPIStatus* rc);
    CMPIUint64 (*getBinaryFormat)(const CMPIDateTime* dt, CMPIStatus* rc);
    CMPIString* (*getStringFormat)(const CMPIDateTime* dt, CMPIStatus* rc);
    CMPIBoolean (*isInterval)(const CMPIDateTime* dt, CMPIStatus* rc);
};

/* ---- Select expression (a parsed query) and its parts ---------------- */

struct _CMPISelectExp {
    void* hdl;
    CMPISelectExpFT* ft;
};

struct _CMPISelectExpFT {
    int ftVersion;

    CMPIStatus (*release)(CMPISelectExp* se);
    CMPISelectExp* (*clone)(const CMPISelectExp* se, CMPIStatus* rc);
    CMPIBoolean (*evaluate)(const CMPISelectExp* se, const CMPIInstance* inst, CMPIStatus* rc);
    CMPIString* (*getString)(const CMPISelectExp* se, CMPIStatus* rc);
    CMPISelectCond* (*getDOC)(const CMPISelectExp* se, CMPIStatus* rc);
    CMPISelectCond* (*getCOD)(const CMPISelectExp* se, CMPIStatus* rc);
    CMPIBoolean (*evaluateUsingAccessor)(const CMPISelectExp* se, CMPIAccessor* accessor,
                                         void* parm, CMPIStatus* rc);
};

struct _CMPISelectCond {
    void* hdl;
    CMPISelectCondFT* ft;
};

struct _CMPISelectCondFT {
    int ftVersion;

    CMPIStatus (*release)(CMPISelectCond* sc);
    CMPISelectCond* (*clone)(const CMPISelectCond* sc, CMPIStatus* rc);
    /* *type receives a CMPISelectCondType value. */
    CMPICount (*getCountAndType)(const CMPISelectCond* sc, int* type, CMPIStatus* rc);
    CMPISubCond* (*getSubCondAt)(const CMPISelectCond* sc, CMPICount index, CMPIStatus* rc);
};

struct _CMPISubCond {
    void* hdl;
    CMPISubCondFT* ft;
};

struct _CMPISubCondFT {
    int ftVersion;

    CMPIStatus (*release)(CMPISubCond* sc);
    CMPISubCond* (*clone)(const CMPISubCond* sc, CMPIStatus* rc);
    CMPICount (*getCount)(const CMPISubCond* sc, CMPIStatus* rc);
    CMPIPredicate* (*getPredicateAt)(const CMPISubCond* sc, CMPICount index, CMPIStatus* rc);
    CMPIPredicate* (*getPredicate)(const CMPISubCond* sc, const char* name, CMPIStatus* rc);
};

struct _CMPIPredicate {
    void* hdl;
    CMPIPredicateFT* ft;
};

struct _CMPIPredicateFT {
    int ftVersion;

    CMPIStatus (*release)(CMPIPredicate* pr);
    CMPIPredicate* (*clone)(const CMPIPredicate* pr, CMPIStatus* rc);
    CMPIStatus (*getData)(const CMPIPredicate* pr, CMPIType* type, CMPIPredOp* op,
                          CMPIString** lhs, CMPIString** rhs);
    CMPIBoolean (*evaluateUsingAccessor)(const CMPIPredicate* pr, CMPIAccessor* accessorFnc,
                                         void* parm, CMPIStatus* rc);
};

/* ====================================================================== */
/* Management instrumentation (providers)                                 */
/* ====================================================================== */

/*
 * An MI object is the {hdl, ft} pair a provider factory returns; hdl is the
 * provider's own. The broker passes the object back as the first argument
 * of every MI function and never checks a slot for NULL, so a provider fills
 * every slot (returning CMPI_RC_ERR_NOT_SUPPORTED where it has nothing to do).
 * ftVersion and miVersion hold the CMPI level the table was built for
 * (CMPICurrentVersion); indication tables below 100 get pre-1.0 arguments.
 */

/* ---- Instance MI: note that execQuery is last ------------------------ */

struct _CMPIInstanceMI {
    void* hdl;
    CMPIInstanceMIFT* ft;
};

struct _CMPIInstanceMIFT {
    int ftVersion;
    int miVersion;
    const char* miName;

    CMPIStatus (*cleanup)(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*enumerateInstanceNames)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                         const CMPIResult* rslt, const CMPIObjectPath* op);
    CMPIStatus (*enumerateInstances)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char** properties);
    CMPIStatus (*getInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                              const CMPIResult* rslt, const CMPIObjectPath* op,
                              const char** properties);
    CMPIStatus (*createInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* rslt, const CMPIObjectPath* op,
                                 const CMPIInstance* inst);
    CMPIStatus (*modifyInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* rslt, const CMPIObjectPath* op,
                                 const CMPIInstance* inst, const char** properties);
    CMPIStatus (*deleteInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* rslt, const CMPIObjectPath* op);
    CMPIStatus (*execQuery)(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                            const CMPIObjectPath* op, const char* query, const char* lang);
};

/* ---- Association MI --------------------------------------------------- */

struct _CMPIAssociationMI {
    void* hdl;
    CMPIAssociationMIFT* ft;
};

struct _CMPIAssociationMIFT {
    int ftVersion;
    int miVersion;
    const char* miName;

    CMPIStatus (*cleanup)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                          CMPIBoolean terminating);
    CMPIStatus (*associators)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                              const CMPIResult* rslt, const CMPIObjectPath* op,
                              const char* assocClass, const char* resultClass, const char* role,
                              const char* resultRole, const char** properties);
    CMPIStatus (*associatorNames)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                  const CMPIResult* rslt, const CMPIObjectPath* op,
                                  const char* assocClass, const char* resultClass,
                                  const char* role, const char* resultRole);
    CMPIStatus (*references)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                             const CMPIResult* rslt, const CMPIObjectPath* op,
                             const char* resultClass, const char* role,
                             const char** properties);
    CMPIStatus (*referenceNames)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* rslt, const CMPIObjectPath* op,
                                 const char* resultClass, const char* role);
};

/* ---- Method MI -------------------------------------------------------- */

struct _CMPIMethodMI {
    void* hdl;
    CMPIMethodMIFT* ft;
};

struct _CMPIMethodMIFT {
    int ftVersion;
    int miVersion;
    const char* miName;

    CMPIStatus (*cleanup)(CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*invokeMethod)(CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                               const CMPIObjectPath* op, const char* method, const CMPIArgs* in,
                               CMPIArgs* out);
};

/* ---- Property MI ------------------------------------------------------ */

struct _CMPIPropertyMI {
    void* hdl;
    CMPIPropertyMIFT* ft;
};

struct _CMPIPropertyMIFT {
    int ftVersion;
    int miVersion;
    const char* miName;

    CMPIStatus (*cleanup)(CMPIPropertyMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*setProperty)(CMPIPropertyMI* mi, const CMPIContext* ctx,
                              const CMPIResult* rslt, const CMPIObjectPath* op,
                              const char* name, const CMPIData data);
    CMPIStatus (*getProperty)(CMPIPropertyMI* mi, const CMPIContext* ctx,
                              const CMPIResult* rslt, const CMPIObjectPath* instPath,
                              const char* name);
#if defined(CMPI_VER_200)
    CMPIStatus (*setPropertyWithOrigin)(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* rslt, CMPIObjectPath* op,
                                        const char* name, const CMPIData data,
                                        const char* origin);
#endif
};

/* ---- Indication MI ---------------------------------------------------- */

struct _CMPIIndicationMI {
    void* hdl;
    CMPIIndicationMIFT* ft;
};

struct _CMPIIndicationMIFT {
    int ftVersion;
    int miVersion;
    const char* miName;

    CMPIStatus (*cleanup)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                          CMPIBoolean terminating);
    CMPIStatus (*authorizeFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                  const CMPISelectExp* filter, const char* className,
                                  const CMPIObjectPath* op, const char* owner);
    CMPIStatus (*mustPoll)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                           const CMPISelectExp* filter, const char* className,
                           const CMPIObjectPath* classPath);
    CMPIStatus (*activateFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                 const CMPISelectExp* filter, const char* className,
                                 const CMPIObjectPath* classPath, CMPIBoolean firstActivation);
    CMPIStatus (*deActivateFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                   const CMPISelectExp* filter, const char* className,
                                   const CMPIObjectPath* classPath, CMPIBoolean lastActivation);
    CMPIStatus (*enableIndications)(CMPIIndicationMI* mi, const CMPIContext* ctx);
    CMPIStatus (*disableIndications)(CMPIIndicationMI* mi, const CMPIContext* ctx);
};

#if defined(__cplusplus)
}
#endif

/* Providers written for level 200 expect the convenience macros here too. */
#include "cmpimacs.h"

#endif /* CMPIFT_H */
