/* A provider that takes its time: every instance enumeration of Raw_Element sleeps
 * for SLOW_PROVIDER_MS milliseconds (default 2000) and then returns nothing. The
 * end-to-end tests use it to overrun the host's provider call limit. */
#define _POSIX_C_SOURCE 200809L /* nanosleep */

#include <cmpidt.h>
#include <cmpift.h>
#include <stdlib.h>
#include <time.h>

static CMPIStatus ok(void)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    return st;
}

static CMPIStatus refused(void)
{
    CMPIStatus st = {CMPI_RC_ERR_NOT_SUPPORTED, NULL};
    return st;
}

static void takeTime(void)
{
    const char* text = getenv("SLOW_PROVIDER_MS");
    long ms = text != NULL ? atol(text) : 2000;
    struct timespec delay = {ms / 1000, (ms % 1000) * 1000000L};
    nanosleep(&delay, NULL);
}

static CMPIStatus slowCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi, (void)ctx, (void)terminating;
    return ok();
}

static CMPIStatus slowEnumNames(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                const CMPIObjectPath* op)
{
    (void)mi, (void)ctx, (void)op;
    takeTime();
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus slowEnum(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op, const char** properties)
{
    (void)properties;
    return slowEnumNames(mi, ctx, rslt, op);
}

static CMPIStatus slowGet(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                          const CMPIObjectPath* op, const char** properties)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)properties;
    return refused();
}

static CMPIStatus slowCreate(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op, const CMPIInstance* inst)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)inst;
    return refused();
}

static CMPIStatus slowModify(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op, const CMPIInstance* inst, const char** properties)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)inst, (void)properties;
    return refused();
}

static CMPIStatus slowDelete(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op)
{
    (void)mi, (void)ctx, (void)rslt, (void)op;
    return refused();
}

static CMPIStatus slowQuery(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                            const CMPIObjectPath* op, const char* query, const char* lang)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)query, (void)lang;
    return refused();
}

static CMPIInstanceMIFT slowFT = {CMPICurrentVersion, CMPICurrentVersion, "instanceSlow", slowCleanup,
                                  slowEnumNames, slowEnum, slowGet, slowCreate, slowModify, slowDelete,
                                  slowQuery};
static CMPIInstanceMI slowMI = {NULL, &slowFT};

CMPI_EXTERN_C CMPIInstanceMI* SlowProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                             CMPIStatus* rc)
{
    (void)mb, (void)ctx;
    if (rc != NULL) {
        *rc = ok();
    }
    return &slowMI;
}
