// A cap on how long one request may keep a provider busy. The request runs on a
// call thread while the HTTP worker waits up to the limit. Call threads are kept and
// reused (providers and platform substitutes keep per-thread state worth keeping);
// a new one starts only when every existing one is busy, so a request never queues
// behind a call that overran. A provider thread
// cannot be stopped from outside, so an overrunning call is left to finish on its
// thread: the client gets CIM_ERR_FAILED at once, the late result is dropped, and
// drain() (called before the providers are cleaned up at shutdown) waits for every
// such call to return.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace orv::cimhost::detail {

class CallLimiter {
public:
    // A zero limit runs every call inline, without a cap.
    explicit CallLimiter(std::chrono::milliseconds limit);
    ~CallLimiter();  // drains, then ends the call threads
    CallLimiter(const CallLimiter&) = delete;
    CallLimiter& operator=(const CallLimiter&) = delete;

    std::chrono::milliseconds limit() const noexcept { return limit_; }
    // The work's result, or nullopt when it did not finish within the limit. `work`
    // must own what it uses: it may outlive this call.
    std::optional<std::string> run(std::function<std::string()> work);
    // Blocks until no call is running on a thread of its own.
    void drain();
    // Calls that overran and have not returned yet.
    std::size_t overrunning() const;

private:
    struct Call;
    struct Job {
        std::function<std::string()> work;
        std::shared_ptr<Call> call;
    };
    void serve();

    std::chrono::milliseconds limit_;
    mutable std::mutex mutex_;
    std::condition_variable idle_;      // running_ reached 0
    std::condition_variable jobReady_;  // a job was queued, or stopping_
    std::deque<Job> queue_;
    std::vector<std::thread> threads_;
    std::size_t waitingThreads_ = 0;  // call threads waiting for a job
    std::size_t running_ = 0;         // jobs queued or running
    std::size_t overrunning_ = 0;
    bool stopping_ = false;
};

}  // namespace orv::cimhost::detail
