/*
 * A test provider written against the raw CMPI C ABI: every MI function table
 * slot, steered by the request's principal:
 *   ""/other  two instances with properties of mixed types
 *   "many"    five instances, "none" nothing, "bench" one with 30 properties
 *   "error"   CMPI_RC_ERR_ACCESS_DENIED with a message, "errornomsg" NOT_FOUND without
 *   "garbage" hands the result NULL and wrongly typed objects and returns, as
 *             uint32 data, the status codes it got back
 *   "upcall"  enumerates Raw_SubElement through the broker and returns what came back
 *   "paths"   two object paths (path-0, path-1), whatever was asked for
 *   "nosuchproperty" CMPI_RC_ERR_NO_SUCH_PROPERTY "key Name is missing",
 *             "invalidclass" CMPI_RC_ERR_INVALID_CLASS "class not served here"
 *   "noquery" execQuery answers CMPI_RC_ERR_NOT_SUPPORTED without a message,
 *             as the binding's default does
 * getInstance of the Name "gaps" answers Numbers = 0, NULL, 20; with the principal
 * "lateerror" getInstance returns the instance, then fails with CMPI_RC_ERR_FAILED.
 * Lifecycle calls are appended, one line each, to the file named by the
 * environment variable RAW_PROVIDER_LOG; RAW_PROVIDER_CLEANUP_RC sets what
 * cleanup(terminating = false) answers.
 */
#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include <pthread.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

static const CMPIBroker* broker;
static const char* kNamespace = "root/cimv2";

/* ---- helpers ------------------------------------------------------------ */

__attribute__((format(printf, 1, 2))) static void logLine(const char* format, ...);

static void logLine(const char* format, ...)
{
    const char* path = getenv("RAW_PROVIDER_LOG");
    FILE* file;
    va_list args;
    if (path == NULL || (file = fopen(path, "a")) == NULL) {
        return;
    }
    va_start(args, format);
    vfprintf(file, format, args);
    va_end(args);
    fputc('\n', file);
    fclose(file);
}

static CMPIStatus status(CMPIrc rc, const char* message)
{
    CMPIStatus st = {rc, NULL};
    if (message != NULL) {
        st.msg = broker->eft->newString(broker, message, NULL);
    }
    return st;
}

static const char* entryText(const CMPIContext* ctx, const char* name)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    CMPIData d = ctx->ft->getEntry(ctx, name, &st);
    if (st.rc != CMPI_RC_OK || d.type != CMPI_string || d.value.string == NULL) {
        return "";
    }
    return (const char*)d.value.string->hdl; /* hdl is the text, as CMGetCharPtr reads it */
}

static const char* principal(const CMPIContext* ctx) { return entryText(ctx, CMPIPrincipal); }

static int is(const char* a, const char* b) { return strcmp(a, b) == 0; }

static const char* className(const CMPIObjectPath* op)
{
    CMPIString* s = op->ft->getClassName(op, NULL);
    return s != NULL ? (const char*)s->hdl : "";
}

static CMPIObjectPath* elementPath(const char* cls, const char* name)
{
    CMPIObjectPath* op = broker->eft->newObjectPath(broker, kNamespace, cls, NULL);
    op->ft->addKey(op, "Name", (const CMPIValue*)name, CMPI_chars);
    return op;
}

