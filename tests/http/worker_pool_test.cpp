// The HTTP workers: jobs run on the pool's threads, a worker busy with a long job can hand
// its place over so that the queue keeps moving, and join() runs what is queued.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <future>
#include <mutex>
#include <thread>
#include <vector>

#include "worker_pool.hpp"

namespace orv::http::detail {
namespace {

using namespace std::chrono_literals;

// A door a job waits at until the test opens it.
class Gate {
public:
    void open() {
        {
            std::lock_guard lock(mutex_);
            open_ = true;
        }
        changed_.notify_all();
    }
    void pass() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [this] { return open_; });
    }

private:
    std::mutex mutex_;
    std::condition_variable changed_;
    bool open_ = false;
};

TEST(WorkerPool, JobsRunOnThePoolsThreadsAndKnowTheirWorker) {
    WorkerPool pool(2);
    std::promise<std::pair<std::thread::id, bool>> ran;
    pool.post([&ran] { ran.set_value({std::this_thread::get_id(), WorkerPool::current() != nullptr}); });
    const auto [id, hasWorker] = ran.get_future().get();
    EXPECT_NE(id, std::this_thread::get_id());
    EXPECT_TRUE(hasWorker);
    EXPECT_EQ(WorkerPool::current(), nullptr);
}

TEST(WorkerPool, AReplacedWorkerLetsTheQueueMoveAndEndsWhenItsJobReturns) {
    WorkerPool pool(1);
    Gate stuck;
    std::promise<WorkerPool::Worker*> started;
    pool.post([&] {
        started.set_value(WorkerPool::current());
        stuck.pass();
    });
    WorkerPool::Worker* worker = started.get_future().get();
    std::promise<void> next;
    pool.post([&next] { next.set_value(); });
    EXPECT_EQ(next.get_future().wait_for(200ms), std::future_status::timeout) << "one worker, and it is busy";

    pool.replace(worker);
    pool.replace(worker);  // a second hand-over of the same job starts nothing more
    std::promise<void> after;
    pool.post([&after] { after.set_value(); });
    EXPECT_EQ(after.get_future().wait_for(5s), std::future_status::ready);
    EXPECT_EQ(pool.threadCount(), 2U);

    stuck.open();
    for (int i = 0; i < 500 && pool.threadCount() != 1; ++i) {
        std::this_thread::sleep_for(10ms);
    }
    EXPECT_EQ(pool.threadCount(), 1U) << "the replaced worker left after its job";
}

TEST(WorkerPool, JoinRunsEveryQueuedJob) {
    std::atomic<int> ran{0};
    {
        WorkerPool pool(2);
        for (int i = 0; i < 100; ++i) {
            pool.post([&ran] { ++ran; });
        }
        pool.join();
        EXPECT_EQ(ran.load(), 100);
    }
    EXPECT_EQ(ran.load(), 100);
}

TEST(WorkerPool, ConcurrentPostsAndHandOversLoseNoJob) {
    std::atomic<int> ran{0};
    WorkerPool pool(3);
    std::vector<std::thread> posters;
    for (int t = 0; t < 4; ++t) {
        posters.emplace_back([&pool, &ran, t] {
            for (int i = 0; i < 200; ++i) {
                pool.post([&pool, &ran, handOver = (i % 50 == t)] {
                    if (handOver) {
                        pool.replace(WorkerPool::current());
                    }
                    ++ran;
                });
            }
        });
    }
    for (auto& poster : posters) {
        poster.join();
    }
    pool.join();
    EXPECT_EQ(ran.load(), 800);
}

}  // namespace
}  // namespace orv::http::detail
