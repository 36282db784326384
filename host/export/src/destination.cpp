#include "destination.hpp"

#include "orv/exporter/export_message.hpp"

namespace orv::exporter {

namespace {

// How often a sender still busy at the shutdown deadline is told to break off.
constexpr std::chrono::milliseconds kInterruptPeriod{10};

}  // namespace

Destination::Destination(std::string url, const DestinationUrl& parsed, const SenderOptions& options,
                         std::size_t queueLimit, std::chrono::milliseconds idleTimeout, DeliveryEvents& events)
    : url_(std::move(url)),
      queueLimit_(queueLimit),
      idleTimeout_(idleTimeout),
      events_(events),
      sender_(parsed, options) {
    thread_ = std::thread([this] { run(); });
}

Destination::~Destination() {
    beginShutdown(Clock::now());
    stopAndJoin();
}

Destination::Enqueued Destination::enqueue(QueuedIndication& indication) {
    bool startsOverflow = false;
    {
        std::lock_guard lock(mutex_);
        if (finished_) {
            return Enqueued::SenderEnded;
        }
        if (!stopping_ && queue_.size() < queueLimit_) {
            queue_.push_back(std::move(indication));
            wake_.notify_one();
            return Enqueued::Yes;
        }
        startsOverflow = !stopping_ && !overflowing_;
        overflowing_ = overflowing_ || startsOverflow;
    }
    if (startsOverflow && events_.logs(ExportLogLevel::Warning)) {
        events_.log(ExportLogLevel::Warning, "queue for " + url_ + " is full (" + std::to_string(queueLimit_) +
                                                 " indications): dropping new indications");
    }
    return Enqueued::QueueFull;
}

bool Destination::ended() {
    std::lock_guard lock(mutex_);
    return finished_;
}

void Destination::beginShutdown(Clock::time_point deadline) {
    std::lock_guard lock(mutex_);
    if (!stopping_) {
        stopping_ = true;
        deadline_ = deadline;
    }
    wake_.notify_all();
}

bool Destination::waitEnded(Clock::time_point deadline) {
    std::unique_lock lock(mutex_);
    return ended_.wait_until(lock, deadline, [this] { return finished_; });
}

void Destination::stopAndJoin() {
    if (!thread_.joinable()) {
        return;
    }
    while (!waitEnded(Clock::now() + kInterruptPeriod)) {
        sender_.interrupt();
    }
    thread_.join();
}

bool Destination::pastDeadline() const {
    return stopping_ && Clock::now() >= deadline_;
}

void Destination::dropQueued(std::unique_lock<std::mutex>& lock) {
    std::deque<QueuedIndication> dropped;
    dropped.swap(queue_);
    lock.unlock();
    for (const QueuedIndication& indication : dropped) {
        events_.count(indication.subscriptionId, DeliveryEvents::Outcome::Dropped);
    }
    lock.lock();
}

bool Destination::nextIndication(QueuedIndication& out) {
    std::unique_lock lock(mutex_);
    if (!wake_.wait_for(lock, idleTimeout_, [this] { return !queue_.empty() || stopping_; })) {
        finished_ = true;  // idle: the thread and its connection go until the next indication
        return false;
    }
    if (pastDeadline()) {
        dropQueued(lock);
    }
    if (queue_.empty()) {
        return false;
    }
    out = std::move(queue_.front());
    queue_.pop_front();
    if (overflowing_ && queue_.empty()) {
        overflowing_ = false;
        lock.unlock();
        if (events_.logs(ExportLogLevel::Info)) {
            events_.log(ExportLogLevel::Info, "queue for " + url_ + " has room again");
        }
    }
    return true;
}

void Destination::run() {
    QueuedIndication indication;
    while (nextIndication(indication)) {
        deliver(indication);
    }
    std::lock_guard lock(mutex_);
    finished_ = true;
    ended_.notify_all();
}

// Waits out a retry interval; false when shutdown cut it short past the deadline.
bool Destination::waitBeforeRetry(std::chrono::milliseconds interval) {
    std::unique_lock lock(mutex_);
    const Clock::time_point retryAt = Clock::now() + interval;
    wake_.wait_until(lock, retryAt, [this] { return stopping_; });
    if (stopping_) {
        wake_.wait_until(lock, std::min(retryAt, deadline_), [] { return false; });
    }
    return !pastDeadline();
}

void Destination::deliver(const QueuedIndication& indication) {
    const std::uint64_t messageId = events_.nextMessageId();
    const std::string body = buildExportRequest(messageId, indication.instanceXml);
    for (unsigned attempt = 0;; ++attempt) {
        if (attempt > 0) {
            events_.count(indication.subscriptionId, DeliveryEvents::Outcome::Retried);
        }
        const std::optional<std::string> failure = sender_.post(body);
        if (!failure) {
            markReachable();
            events_.count(indication.subscriptionId, DeliveryEvents::Outcome::Delivered);
            if (events_.logs(ExportLogLevel::Debug)) {
                events_.log(ExportLogLevel::Debug, "delivered indication " + std::to_string(messageId) +
                                                       " of subscription " + indication.subscriptionId + " to " +
                                                       url_ + " (attempt " + std::to_string(attempt + 1) + ")");
            }
            return;
        }
        markFailing(*failure);
        {
            std::lock_guard lock(mutex_);
            if (pastDeadline()) {
                break;  // shutting down: dropped without the fatal-error policy
            }
        }
        if (attempt >= indication.policy.retryAttempts) {
            events_.count(indication.subscriptionId, DeliveryEvents::Outcome::Dropped);
            events_.fatal(indication.subscriptionId, indication.policy.onFatal);
            return;
        }
        if (!waitBeforeRetry(indication.policy.retryInterval)) {
            break;
        }
    }
    events_.count(indication.subscriptionId, DeliveryEvents::Outcome::Dropped);
}

void Destination::markFailing(const std::string& why) {
    if (failing_) {
        return;
    }
    failing_ = true;
    if (events_.logs(ExportLogLevel::Warning)) {
        events_.log(ExportLogLevel::Warning, "cannot deliver indications to " + url_ + ": " + why);
    }
}

void Destination::markReachable() {
    if (!failing_) {
        return;
    }
    failing_ = false;
    if (events_.logs(ExportLogLevel::Info)) {
        events_.log(ExportLogLevel::Info, "delivering indications to " + url_ + " again");
    }
}

}  // namespace orv::exporter