/* An instance of `cls` with properties of mixed types. */
static CMPIInstance* makeElement(const char* cls, const char* name, CMPIUint32 counter)
{
    CMPIObjectPath* op = elementPath(cls, name);
    CMPIInstance* inst = broker->eft->newInstance(broker, op, NULL);
    CMPIBoolean flag = 1;
    CMPISint64 big = -1234567890123LL;
    CMPIReal64 ratio = 0.5;
    CMPIDateTime* stamp = broker->eft->newDateTimeFromBinary(broker, 1000000ULL * 86400, 0, NULL);
    CMPIArray* numbers = broker->eft->newArray(broker, 3, CMPI_uint16, NULL);
    CMPIUint16 i;
    for (i = 0; i < 3; ++i) {
        CMPIUint16 v = (CMPIUint16)(i * 10);
        numbers->ft->setElementAt(numbers, i, (const CMPIValue*)&v, CMPI_uint16);
    }
    inst->ft->setProperty(inst, "Counter", (const CMPIValue*)&counter, CMPI_uint32);
    inst->ft->setProperty(inst, "Text", (const CMPIValue*)"raw text", CMPI_chars);
    inst->ft->setProperty(inst, "Flag", (const CMPIValue*)&flag, CMPI_boolean);
    inst->ft->setProperty(inst, "Big", (const CMPIValue*)&big, CMPI_sint64);
    inst->ft->setProperty(inst, "Ratio", (const CMPIValue*)&ratio, CMPI_real64);
    inst->ft->setProperty(inst, "Stamp", (const CMPIValue*)&stamp, CMPI_dateTime);
    inst->ft->setProperty(inst, "Numbers", (const CMPIValue*)&numbers, CMPI_uint16A);
    return inst;
}

/* One instance with 30 properties: 10 strings, 10 integers of several widths, 5 booleans, 5 reals. */
static CMPIInstance* makeBenchInstance(const char* cls)
{
    static const char* names[30] = {
        "S00", "S01", "S02", "S03", "S04", "S05", "S06", "S07", "S08", "S09",
        "U00", "U01", "U02", "U03", "U04", "U05", "U06", "U07", "U08", "U09",
        "B00", "B01", "B02", "B03", "B04", "R00", "R01", "R02", "R03", "R04"};
    CMPIObjectPath* op = elementPath(cls, "bench");
    CMPIInstance* inst = broker->eft->newInstance(broker, op, NULL);
    int i;
    for (i = 0; i < 10; ++i) {
        inst->ft->setProperty(inst, names[i], (const CMPIValue*)"a string value of moderate length", CMPI_chars);
    }
    for (i = 10; i < 20; ++i) {
        CMPIValue v;
        v.uint64 = (CMPIUint64)i * 1000003ULL;
        inst->ft->setProperty(inst, names[i], &v, (i % 2) != 0 ? CMPI_uint64 : CMPI_uint32);
    }
    for (i = 20; i < 25; ++i) {
        CMPIBoolean b = (CMPIBoolean)(i & 1);
        inst->ft->setProperty(inst, names[i], (const CMPIValue*)&b, CMPI_boolean);
    }
    for (i = 25; i < 30; ++i) {
        CMPIReal64 r = i * 0.25;
        inst->ft->setProperty(inst, names[i], (const CMPIValue*)&r, CMPI_real64);
    }
    return inst;
}

