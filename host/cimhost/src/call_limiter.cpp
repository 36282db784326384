#include "call_limiter.hpp"

#include <thread>

namespace orv::cimhost::detail {

// What the waiting request and the call's thread share.
struct CallLimiter::Call {
    std::mutex mutex;
    std::condition_variable done;
    std::optional<std::string> result;
    bool abandoned = false;  // the request stopped waiting
};

CallLimiter::CallLimiter(std::chrono::milliseconds limit) : limit_(limit) {}

CallLimiter::~CallLimiter() { drain(); }

std::optional<std::string> CallLimiter::run(std::function<std::string()> work) {
    if (limit_.count() == 0) {
        return work();
    }
    auto call = std::make_shared<Call>();
    {
        std::lock_guard lock(mutex_);
        ++running_;
    }
    std::thread([this, call, work = std::move(work)] {
        std::string result = work();
        bool overran = false;
        {
            std::lock_guard lock(call->mutex);
            call->result = std::move(result);
            overran = call->abandoned;
            call->done.notify_one();
        }
        finished(overran);
    }).detach();
    std::unique_lock lock(call->mutex);
    if (!call->done.wait_for(lock, limit_, [&call] { return call->result.has_value(); })) {
        call->abandoned = true;
        std::lock_guard count(mutex_);
        ++overrunning_;
        return std::nullopt;
    }
    return std::move(call->result);
}

void CallLimiter::finished(bool overran) {
    std::lock_guard lock(mutex_);
    --running_;
    if (overran) {
        --overrunning_;
    }
    idle_.notify_all();
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
