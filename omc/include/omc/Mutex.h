// OMC::Mutex and OMC::MutexLock: a POSIX mutex and its scoped lock.
#ifndef ORV_OMC_MUTEX_H
#define ORV_OMC_MUTEX_H

#include <pthread.h>

namespace OMC {

class Condition;

// A non-recursive mutex.
class Mutex {
public:
    Mutex();
    ~Mutex();
    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;

    void acquire();
    void release();

private:
    friend class Condition;
    pthread_mutex_t mutex_;
};

// Holds the mutex from construction (unless told otherwise) to destruction.
class MutexLock {
public:
    explicit MutexLock(Mutex& mutex, bool initiallyLocked = true);
    ~MutexLock();
    MutexLock(const MutexLock&) = delete;
    MutexLock& operator=(const MutexLock&) = delete;

    void lock();
    void release();
    bool isLocked() const { return locked_; }

private:
    friend class Condition;
    Mutex& mutex_;
    bool locked_;
};

}  // namespace OMC

#endif