/* Hands the result garbage and returns the codes it got back, as uint32 data. */
static CMPIStatus returnGarbage(const CMPIResult* rslt, const CMPIObjectPath* op)
{
    CMPIStatus got[4];
    int i;
    got[0] = rslt->ft->returnInstance(rslt, NULL);
    got[1] = rslt->ft->returnInstance(rslt, (const CMPIInstance*)op); /* a path passed as an instance */
    got[2] = rslt->ft->returnObjectPath(rslt, NULL);
    got[3] = rslt->ft->returnData(rslt, (const CMPIValue*)&op, CMPI_ref);
    for (i = 0; i < 4; ++i) {
        CMPIUint32 rc = (CMPIUint32)got[i].rc;
        rslt->ft->returnData(rslt, (const CMPIValue*)&rc, CMPI_uint32);
    }
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

/* Steering common to the instance functions; returns 1 when it answered. */
static int steered(const CMPIContext* ctx, const CMPIResult* rslt, const CMPIObjectPath* op, CMPIStatus* out)
{
    const char* who = principal(ctx);
    if (is(who, "error")) {
        *out = status(CMPI_RC_ERR_ACCESS_DENIED, "denied by raw provider");
        return 1;
    }
    if (is(who, "errornomsg")) {
        *out = status(CMPI_RC_ERR_NOT_FOUND, NULL);
        return 1;
    }
    if (is(who, "nosuchproperty")) {
        *out = status(CMPI_RC_ERR_NO_SUCH_PROPERTY, "key Name is missing");
        return 1;
    }
    if (is(who, "invalidclass")) {
        *out = status(CMPI_RC_ERR_INVALID_CLASS, "class not served here");
        return 1;
    }
    if (is(who, "none")) {
        rslt->ft->returnDone(rslt);
        *out = status(CMPI_RC_OK, NULL);
        return 1;
    }
    if (is(who, "garbage")) {
        *out = returnGarbage(rslt, op);
        return 1;
    }
    if (is(who, "paths")) {
        /* Object paths, whatever was asked for (instances included). */
        rslt->ft->returnObjectPath(rslt, elementPath(className(op), "path-0"));
        rslt->ft->returnObjectPath(rslt, elementPath(className(op), "path-1"));
        rslt->ft->returnDone(rslt);
        *out = status(CMPI_RC_OK, NULL);
        return 1;
    }
    return 0;
}

/* ---- instance MI -------------------------------------------------------- */

static CMPIStatus cleanupWith(const char* kind, CMPIBoolean terminating)
{
    const char* rc = getenv("RAW_PROVIDER_CLEANUP_RC");
    logLine("cleanup %s terminating=%d", kind, (int)terminating);
    if (!terminating && rc != NULL) {
        return status((CMPIrc)atoi(rc), NULL);
    }
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)ctx;
    return cleanupWith((const char*)mi->hdl, terminating);
}

static CMPIStatus returnUpcall(const CMPIContext* ctx, const CMPIResult* rslt)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    CMPIObjectPath* op = broker->eft->newObjectPath(broker, kNamespace, "Raw_SubElement", NULL);
    CMPIEnumeration* en = broker->bft->enumerateInstances(broker, ctx, op, NULL, &st);
    if (en == NULL) {
        return st;
    }
    while (en->ft->hasNext(en, NULL)) {
        CMPIData d = en->ft->getNext(en, NULL);
        rslt->ft->returnInstance(rslt, d.value.inst);
    }
    rslt->ft->returnDone(rslt);
    return st;
}

