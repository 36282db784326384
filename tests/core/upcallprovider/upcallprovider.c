/* A provider whose own thread calls back into the broker while the broker is
 * creating the provider and while it cleans the provider up: the factory, and
 * later the cleanup, ask the thread for one up-call (an enumeration of the
 * instance names of Upcall_Peer, served by UpcallPeerProvider of this library)
 * and wait for its answer before they return. A broker that keeps a lock of its
 * own across the factory or the cleanup, which the up-call also needs, would
 * never answer; the wait is bounded (UPCALL_PROVIDER_WAIT_S seconds, default
 * 10), so the provider then reports the missing answer instead of hanging.
 *
 * Each outcome is one line appended to the file UPCALL_PROVIDER_LOG names:
 *   factory up-call: rc=0 names=1
 *   cleanup up-call: no answer within 10 s */
#define _POSIX_C_SOURCE 200809L

#include <cmpidt.h>
#include <cmpift.h>
#include <pthread.h>
#include <stdio.h>
#include <stdlib.h>
#include <time.h>

static CMPIStatus status(CMPIrc rc)
{
    CMPIStatus st = {rc, NULL};
    return st;
}

static void logLine(const char* line)
{
    const char* path = getenv("UPCALL_PROVIDER_LOG");
    FILE* out = path != NULL ? fopen(path, "a") : NULL;
    if (out == NULL) {
        return;
    }
    fputs(line, out);
    fclose(out);
}

static long waitSeconds(void)
{
    const char* text = getenv("UPCALL_PROVIDER_WAIT_S");
    return text != NULL ? atol(text) : 10;
}

/* The provider thread and what it was asked for: `requested` up-calls, of
 * which `answered` came back, the last with `lastRc` and `lastNames`; all
 * guarded by g_mutex, and g_changed tells of every change. */
static pthread_mutex_t g_mutex = PTHREAD_MUTEX_INITIALIZER;
static pthread_cond_t g_changed = PTHREAD_COND_INITIALIZER;
static struct {
    pthread_t thread;
    int running;
    int stopping;
    unsigned requested;
    unsigned answered;
    long lastRc;
    long lastNames;
    const CMPIBroker* broker;
    CMPIContext* context;
} g;

static void upcall(void)
{
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIObjectPath* peers = g.broker->eft->newObjectPath(g.broker, "root/cimv2", "Upcall_Peer", NULL);
    CMPIEnumeration* names = g.broker->bft->enumerateInstanceNames(g.broker, g.context, peers, &rc);
    long count = 0;
    while (names != NULL && names->ft->hasNext(names, NULL)) {
        names->ft->getNext(names, NULL);
        ++count;
    }
    pthread_mutex_lock(&g_mutex);
    g.lastRc = rc.rc;
    g.lastNames = count;
    ++g.answered;
    pthread_cond_broadcast(&g_changed);
    pthread_mutex_unlock(&g_mutex);
}

static void* providerThread(void* arg)
{
    (void)arg;
    g.broker->bft->attachThread(g.broker, g.context);
    pthread_mutex_lock(&g_mutex);
    while (!g.stopping) {
        if (g.requested == g.answered) {
            pthread_cond_wait(&g_changed, &g_mutex);
            continue;
        }
        pthread_mutex_unlock(&g_mutex);
        upcall();
        pthread_mutex_lock(&g_mutex);
    }
    pthread_mutex_unlock(&g_mutex);
    g.broker->bft->detachThread(g.broker, g.context);
    return NULL;
}

/* Asks the thread for one up-call and waits for its answer; logs the outcome
 * for `step`. Answers whether the up-call came back. */
static int upcallFromThread(const char* step)
{
    struct timespec deadline;
    clock_gettime(CLOCK_REALTIME, &deadline);
    deadline.tv_sec += waitSeconds();
    pthread_mutex_lock(&g_mutex);
    const unsigned wanted = ++g.requested;
    pthread_cond_broadcast(&g_changed);
    int timedOut = 0;
    while (g.answered < wanted && !timedOut) {
        timedOut = pthread_cond_timedwait(&g_changed, &g_mutex, &deadline) != 0;
    }
    const int answered = g.answered >= wanted;
    const long rc = g.lastRc;
    const long names = g.lastNames;
    pthread_mutex_unlock(&g_mutex);
    char line[96];
    if (answered) {
        snprintf(line, sizeof line, "%s up-call: rc=%ld names=%ld\n", step, rc, names);
    } else {
        snprintf(line, sizeof line, "%s up-call: no answer within %ld s\n", step, waitSeconds());
    }
    logLine(line);
    return answered;
}

