// One listener destination: a bounded queue of indications and the thread that sends
// them, in order, with the retries of each indication's delivery policy.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>

#include "http_sender.hpp"
#include "orv/exporter/destination_url.hpp"
#include "orv/exporter/exporter.hpp"

namespace orv::exporter {

using Clock = std::chrono::steady_clock;

// What a destination reports to the exporter that owns it. Called from the sender thread.
class DeliveryEvents {
public:
    enum class Outcome { Delivered, Retried, Dropped };
    virtual void count(const std::string& subscriptionId, Outcome outcome) = 0;
    virtual void fatal(const std::string& subscriptionId, OnFatalError policy) = 0;
    virtual bool logs(ExportLogLevel level) const = 0;
    virtual void log(ExportLogLevel level, std::string_view line) = 0;
    virtual std::uint64_t nextMessageId() = 0;

protected:
    ~DeliveryEvents() = default;
};

struct QueuedIndication {
    std::string subscriptionId;
    std::string instanceXml;
    DeliveryPolicy policy;
};

class Destination {
public:
    Destination(std::string url, const DestinationUrl& parsed, const SenderOptions& options,
                std::size_t queueLimit, std::chrono::milliseconds idleTimeout, DeliveryEvents& events);
    ~Destination();
    Destination(const Destination&) = delete;
    Destination& operator=(const Destination&) = delete;

    enum class Enqueued { Yes, QueueFull, SenderEnded };
    // Queues the indication; nothing is queued when the queue is full or when the
    // sender has ended (idle too long, or shut down).
    Enqueued enqueue(QueuedIndication& indication);
    // True once the sender has ended; the destination can then be replaced.
    bool ended();
    // Lets the sender deliver what is queued until the deadline, then drop the rest.
    void beginShutdown(Clock::time_point deadline);
    // Waits until the sender has ended or the deadline passed; true when it has ended.
    bool waitEnded(Clock::time_point deadline);
    // Breaks off a request in progress (after the deadline) and joins the sender.
    void stopAndJoin();

private:
    void run();
    bool nextIndication(QueuedIndication& out);
    void deliver(const QueuedIndication& indication);
    bool waitBeforeRetry(std::chrono::milliseconds interval);
    bool pastDeadline() const;
    void dropQueued(std::unique_lock<std::mutex>& lock);
    void markFailing(const std::string& why);
    void markReachable();

    const std::string url_;
    const std::size_t queueLimit_;
    const std::chrono::milliseconds idleTimeout_;
    DeliveryEvents& events_;
    HttpSender sender_;

    std::mutex mutex_;
    std::condition_variable wake_;
    std::condition_variable ended_;
    std::deque<QueuedIndication> queue_;
    bool overflowing_ = false;
    bool stopping_ = false;
    bool finished_ = false;
    Clock::time_point deadline_{};

    bool failing_ = false;  // sender thread only
    std::thread thread_;
};

}  // namespace orv::exporter