static CMPIStatus enumerate(const CMPIContext* ctx, const CMPIResult* rslt, const CMPIObjectPath* op, int names)
{
    CMPIStatus st;
    const char* cls = className(op);
    const char* who = principal(ctx);
    int count = is(who, "many") ? 5 : 2;
    int i;
    char name[32];
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    if (is(who, "upcall") && !is(cls, "Raw_SubElement")) {
        return returnUpcall(ctx, rslt);
    }
    if (is(who, "bench")) {
        CMPIInstance* inst = makeBenchInstance(cls);
        rslt->ft->returnInstance(rslt, inst);
        rslt->ft->returnDone(rslt);
        return status(CMPI_RC_OK, NULL);
    }
    for (i = 0; i < count; ++i) {
        CMPIInstance* inst;
        snprintf(name, sizeof name, "%s-%d", cls, i);
        inst = makeElement(cls, name, (CMPIUint32)i);
        if (names) {
            rslt->ft->returnObjectPath(rslt, inst->ft->getObjectPath(inst, NULL));
        } else {
            rslt->ft->returnInstance(rslt, inst);
        }
    }
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instEnumNames(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                const CMPIObjectPath* op)
{
    (void)mi;
    return enumerate(ctx, rslt, op, 1);
}

static CMPIStatus instEnum(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op, const char** properties)
{
    (void)mi;
    (void)properties;
    return enumerate(ctx, rslt, op, 0);
}

static CMPIStatus instGet(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                          const CMPIObjectPath* op, const char** properties)
{
    CMPIStatus st;
    CMPIData key = op->ft->getKey(op, "Name", NULL);
    CMPIInstance* inst;
    (void)mi;
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    if (key.type != CMPI_string) {
        return status(CMPI_RC_ERR_NOT_FOUND, "no Name key");
    }
    inst = makeElement(className(op), (const char*)key.value.string->hdl, 7);
    if (is((const char*)key.value.string->hdl, "gaps")) {
        /* Numbers 0, NULL, 20: element 1 is never set. */
        CMPIArray* gaps = broker->eft->newArray(broker, 3, CMPI_uint16, NULL);
        CMPIUint16 v = 0;
        gaps->ft->setElementAt(gaps, 0, (const CMPIValue*)&v, CMPI_uint16);
        v = 20;
        gaps->ft->setElementAt(gaps, 2, (const CMPIValue*)&v, CMPI_uint16);
        inst->ft->setProperty(inst, "Numbers", (const CMPIValue*)&gaps, CMPI_uint16A);
    }
    if (properties != NULL) {
        inst->ft->setPropertyFilter(inst, properties, NULL);
    }
    rslt->ft->returnInstance(rslt, inst);
    if (is(principal(ctx), "lateerror")) {
        return status(CMPI_RC_ERR_FAILED, "failed after returning the instance");
    }
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instCreate(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op, const CMPIInstance* inst)
{
    CMPIStatus st;
    (void)mi;
    (void)op;
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    rslt->ft->returnObjectPath(rslt, inst->ft->getObjectPath(inst, NULL));
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instModify(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op, const CMPIInstance* inst, const char** properties)
{
    CMPIStatus st;
    (void)mi;
    (void)properties;
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    /* Echo what the provider saw: the modified instance. */
    rslt->ft->returnInstance(rslt, inst);
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instDelete(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op)
{
    CMPIStatus st;
    (void)mi;
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus instExecQuery(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                const CMPIObjectPath* op, const char* query, const char* lang)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    CMPISelectExp* se;
    int i;
    (void)mi;
    if (is(principal(ctx), "noquery")) {
        return status(CMPI_RC_ERR_NOT_SUPPORTED, NULL);
    }
    se = broker->eft->newSelectExp(broker, query, lang, NULL, &st);
    if (se == NULL) {
        return st;
    }
    /* Return the instances the query selects, out of five. */
    for (i = 0; i < 5; ++i) {
        char name[32];
        CMPIInstance* inst;
        snprintf(name, sizeof name, "q-%d", i);
        inst = makeElement(className(op), name, (CMPIUint32)i);
        if (se->ft->evaluate(se, inst, NULL)) {
            rslt->ft->returnInstance(rslt, inst);
        }
    }
    (void)ctx;
    rslt->ft->returnDone(rslt);
    return st;
}

static CMPIInstanceMIFT instanceFT = {
    CMPICurrentVersion, CMPICurrentVersion, "instanceRaw", instCleanup, instEnumNames, instEnum,
    instGet, instCreate, instModify, instDelete, instExecQuery};

/* One MI object per provider name: hdl names the provider for the log. */
static CMPIInstanceMI elementMI = {(void*)"RawElementProvider", &instanceFT};
static CMPIInstanceMI subMI = {(void*)"RawSubProvider", &instanceFT};

static void logFactory(const char* kind, const CMPIContext* ctx)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    CMPIData flags = ctx->ft->getEntry(ctx, CMPIInvocationFlags, &st);
    logLine("factory %s flags=%u principal=%s params=%s", kind, (unsigned)flags.value.uint32, principal(ctx),
            entryText(ctx, "sfcbProviderParameters"));
}

CMPI_EXTERN_C CMPIInstanceMI* RawElementProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                  CMPIStatus* rc)
{
    broker = mb;
    logFactory("RawElementProvider Instance", ctx);
    (void)rc; /* left as the broker preset it, as the 2.0 stub macros do */
    return &elementMI;
}

CMPI_EXTERN_C CMPIInstanceMI* RawSubProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                              CMPIStatus* rc)
{
    broker = mb;
    logFactory("RawSubProvider Instance", ctx);
    rc->rc = CMPI_RC_OK;
    return &subMI;
}

CMPI_EXTERN_C CMPIInstanceMI* RawFailingProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                  CMPIStatus* rc)
{
    (void)ctx;
    broker = mb;
    *rc = status(CMPI_RC_ERR_FAILED, "factory refused");
    return NULL;
}

