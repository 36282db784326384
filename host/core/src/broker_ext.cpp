// The operating-system table (CMPIBrokerExtFT) over pthreads. Every slot is
// filled, including those sfcb leaves NULL.
#include "broker_tables.hpp"

#include <pthread.h>
#include <time.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

namespace orv::host::detail {

namespace {

char* resolveFileName(const char* fileName) {
    if (fileName == nullptr) {
        return nullptr;
    }
    std::string name = std::string("lib") + fileName + ".so";
    return strdup(name.c_str());
}

CMPI_THREAD_TYPE newThread(CMPI_THREAD_RETURN(CMPI_THREAD_CDECL* start)(void*), void* parm, int detached) {
    pthread_t thread{};
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    if (detached != 0) {
        pthread_attr_setdetachstate(&attributes, PTHREAD_CREATE_DETACHED);
    }
    int rc = pthread_create(&thread, &attributes, start, parm);
    pthread_attr_destroy(&attributes);
    return rc == 0 ? reinterpret_cast<CMPI_THREAD_TYPE>(thread) : nullptr;
}

int joinThread(CMPI_THREAD_TYPE thread, CMPI_THREAD_RETURN* result) {
    return pthread_join(reinterpret_cast<pthread_t>(thread), result);
}

int exitThread(CMPI_THREAD_RETURN result) { pthread_exit(result); }

int cancelThread(CMPI_THREAD_TYPE thread) { return pthread_cancel(reinterpret_cast<pthread_t>(thread)); }

int threadSleep(CMPIUint32 msec) {
    timespec wait{static_cast<time_t>(msec / 1000), static_cast<long>(msec % 1000) * 1000000L};
    while (nanosleep(&wait, &wait) != 0 && errno == EINTR) {
    }
    return 0;
}

// As in sfcb, `once` is handed to pthread_once: it must start as 0.
int threadOnce(int* once, void (*init)(void)) { return pthread_once(reinterpret_cast<pthread_once_t*>(once), init); }

int createThreadKey(CMPI_THREAD_KEY_TYPE* key, void (*cleanup)(void*)) { return pthread_key_create(key, cleanup); }
int destroyThreadKey(CMPI_THREAD_KEY_TYPE key) { return pthread_key_delete(key); }
void* getThreadSpecific(CMPI_THREAD_KEY_TYPE key) { return pthread_getspecific(key); }
int setThreadSpecific(CMPI_THREAD_KEY_TYPE key, void* value) { return pthread_setspecific(key, value); }

pthread_mutex_t* mutexOf(CMPI_MUTEX_TYPE mutex) { return static_cast<pthread_mutex_t*>(mutex); }
pthread_cond_t* condOf(CMPI_COND_TYPE cond) { return static_cast<pthread_cond_t*>(cond); }

CMPI_MUTEX_TYPE newMutex(int /*opt: ignored, as in sfcb*/) {
    auto* mutex = static_cast<pthread_mutex_t*>(std::malloc(sizeof(pthread_mutex_t)));
    pthread_mutex_init(mutex, nullptr);
    return mutex;
}

void destroyMutex(CMPI_MUTEX_TYPE mutex) {
    pthread_mutex_destroy(mutexOf(mutex));
    std::free(mutex);
}

void lockMutex(CMPI_MUTEX_TYPE mutex) { pthread_mutex_lock(mutexOf(mutex)); }
void unlockMutex(CMPI_MUTEX_TYPE mutex) { pthread_mutex_unlock(mutexOf(mutex)); }

CMPI_COND_TYPE newCondition(int /*opt*/) {
    auto* cond = static_cast<pthread_cond_t*>(std::malloc(sizeof(pthread_cond_t)));
    pthread_cond_init(cond, nullptr);
    return cond;
}

void destroyCondition(CMPI_COND_TYPE cond) {
    pthread_cond_destroy(condOf(cond));
    std::free(cond);
}

int condWait(CMPI_COND_TYPE cond, CMPI_MUTEX_TYPE mutex) { return pthread_cond_wait(condOf(cond), mutexOf(mutex)); }

int timedCondWait(CMPI_COND_TYPE cond, CMPI_MUTEX_TYPE mutex, struct timespec* wait) {
    return pthread_cond_timedwait(condOf(cond), mutexOf(mutex), wait);
}

int signalCondition(CMPI_COND_TYPE cond) { return pthread_cond_signal(condOf(cond)); }

}  // namespace

const CMPIBrokerExtFT kBrokerExtFT = {
    CMPICurrentVersion, resolveFileName, newThread,  joinThread,       exitThread,        cancelThread,
    threadSleep,        threadOnce,      createThreadKey, destroyThreadKey, getThreadSpecific, setThreadSpecific,
    newMutex,           destroyMutex,    lockMutex,  unlockMutex,      newCondition,      destroyCondition,
    condWait,           timedCondWait,   signalCondition,
};

}  // namespace orv::host::detail
