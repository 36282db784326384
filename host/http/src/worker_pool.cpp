#include "worker_pool.hpp"

#include <utility>

namespace orv::http::detail {

class WorkerPool::Worker {
public:
    std::thread thread;
    bool retiring = false;  // replaced: leave after the job in hand
    bool ended = false;     // left serve(); the thread can be joined
};

namespace {
thread_local WorkerPool::Worker* currentWorker = nullptr;
}  // namespace

WorkerPool::WorkerPool(std::size_t threads) {
    std::lock_guard lock(mutex_);
    for (std::size_t i = 0; i < (threads == 0 ? 1 : threads); ++i) {
        startLocked();
    }
}

WorkerPool::~WorkerPool() { join(); }

void WorkerPool::startLocked() {
    Worker& worker = workers_.emplace_back();
    worker.thread = std::thread([this, &worker] { serve(&worker); });
}

void WorkerPool::post(std::function<void()> job) {
    {
        std::lock_guard lock(mutex_);
        queue_.push_back(std::move(job));
    }
    jobReady_.notify_one();
}

WorkerPool::Worker* WorkerPool::current() noexcept { return currentWorker; }

void WorkerPool::replace(Worker* worker) {
    std::lock_guard lock(mutex_);
    if (worker->retiring || stopping_) {
        return;  // at the stop the queue is run to its end by the threads still there
    }
    worker->retiring = true;
    reapLocked();
    startLocked();
}

// Joins the threads that left; a thread that leaves cannot join itself.
void WorkerPool::reapLocked() {
    if (ended_ == 0) {
        return;
    }
    for (auto it = workers_.begin(); it != workers_.end();) {
        if (it->ended) {
            it->thread.join();
            it = workers_.erase(it);
            --ended_;
        } else {
            ++it;
        }
    }
}

void WorkerPool::serve(Worker* worker) {
    currentWorker = worker;
    std::unique_lock lock(mutex_);
    for (;;) {
        jobReady_.wait(lock, [this] { return stopping_ || !queue_.empty(); });
        if (queue_.empty()) {
            break;  // stopping, and nothing left to run
        }
        std::function<void()> job = std::move(queue_.front());
        queue_.pop_front();
        lock.unlock();
        job();
        job = nullptr;  // what the job owned goes before the lock is taken
        lock.lock();
        if (worker->retiring) {
            break;
        }
    }
    worker->ended = true;
    ++ended_;
}

void WorkerPool::join() {
    std::list<Worker> workers;
    {
        std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    jobReady_.notify_all();
    // A job running now may still replace its worker: join until no thread is left.
    for (;;) {
        {
            std::lock_guard lock(mutex_);
            workers.splice(workers.end(), workers_);
            ended_ = 0;
        }
        if (workers.empty()) {
            return;
        }
        for (Worker& worker : workers) {
            if (worker.thread.joinable()) {
                worker.thread.join();
            }
        }
        workers.clear();
    }
}

std::size_t WorkerPool::threadCount() const {
    std::lock_guard lock(mutex_);
    return workers_.size() - ended_;
}

}  // namespace orv::http::detail