/* A table whose request slots are missing: the broker must not call them. */
static CMPIInstanceMIFT garbageFT = {CMPICurrentVersion, CMPICurrentVersion, "instanceGarbage", instCleanup,
                                     NULL, NULL, NULL, NULL, NULL, NULL, NULL};
static CMPIInstanceMI garbageMI = {(void*)"RawGarbageProvider", &garbageFT};

CMPI_EXTERN_C CMPIInstanceMI* RawGarbageProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                  CMPIStatus* rc)
{
    (void)ctx;
    (void)rc;
    broker = mb;
    return &garbageMI;
}

static CMPIInstanceMI nullTableMI = {NULL, NULL};

CMPI_EXTERN_C CMPIInstanceMI* RawNullTableProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                    CMPIStatus* rc)
{
    (void)ctx;
    (void)rc;
    broker = mb;
    return &nullTableMI;
}

/* ---- method MI ---------------------------------------------------------- */

static CMPIStatus methCleanup(CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi;
    (void)ctx;
    return cleanupWith("RawElementProvider Method", terminating);
}

struct ThreadJob {
    const CMPIContext* ctx;
    int delivered;
};

/* A provider thread: attach, deliver one indication, free its memory, detach. */
static void* indicationThread(void* arg)
{
    struct ThreadJob* job = (struct ThreadJob*)arg;
    CMPIStatus st;
    CMPIObjectPath* op;
    CMPIInstance* ind;
    CMPIUint32 seq = 1;
    broker->bft->attachThread(broker, job->ctx);
    op = broker->eft->newObjectPath(broker, kNamespace, "Raw_Indication", NULL);
    ind = broker->eft->newInstance(broker, op, NULL);
    ind->ft->setProperty(ind, "Message", (const CMPIValue*)"from a provider thread", CMPI_chars);
    ind->ft->setProperty(ind, "Sequence", (const CMPIValue*)&seq, CMPI_uint32);
    st = broker->bft->deliverIndication(broker, job->ctx, kNamespace, ind);
    job->delivered = st.rc == CMPI_RC_OK;
    if (CMHasHostExtensions(job->ctx)) {
        CMReleaseThreadMemory(job->ctx);
    }
    broker->bft->detachThread(broker, job->ctx);
    return NULL;
}

static const char* argText(const CMPIArgs* in, const char* name, const char* otherwise)
{
    CMPIData d = in->ft->getArg(in, name, NULL);
    return d.type == CMPI_string && d.state == CMPI_goodValue && d.value.string != NULL
               ? (const char*)d.value.string->hdl
               : otherwise;
}

static CMPIUint32 argUint(const CMPIArgs* in, const char* name, CMPIUint32 otherwise)
{
    CMPIData d = in->ft->getArg(in, name, NULL);
    return d.type == CMPI_uint32 && d.state == CMPI_goodValue ? d.value.uint32 : otherwise;
}

/* Raise: Count indications (1 when not given) delivered on the calling thread. */
static CMPIUint32 raiseIndications(const CMPIContext* ctx, const CMPIArgs* in)
{
    const char* cls = argText(in, "IndicationClass", "Raw_Indication");
    const char* message = argText(in, "Message", "");
    CMPIUint32 seq = argUint(in, "Sequence", 0);
    CMPIUint32 count = argUint(in, "Count", 1), i, accepted = 0;
    for (i = 0; i < count; ++i, ++seq) {
        CMPIObjectPath* op = broker->eft->newObjectPath(broker, kNamespace, cls, NULL);
        CMPIInstance* ind = broker->eft->newInstance(broker, op, NULL);
        CMPIStatus st;
        ind->ft->setProperty(ind, "Message", (const CMPIValue*)message, CMPI_chars);
        ind->ft->setProperty(ind, "Sequence", (const CMPIValue*)&seq, CMPI_uint32);
        st = broker->bft->deliverIndication(broker, ctx, kNamespace, ind);
        accepted += st.rc == CMPI_RC_OK ? 1U : 0U;
        ind->ft->release(ind);
        op->ft->release(op);
    }
    return accepted;
}

