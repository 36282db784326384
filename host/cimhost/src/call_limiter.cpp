#include "call_limiter.hpp"

#include <utility>

namespace orv::cimhost::detail {

// What the waiting request and the call thread share.
struct CallLimiter::Call {
    std::mutex mutex;
    std::condition_variable done;
    std::optional<std::string> result;
    bool abandoned = false;  // the request stopped waiting; guarded by CallLimiter::mutex_
};

CallLimiter::CallLimiter(std::chrono::milliseconds limit) : limit_(limit) {}

CallLimiter::~CallLimiter() {
    drain();
    {
        std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    jobReady_.notify_all();
    watchChanged_.notify_all();
    for (std::thread& thread : threads_) {
        thread.join();
    }
    if (watchdogThread_.joinable()) {
        watchdogThread_.join();
    }
}

// The limit is the same for every call, so the list stays in deadline order by appending.
// The watchdog is woken only when it waits without a deadline; otherwise it wakes at the
// oldest deadline it knew and looks again, so a call that ends early costs it nothing.
void CallLimiter::watch(Watch& entry) {
    bool wake = false;
    {
        std::lock_guard lock(mutex_);
        ++running_;
        entry.deadline = std::chrono::steady_clock::now() + limit_;
        entry.previous = newest_;
        (newest_ != nullptr ? newest_->next : oldest_) = &entry;
        newest_ = &entry;
        if (!watchdogThread_.joinable()) {
            watchdogThread_ = std::thread([this] { watchdog(); });
        }
        wake = std::exchange(watchdogIdle_, false);
    }
    if (wake) {
        watchChanged_.notify_one();
    }
}

void CallLimiter::unlinkLocked(Watch& entry) {
    (entry.previous != nullptr ? entry.previous->next : oldest_) = entry.next;
    (entry.next != nullptr ? entry.next->previous : newest_) = entry.previous;
}

void CallLimiter::unwatch(Watch& entry) {
    std::unique_lock lock(mutex_);
    if (entry.fired) {
        fired_.wait(lock, [&entry] { return !entry.firing; });  // `overrun` uses the caller's state
        --overrunning_;
    } else {
        unlinkLocked(entry);
    }
    if (--running_ == 0) {
        idle_.notify_all();
    }
}

void CallLimiter::watchdog() {
    std::unique_lock lock(mutex_);
    while (!stopping_) {
        if (oldest_ == nullptr) {
            watchdogIdle_ = true;
            watchChanged_.wait(lock, [this] { return stopping_ || !watchdogIdle_; });
            continue;
        }
        const auto deadline = oldest_->deadline;
        if (std::chrono::steady_clock::now() < deadline) {
            watchChanged_.wait_until(lock, deadline);
            continue;
        }
        Watch& entry = *oldest_;
        unlinkLocked(entry);
        entry.fired = true;
        entry.firing = true;
        ++overrunning_;
        lock.unlock();
        entry.fire(entry.overrun);
        lock.lock();
        entry.firing = false;
        fired_.notify_all();
    }
}

std::optional<std::string> CallLimiter::run(std::function<std::string()> work) {
    if (limit_.count() == 0) {
        return work();
    }
    auto call = std::make_shared<Call>();
    {
        std::lock_guard lock(mutex_);
        ++running_;
        queue_.push_back(Job{std::move(work), call});
        if (waitingThreads_ < queue_.size()) {
            threads_.emplace_back([this] { serve(); });
        }
    }
    jobReady_.notify_one();
    {
        std::unique_lock callLock(call->mutex);
        if (call->done.wait_for(callLock, limit_, [&call] { return call->result.has_value(); })) {
            return std::move(call->result);
        }
    }
    // The result is published under mutex_ too: either it arrived just now, or the
    // call thread will see `abandoned` when it returns.
    std::lock_guard lock(mutex_);
    if (call->result) {
        return std::move(call->result);
    }
    call->abandoned = true;
    ++overrunning_;
    return std::nullopt;
}

void CallLimiter::serve() {
    std::unique_lock lock(mutex_);
    ++waitingThreads_;
    for (;;) {
        jobReady_.wait(lock, [this] { return stopping_ || !queue_.empty(); });
        --waitingThreads_;
        if (queue_.empty()) {
            return;  // stopping
        }
        Job job = std::move(queue_.front());
        queue_.pop_front();
        lock.unlock();
        std::string result = job.work();
        job.work = nullptr;  // what the request owned goes before the lock is taken
        lock.lock();
        --running_;
        ++waitingThreads_;  // counted before the result is out, so the next request finds this thread
        if (job.call->abandoned) {
            --overrunning_;
        }
        {
            std::lock_guard callLock(job.call->mutex);
            job.call->result = std::move(result);
        }
        job.call->done.notify_one();
        idle_.notify_all();
    }
}

void CallLimiter::drain() {
    std::unique_lock lock(mutex_);
    idle_.wait(lock, [this] { return running_ == 0; });
}

std::size_t CallLimiter::overrunning() const {
    std::lock_guard lock(mutex_);
    return overrunning_;
}

}  // namespace orv::cimhost::detail
