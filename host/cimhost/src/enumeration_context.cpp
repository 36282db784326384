#include "enumeration_context.hpp"

#include <utility>

namespace orv::cimhost::detail {

EnumerationContext::EnumerationContext(std::string id, std::string owner, std::string nameSpace, PullKind kind,
                                       std::chrono::seconds timeout, std::size_t capacity)
    : id_(std::move(id)),
      owner_(std::move(owner)),
      nameSpace_(std::move(nameSpace)),
      kind_(kind),
      timeout_(timeout),
      capacity_(capacity == 0 ? 1 : capacity) {}

EnumerationContext::~EnumerationContext() {
    close();
    if (producer_.joinable()) {
        producer_.join();
    }
}

void EnumerationContext::start(Producer producer) {
    producer_ = std::thread([this, producer = std::move(producer)] {
        std::pair<int, std::string> outcome;
        try {
            outcome = producer([this](std::string fragment) { return push(std::move(fragment)); });
        } catch (const std::exception& error) {
            outcome = {1, error.what()};
        }
        finish(outcome.first, std::move(outcome.second));
    });
}

bool EnumerationContext::push(std::string fragment) {
    std::unique_lock<std::mutex> lock(mutex_);
    changed_.wait(lock, [this] { return closed_ || queue_.size() < capacity_; });
    if (closed_) {
        return false;
    }
    queue_.push_back(std::move(fragment));
    changed_.notify_all();
    return true;
}

void EnumerationContext::finish(int code, std::string message) {
    std::lock_guard<std::mutex> lock(mutex_);
    finished_ = true;
    errorCode_ = code;
    errorMessage_ = std::move(message);
    changed_.notify_all();
}

EnumerationContext::Batch EnumerationContext::take(std::size_t max) {
    Batch batch;
    std::unique_lock<std::mutex> lock(mutex_);
    while (batch.fragments.size() < max) {
        changed_.wait(lock, [this] { return closed_ || finished_ || !queue_.empty(); });
        if (queue_.empty()) {
            break;  // finished or closed
        }
        while (!queue_.empty() && batch.fragments.size() < max) {
            batch.fragments.push_back(std::move(queue_.front()));
            queue_.pop_front();
        }
        changed_.notify_all();  // room for the producer
    }
    // A closed enumeration ends nothing: its pull is abandoned, whatever the
    // producer did after the close.
    if (!closed_ && finished_ && queue_.empty()) {
        batch.end = true;
        if (errorCode_ != 0 && batch.fragments.empty()) {
            batch.errorCode = errorCode_;
            batch.errorMessage = errorMessage_;
        } else if (errorCode_ != 0) {
            batch.end = false;  // the error comes with the next pull
        }
    }
    return batch;
}

void EnumerationContext::close() {
    std::lock_guard<std::mutex> lock(mutex_);
    closed_ = true;
    changed_.notify_all();
}

bool EnumerationContext::closed() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return closed_;
}

bool EnumerationContext::exhausted() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return finished_ && queue_.empty();
}

std::optional<std::size_t> EnumerationContext::remaining() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return finished_ ? std::optional<std::size_t>(queue_.size()) : std::nullopt;
}

}  // namespace orv::cimhost::detail
