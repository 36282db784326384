// A cap on how long one request may keep a provider busy. The request runs on a
// thread of its own while the HTTP worker waits up to the limit. A provider thread
// cannot be stopped from outside, so an overrunning call is left to finish on its
// thread: the client gets CIM_ERR_FAILED at once, the late result is dropped, and
// drain() (called before the providers are cleaned up at shutdown) waits for every
// such call to return.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace orv::cimhost::detail {

class CallLimiter {
public:
    // A zero limit runs every call inline, without a cap.
    explicit CallLimiter(std::chrono::milliseconds limit);
    ~CallLimiter();  // drains
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
    void finished(bool overran);

    std::chrono::milliseconds limit_;
    mutable std::mutex mutex_;
    std::condition_variable idle_;
    std::size_t running_ = 0;
    std::size_t overrunning_ = 0;
};

}  // namespace orv::cimhost::detail