/* JoinNames: the Name keys of the Elements references, joined with ',' (NULL for a null element) */
static CMPIStatus joinNames(const CMPIResult* rslt, const CMPIArgs* in)
{
    CMPIData refs = in->ft->getArg(in, "Elements", NULL);
    char joined[256] = "";
    CMPICount n, i;
    if (refs.type != CMPI_refA || refs.value.array == NULL) {
        return status(CMPI_RC_ERR_INVALID_PARAMETER, "Elements is not an array of references");
    }
    n = refs.value.array->ft->getSize(refs.value.array, NULL);
    for (i = 0; i < n; ++i) {
        CMPIData ref = refs.value.array->ft->getElementAt(refs.value.array, i, NULL);
        const char* text = "NULL";
        if ((ref.state & CMPI_nullValue) == 0 && ref.value.ref != NULL) {
            CMPIData name = ref.value.ref->ft->getKey(ref.value.ref, "Name", NULL);
            text = name.type == CMPI_string ? (const char*)name.value.string->hdl : "?";
        }
        if (i > 0) {
            strncat(joined, ",", sizeof joined - strlen(joined) - 1);
        }
        strncat(joined, text, sizeof joined - strlen(joined) - 1);
    }
    rslt->ft->returnData(rslt, (const CMPIValue*)joined, CMPI_chars);
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus methInvoke(CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                             const CMPIObjectPath* op, const char* method, const CMPIArgs* in, CMPIArgs* out)
{
    CMPIUint32 answer = 42;
    (void)mi;
    if (is(method, "Echo")) {
        CMPICount n = in->ft->getArgCount(in, NULL), i;
        for (i = 0; i < n; ++i) {
            CMPIString* name = NULL;
            CMPIData d = in->ft->getArgAt(in, i, &name, NULL);
            out->ft->addArg(out, (const char*)name->hdl, &d.value, d.type);
        }
    } else if (is(method, "JoinNames")) {
        return joinNames(rslt, in);
    } else if (is(method, "Params")) {
        rslt->ft->returnData(rslt, (const CMPIValue*)entryText(ctx, "sfcbProviderParameters"), CMPI_chars);
        rslt->ft->returnDone(rslt);
        return status(CMPI_RC_OK, NULL);
    } else if (is(method, "Context")) {
        CMPICount n = ctx->ft->getEntryCount(ctx, NULL), i;
        for (i = 0; i < n; ++i) {
            CMPIString* name = NULL;
            CMPIData d = ctx->ft->getEntryAt(ctx, i, &name, NULL);
            out->ft->addArg(out, (const char*)name->hdl, &d.value, d.type);
        }
    } else if (is(method, "StartThread")) {
        struct ThreadJob job = {broker->bft->prepareAttachThread(broker, ctx), 0};
        pthread_t thread;
        pthread_create(&thread, NULL, indicationThread, &job);
        pthread_join(thread, NULL);
        answer = (CMPIUint32)job.delivered;
    } else if (is(method, "Raise")) {
        answer = raiseIndications(ctx, in);
    } else if (is(method, "UpCallGet")) {
        CMPIStatus st = {CMPI_RC_OK, NULL};
        CMPIObjectPath* path = elementPath("Raw_Element", "fetched");
        CMPIInstance* inst = broker->bft->getInstance(broker, ctx, path, NULL, &st);
        if (inst == NULL) {
            return st;
        }
        rslt->ft->returnData(rslt, (const CMPIValue*)&inst, CMPI_instance);
        rslt->ft->returnDone(rslt);
        return st;
    } else {
        (void)op;
        return status(CMPI_RC_ERR_METHOD_NOT_FOUND, method);
    }
    rslt->ft->returnData(rslt, (const CMPIValue*)&answer, CMPI_uint32);
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIMethodMIFT methodFT = {CMPICurrentVersion, CMPICurrentVersion, "methodRaw", methCleanup, methInvoke};
static CMPIMethodMI methodMI = {NULL, &methodFT};

CMPI_EXTERN_C CMPIMethodMI* RawElementProvider_Create_MethodMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                              CMPIStatus* rc)
{
    broker = mb;
    logFactory("RawElementProvider Method", ctx);
    rc->rc = CMPI_RC_OK;
    return &methodMI;
}

/* ---- association MI ----------------------------------------------------- */

static CMPIStatus assocCleanup(CMPIAssociationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi;
    (void)ctx;
    return cleanupWith("RawAssocProvider Association", terminating);
}

/* The association instance linking `op` to a fixed partner. */
static CMPIInstance* makeAssoc(const CMPIObjectPath* op, const char* assocClass)
{
    CMPIObjectPath* path = broker->eft->newObjectPath(broker, kNamespace, assocClass, NULL);
    CMPIInstance* inst = broker->eft->newInstance(broker, path, NULL);
    CMPIObjectPath* partner = elementPath("Raw_Element", "partner");
    inst->ft->setProperty(inst, "Left", (const CMPIValue*)&op, CMPI_ref);
    inst->ft->setProperty(inst, "Right", (const CMPIValue*)&partner, CMPI_ref);
    inst->ft->setProperty(inst, "SeenAssocClass", (const CMPIValue*)assocClass, CMPI_chars);
    return inst;
}

static CMPIStatus assocAssociators(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                   const CMPIObjectPath* op, const char* assocClass, const char* resultClass,
                                   const char* role, const char* resultRole, const char** properties)
{
    CMPIStatus st;
    CMPIInstance* partner = makeElement("Raw_Element", "partner", 1);
    (void)mi;
    (void)resultClass;
    (void)role;
    (void)resultRole;
    (void)properties;
    if (steered(ctx, rslt, op, &st)) {
        return st;
    }
    partner->ft->setProperty(partner, "Text", (const CMPIValue*)(assocClass != NULL ? assocClass : "(null)"), CMPI_chars);
    rslt->ft->returnInstance(rslt, partner);
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus assocAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                       const CMPIObjectPath* op, const char* assocClass, const char* resultClass,
                                       const char* role, const char* resultRole)
{
    (void)mi;
    (void)ctx;
    (void)op;
    (void)assocClass;
    (void)resultClass;
    (void)role;
    (void)resultRole;
    rslt->ft->returnObjectPath(rslt, elementPath("Raw_Element", "partner"));
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus assocReferences(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                  const CMPIObjectPath* op, const char* resultClass, const char* role,
                                  const char** properties)
{
    (void)mi;
    (void)ctx;
    (void)role;
    (void)properties;
    rslt->ft->returnInstance(rslt, makeAssoc(op, resultClass != NULL ? resultClass : "Raw_Assoc"));
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus assocReferenceNames(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                      const CMPIObjectPath* op, const char* resultClass, const char* role)
{
    CMPIInstance* inst = makeAssoc(op, resultClass != NULL ? resultClass : "Raw_Assoc");
    (void)mi;
    (void)ctx;
    (void)role;
    rslt->ft->returnObjectPath(rslt, inst->ft->getObjectPath(inst, NULL));
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK, NULL);
}

static CMPIAssociationMIFT assocFT = {CMPICurrentVersion, CMPICurrentVersion, "associationRaw", assocCleanup,
                                      assocAssociators, assocAssociatorNames, assocReferences, assocReferenceNames};
static CMPIAssociationMI assocMI = {NULL, &assocFT};

CMPI_EXTERN_C CMPIAssociationMI* RawAssocProvider_Create_AssociationMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                      CMPIStatus* rc)
{
    broker = mb;
    logFactory("RawAssocProvider Association", ctx);
    rc->rc = CMPI_RC_OK;
    return &assocMI;
}

/* ---- indication MI ------------------------------------------------------ */

static CMPIStatus indCleanup(CMPIIndicationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi;
    (void)ctx;
    return cleanupWith("RawIndicationProvider Indication", terminating);
}

static const char* queryOf(const CMPISelectExp* se)
{
    CMPIString* s = se->ft->getString(se, NULL);
    return s != NULL ? (const char*)s->hdl : "";
}

static CMPIStatus indAuthorize(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                               const char* cls, const CMPIObjectPath* op, const char* owner)
{
    (void)mi;
    (void)ctx;
    (void)op;
    logLine("authorizeFilter %s owner=%s", queryOf(se), owner);
    if (is(owner, "intruder")) {
        return status(CMPI_RC_ERR_ACCESS_DENIED, "filter refused");
    }
    (void)cls;
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus indMustPoll(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                              const char* cls, const CMPIObjectPath* op)
{
    (void)mi;
    (void)ctx;
    (void)se;
    (void)op;
    logLine("mustPoll %s", cls);
    return status(CMPI_RC_ERR_NOT_SUPPORTED, NULL);
}

static CMPIStatus indActivate(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                              const char* cls, const CMPIObjectPath* op, CMPIBoolean first)
{
    (void)mi;
    (void)se;
    (void)op;
    logLine("activateFilter %s first=%d", cls, (int)first);
    /* With RAW_PROVIDER_RAISE_ON_ACTIVATE set, one indication of the filter's class
       (Message "activated", Sequence 0) is delivered before the activation answers,
       as a provider does that reports a first state at once. */
    if (getenv("RAW_PROVIDER_RAISE_ON_ACTIVATE") != NULL) {
        CMPIObjectPath* path = broker->eft->newObjectPath(broker, kNamespace, cls, NULL);
        CMPIInstance* ind = broker->eft->newInstance(broker, path, NULL);
        CMPIUint32 seq = 0;
        ind->ft->setProperty(ind, "Message", (const CMPIValue*)"activated", CMPI_chars);
        ind->ft->setProperty(ind, "Sequence", (const CMPIValue*)&seq, CMPI_uint32);
        (void)broker->bft->deliverIndication(broker, ctx, kNamespace, ind);
        ind->ft->release(ind);
        path->ft->release(path);
    }
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus indDeactivate(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                                const char* cls, const CMPIObjectPath* op, CMPIBoolean last)
{
    (void)mi;
    (void)ctx;
    (void)se;
    (void)op;
    logLine("deActivateFilter %s last=%d", cls, (int)last);
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus indEnable(CMPIIndicationMI* mi, const CMPIContext* ctx)
{
    (void)mi;
    (void)ctx;
    logLine("enableIndications");
    return status(CMPI_RC_OK, NULL);
}

static CMPIStatus indDisable(CMPIIndicationMI* mi, const CMPIContext* ctx)
{
    (void)mi;
    (void)ctx;
    logLine("disableIndications");
    return status(CMPI_RC_OK, NULL);
}

static CMPIIndicationMIFT indicationFT = {CMPICurrentVersion, CMPICurrentVersion, "IndicationRaw", indCleanup,
                                          indAuthorize, indMustPoll, indActivate, indDeactivate, indEnable,
                                          indDisable};
static CMPIIndicationMI indicationMI = {NULL, &indicationFT};

CMPI_EXTERN_C CMPIIndicationMI* RawIndicationProvider_Create_IndicationMI(const CMPIBroker* mb,
                                                                         const CMPIContext* ctx, CMPIStatus* rc)
{
    broker = mb;
    logFactory("RawIndicationProvider Indication", ctx);
    rc->rc = CMPI_RC_OK;
    return &indicationMI;
}
