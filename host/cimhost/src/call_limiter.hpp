// A cap on how long one request may keep a provider busy, two ways.
//
// run(): the request runs on a call thread while the caller waits up to the limit. Call
// threads are kept and reused (providers and platform substitutes keep per-thread state
// worth keeping); a new one starts only when every existing one is busy, so a request
// never queues behind a call that overran. A provider thread cannot be stopped from
// outside, so an overrunning call is left to finish on its thread: the caller gets
// nullopt at once, the late result is dropped.
//
// runHere(): the request runs on the calling thread, with no hand-over to another thread
// and back; a watchdog thread calls `overrun` when the limit passes first, and that
// callback answers the client and frees the caller's place (the caller then returns
// whenever the provider does, and its result is for nobody).
//
// drain() (called before the providers are cleaned up at shutdown) waits for every call
// of either kind to return.
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
#include <type_traits>
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
    // Runs `work` on this thread and returns its result. When it has not returned within
    // the limit, `overrun` runs once on the watchdog thread, while `work` goes on; the
    // call then counts as overrunning until `work` returns.
    template <class Work, class Overrun>
    std::string runHere(Work&& work, Overrun&& overrun);
    // Blocks until no call is running on a thread of its own.
    void drain();
    // Calls that overran and have not returned yet.
    std::size_t overrunning() const;

private:
    // A call running on its caller's thread, in the watchdog's list (oldest first).
    struct Watch {
        std::chrono::steady_clock::time_point deadline;
        void (*fire)(void*) = nullptr;
        void* overrun = nullptr;
        Watch* previous = nullptr;
        Watch* next = nullptr;
        bool fired = false;
        bool firing = false;  // the watchdog is in `fire` now
    };
    void watch(Watch& entry);
    void unwatch(Watch& entry);
    void watchdog();
    void unlinkLocked(Watch& entry);

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
    Watch* oldest_ = nullptr;
    Watch* newest_ = nullptr;
    std::condition_variable watchChanged_;  // the watchdog sleeps on it
    std::condition_variable fired_;         // a `fire` call ended
    bool watchdogIdle_ = false;             // waiting without a deadline: a new watch must wake it
    std::thread watchdogThread_;
};

template <class Work, class Overrun>
std::string CallLimiter::runHere(Work&& work, Overrun&& overrun) {
    if (limit_.count() == 0) {
        return work();
    }
    Watch entry;
    entry.overrun = &overrun;
    entry.fire = [](void* callback) { (*static_cast<std::remove_reference_t<Overrun>*>(callback))(); };
    watch(entry);
    struct Unwatch {
        CallLimiter& limiter;
        Watch& entry;
        ~Unwatch() { limiter.unwatch(entry); }
    } unwatch{*this, entry};
    return work();
}

}  // namespace orv::cimhost::detail