static CMPIStatus elementCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi, (void)ctx, (void)terminating;
    if (!g.running) {
        return status(CMPI_RC_OK);
    }
    const int answered = upcallFromThread("cleanup");
    pthread_mutex_lock(&g_mutex);
    g.stopping = 1;
    pthread_cond_broadcast(&g_changed);
    pthread_mutex_unlock(&g_mutex);
    /* A thread stuck in its up-call cannot be joined; it is left behind. */
    if (answered) {
        pthread_join(g.thread, NULL);
    } else {
        pthread_detach(g.thread);
    }
    g.running = 0;
    return status(CMPI_RC_OK);
}

static CMPIStatus returnNames(const CMPIBroker* mb, const CMPIResult* rslt, const char* className)
{
    CMPIObjectPath* op = mb->eft->newObjectPath(mb, "root/cimv2", className, NULL);
    op->ft->addKey(op, "Name", (const CMPIValue*)"one", CMPI_chars);
    rslt->ft->returnObjectPath(rslt, op);
    rslt->ft->returnDone(rslt);
    return status(CMPI_RC_OK);
}

static CMPIStatus elementEnumNames(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                   const CMPIObjectPath* op)
{
    (void)ctx, (void)op;
    return returnNames((const CMPIBroker*)mi->hdl, rslt, "Upcall_Element");
}

static CMPIStatus peerEnumNames(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                const CMPIObjectPath* op)
{
    (void)ctx, (void)op;
    return returnNames((const CMPIBroker*)mi->hdl, rslt, "Upcall_Peer");
}

static CMPIStatus noCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating)
{
    (void)mi, (void)ctx, (void)terminating;
    return status(CMPI_RC_OK);
}

static CMPIStatus noEnum(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                         const CMPIObjectPath* op, const char** properties)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)properties;
    return status(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus noGet(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                        const CMPIObjectPath* op, const char** properties)
{
    return noEnum(mi, ctx, rslt, op, properties);
}

static CMPIStatus noCreate(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op, const CMPIInstance* inst)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)inst;
    return status(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus noModify(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op, const CMPIInstance* inst, const char** properties)
{
    (void)properties;
    return noCreate(mi, ctx, rslt, op, inst);
}

static CMPIStatus noDelete(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* op)
{
    (void)mi, (void)ctx, (void)rslt, (void)op;
    return status(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus noQuery(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                          const CMPIObjectPath* op, const char* query, const char* lang)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)query, (void)lang;
    return status(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIInstanceMIFT elementFT = {CMPICurrentVersion, CMPICurrentVersion, "instanceUpcall", elementCleanup,
                                     elementEnumNames, noEnum, noGet, noCreate, noModify, noDelete, noQuery};
static CMPIInstanceMIFT peerFT = {CMPICurrentVersion, CMPICurrentVersion, "instanceUpcallPeer", noCleanup,
                                  peerEnumNames, noEnum, noGet, noCreate, noModify, noDelete, noQuery};
static CMPIInstanceMI elementMI = {NULL, &elementFT};
static CMPIInstanceMI peerMI = {NULL, &peerFT};

/* Starts the thread, then has it make one up-call before the broker gets the MI. */
CMPI_EXTERN_C CMPIInstanceMI* UpcallProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                               CMPIStatus* rc)
{
    elementMI.hdl = (void*)mb;
    g.broker = mb;
    g.context = mb->bft->prepareAttachThread(mb, ctx);
    g.stopping = 0;
    g.running = pthread_create(&g.thread, NULL, providerThread, NULL) == 0;
    if (!g.running) {
        if (rc != NULL) {
            *rc = status(CMPI_RC_ERR_FAILED);
        }
        return NULL;
    }
    upcallFromThread("factory");
    if (rc != NULL) {
        *rc = status(CMPI_RC_OK);
    }
    return &elementMI;
}

CMPI_EXTERN_C CMPIInstanceMI* UpcallPeerProvider_Create_InstanceMI(const CMPIBroker* mb, const CMPIContext* ctx,
                                                                   CMPIStatus* rc)
{
    (void)ctx;
    peerMI.hdl = (void*)mb;
    if (rc != NULL) {
        *rc = status(CMPI_RC_OK);
    }
    return &peerMI;
}
