#include <omc/Condition.h>

#include <errno.h>

namespace OMC {

Condition::Condition() { pthread_cond_init(&cond_, nullptr); }

Condition::~Condition() { pthread_cond_destroy(&cond_); }

void Condition::notifyOne() { pthread_cond_signal(&cond_); }

void Condition::notifyAll() { pthread_cond_broadcast(&cond_); }

void Condition::wait(MutexLock& lock) { pthread_cond_wait(&cond_, &lock.mutex_.mutex_); }

bool Condition::timedWait(MutexLock& lock, const timespec& deadline) {
    return pthread_cond_timedwait(&cond_, &lock.mutex_.mutex_, &deadline) != ETIMEDOUT;
}

}  // namespace OMC
