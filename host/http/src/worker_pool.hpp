// The threads that run the handler (and the PAM checks). A job that is known to run long
// (a provider call past its limit) can hand its thread's place to a new thread, so that
// the other requests never queue behind it; the thread it leaves ends when the job returns.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <list>
#include <mutex>
#include <thread>

namespace orv::http::detail {

class WorkerPool {
public:
    class Worker;

    explicit WorkerPool(std::size_t threads);
    ~WorkerPool();  // join()
    WorkerPool(const WorkerPool&) = delete;
    WorkerPool& operator=(const WorkerPool&) = delete;

    void post(std::function<void()> job);
    // The worker whose job runs on the calling thread; nullptr off the pool's threads.
    static Worker* current() noexcept;
    // Starts a thread in the place of `worker` (a worker of this pool, busy with a job);
    // `worker` ends once its job returns. Any thread may call this, once per job.
    void replace(Worker* worker);
    // Runs the queued jobs to the end, then ends and joins every thread.
    void join();
    // Threads serving now, the ones handed over included (for tests).
    std::size_t threadCount() const;

private:
    void serve(Worker* worker);
    void startLocked();
    void reapLocked();

    mutable std::mutex mutex_;
    std::condition_variable jobReady_;
    std::deque<std::function<void()>> queue_;
    std::list<Worker> workers_;
    std::size_t ended_ = 0;  // workers whose thread has left serve() and can be joined
    bool stopping_ = false;
};

}  // namespace orv::http::detail
