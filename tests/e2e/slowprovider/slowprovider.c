/* A provider that takes its time: every instance enumeration of Raw_Element sleeps
 * for SLOW_PROVIDER_MS milliseconds (default 2000) and then returns nothing. The
 * end-to-end tests use it to overrun the host's provider call limit. With
 * SLOW_PROVIDER_INSTANCES=N, EnumerateInstances first returns N instances with long
 * names (enough for the host to start sending the answer), then sleeps. */
#define _POSIX_C_SOURCE 200809L /* nanosleep */

#include <cmpidt.h>
#include <cmpift.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <time.h>

static const CMPIBroker* broker;

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

static void returnLongNamedInstances(const CMPIResult* rslt, long count)
{
    char name[300];
    long i;
    for (i = 0; i < count; ++i) {
        CMPIObjectPath* op = broker->eft->newObjectPath(broker, "root/cimv2", "Raw_Element", NULL);
        CMPIInstance* inst;
        size_t used;
        snprintf(name, sizeof name, "slow-%ld-", i);
        used = strlen(name);
        memset(name + used, 'x', 200);
        name[used + 200] = '\0';
        op->ft->addKey(op, "Name", (const CMPIValue*)name, CMPI_chars);
        inst = broker->eft->newInstance(broker, op, NULL);
        inst->ft->setProperty(inst, "Name", (const CMPIValue*)name, CMPI_chars);
        rslt->ft->returnInstance(rslt, inst);
    }
}

static CMPIStatus slowEnum(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op, const char** properties)
{
    const char* count = getenv("SLOW_PROVIDER_INSTANCES");
    (void)properties;
    if (count != NULL) {
        returnLongNamedInstances(rslt, atol(count));
    }
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
    (void)ctx;
    broker = mb;
    if (rc != NULL) {
        *rc = ok();
    }
    return &slowMI;
}
