// One open enumeration of the pull operations: a producer thread runs the
// provider request and encodes each returned object into a bounded queue; pulls
// take what is queued. When the queue is full the provider's return call waits,
// so an enumeration holds at most `capacity` encoded objects however many the
// provider has (back-pressure), and a closed enumeration makes the provider's
// further return calls fail so that it stops.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace orv::cimhost::detail {

// What a pull of this enumeration returns, fixed by the open operation.
enum class PullKind { InstancesWithPath, InstancePaths, Instances };

class EnumerationContext {
public:
    // Hands one encoded object to the queue; waits while the queue is full.
    // Answers false once the enumeration is closed: the producer should stop.
    using Push = std::function<bool(std::string fragment)>;
    // Runs the provider request, pushing every encoded object; answers the
    // request's CIM status code and message (0 for success).
    using Producer = std::function<std::pair<int, std::string>(const Push& push)>;

    struct Batch {
        std::vector<std::string> fragments;
        bool end = false;                // nothing more will come
        int errorCode = 0;               // the request failed after what came before
        std::string errorMessage;
    };

    EnumerationContext(std::string id, std::string owner, std::string nameSpace, PullKind kind,
                       std::chrono::seconds timeout, std::size_t capacity);
    // Closes the enumeration and joins the producer.
    ~EnumerationContext();
    EnumerationContext(const EnumerationContext&) = delete;
    EnumerationContext& operator=(const EnumerationContext&) = delete;

    // Starts the producer thread; once only.
    void start(Producer producer);
    // Takes up to `max` objects: waits until that many came, the producer ended, or
    // the enumeration was closed. With max 0 it waits for nothing.
    Batch take(std::size_t max);
    // Stops the enumeration: pushes answer false, a waiting take returns.
    void close();
    bool closed() const;
    // Whether the producer ended and everything it queued was taken.
    bool exhausted() const;
    // How many objects are left once the producer ended; nullopt while it runs.
    std::optional<std::size_t> remaining() const;

    const std::string& id() const noexcept { return id_; }
    const std::string& owner() const noexcept { return owner_; }
    const std::string& nameSpace() const noexcept { return nameSpace_; }
    PullKind kind() const noexcept { return kind_; }
    std::chrono::seconds timeout() const noexcept { return timeout_; }

    // Bookkeeping of the registry, under its lock: whether an operation uses the
    // context now (its timer is stopped meanwhile) and when it expires otherwise.
    bool busy = false;
    std::chrono::steady_clock::time_point expires;

private:
    bool push(std::string fragment);
    void finish(int code, std::string message);

    const std::string id_;
    const std::string owner_;
    const std::string nameSpace_;
    const PullKind kind_;
    const std::chrono::seconds timeout_;
    const std::size_t capacity_;

    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::string> queue_;
    bool finished_ = false;
    bool closed_ = false;
    int errorCode_ = 0;
    std::string errorMessage_;
    std::thread producer_;
};

}  // namespace orv::cimhost::detail
