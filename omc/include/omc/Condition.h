// OMC::Condition: a POSIX condition variable used with an OMC::MutexLock.
#ifndef ORV_OMC_CONDITION_H
#define ORV_OMC_CONDITION_H

#include <omc/Mutex.h>

#include <time.h>

namespace OMC {

class Condition {
public:
    Condition();
    ~Condition();
    Condition(const Condition&) = delete;
    Condition& operator=(const Condition&) = delete;

    void notifyOne();
    void notifyAll();

    // Waits, with the lock held, until notified (or woken spuriously).
    void wait(MutexLock& lock);
    // Waits, with the lock held, until notified or until the absolute
    // wall-clock deadline (CLOCK_REALTIME) passes. False on timeout.
    bool timedWait(MutexLock& lock, const timespec& deadline);

private:
    pthread_cond_t cond_;
};

}  // namespace OMC

#endif
