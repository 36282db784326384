#include <omc/Mutex.h>

namespace OMC {

Mutex::Mutex() { pthread_mutex_init(&mutex_, nullptr); }

Mutex::~Mutex() { pthread_mutex_destroy(&mutex_); }

void Mutex::acquire() { pthread_mutex_lock(&mutex_); }

void Mutex::release() { pthread_mutex_unlock(&mutex_); }

MutexLock::MutexLock(Mutex& mutex, bool initiallyLocked) : mutex_(mutex), locked_(false) {
    if (initiallyLocked) {
        lock();
    }
}

MutexLock::~MutexLock() {
    if (locked_) {
        release();
    }
}

void MutexLock::lock() {
    mutex_.acquire();
    locked_ = true;
}

void MutexLock::release() {
    locked_ = false;
    mutex_.release();
}

}  // namespace OMC
