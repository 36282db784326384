#include "call_limiter.hpp"

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
    for (std::thread& thread : threads_) {
        thread.join();
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
