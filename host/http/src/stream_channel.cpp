#include "stream_channel.hpp"

#include <utility>

namespace orv::http::detail {

StreamChannel::StreamChannel(std::size_t limit, std::function<void()> wake)
    : limit_(limit == 0 ? 1 : limit), wake_(std::move(wake)) {}

void StreamChannel::wakeLocked() {
    if (!wakePending_) {
        wakePending_ = true;
        wake_();
    }
}

bool StreamChannel::begin(Response head) {
    std::lock_guard lock(mutex_);
    if (begun_ || aborted_ || closed_ || answered_) {
        return false;
    }
    begun_ = true;
    pending_ = std::move(head.body);
    head.body.clear();
    head_ = std::move(head);
    wakeLocked();
    return true;
}

// A piece that finds nothing waiting is kept as it is, without a copy.
bool StreamChannel::write(std::string piece) {
    std::unique_lock lock(mutex_);
    space_.wait(lock, [this] { return pending_.size() < limit_ || aborted_ || closed_; });
    if (!begun_ || ended_ || aborted_ || closed_ || answered_) {
        return false;
    }
    if (pending_.empty()) {
        pending_ = std::move(piece);
    } else {
        pending_.append(piece);
    }
    wakeLocked();
    return true;
}

void StreamChannel::abort() {
    {
        std::lock_guard lock(mutex_);
        if (!begun_ || ended_ || aborted_) {
            return;
        }
        aborted_ = true;
        wakeLocked();
    }
    space_.notify_all();
}

bool StreamChannel::begun() const {
    std::lock_guard lock(mutex_);
    return begun_;
}

bool StreamChannel::answer(Response whole) {
    std::lock_guard lock(mutex_);
    if (begun_ || closed_ || answered_ || settled_) {
        return false;
    }
    answered_ = true;
    whole_ = std::move(whole);
    wakeLocked();
    return true;
}

void StreamChannel::runOn(WorkerPool& pool, WorkerPool::Worker* worker) {
    std::lock_guard lock(mutex_);
    pool_ = &pool;
    worker_ = worker;
}

// Under the lock: the handler cannot settle, so its worker is still busy with it.
void StreamChannel::release() {
    std::lock_guard lock(mutex_);
    if (!settled_ && pool_ != nullptr && worker_ != nullptr) {
        std::exchange(pool_, nullptr)->replace(worker_);
    }
}

bool StreamChannel::settle() {
    std::lock_guard lock(mutex_);
    settled_ = true;
    return !answered_;
}

void StreamChannel::end() {
    std::lock_guard lock(mutex_);
    if (!begun_ || ended_ || aborted_) {
        return;
    }
    ended_ = true;
    wakeLocked();
}

StreamChannel::Batch StreamChannel::take() {
    Batch batch;
    {
        std::lock_guard lock(mutex_);
        wakePending_ = false;
        batch.head = std::exchange(head_, std::nullopt);
        batch.whole = std::exchange(whole_, std::nullopt);
        batch.data.swap(pending_);
        batch.aborted = aborted_;
        batch.last = ended_ && !aborted_;
    }
    space_.notify_all();
    return batch;
}

void StreamChannel::close() {
    {
        std::lock_guard lock(mutex_);
        closed_ = true;
    }
    space_.notify_all();
}

}  // namespace orv::http::detail
