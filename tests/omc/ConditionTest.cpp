#include <omc/Condition.h>
#include <omc/Mutex.h>

#include <gtest/gtest.h>

#include <chrono>
#include <thread>
#include <vector>

namespace {

timespec deadlineIn(std::chrono::milliseconds delay) {
    timespec now{};
    clock_gettime(CLOCK_REALTIME, &now);
    const long long ns = now.tv_nsec + std::chrono::duration_cast<std::chrono::nanoseconds>(delay).count();
    return timespec{now.tv_sec + static_cast<time_t>(ns / 1000000000LL), static_cast<long>(ns % 1000000000LL)};
}

TEST(OmcCondition, TimedWaitWithoutNotificationTimesOutAtTheDeadline) {
    OMC::Mutex mutex;
    OMC::Condition cond;
    OMC::MutexLock lock(mutex);
    const auto start = std::chrono::steady_clock::now();
    bool notified = cond.timedWait(lock, deadlineIn(std::chrono::milliseconds(150)));
    const auto waited = std::chrono::steady_clock::now() - start;
    EXPECT_FALSE(notified);
    EXPECT_GE(waited, std::chrono::milliseconds(140));
    EXPECT_TRUE(lock.isLocked());
}

TEST(OmcCondition, TimedWaitWithDeadlineInThePastReturnsAtOnceAsTimeout) {
    OMC::Mutex mutex;
    OMC::Condition cond;
    OMC::MutexLock lock(mutex);
    EXPECT_FALSE(cond.timedWait(lock, timespec{1, 0}));
}

TEST(OmcCondition, NotifyEndsATimedWaitBeforeItsDeadline) {
    OMC::Mutex mutex;
    OMC::Condition cond;
    bool ready = false;
    bool woke = false;
    std::thread waiter([&] {
        OMC::MutexLock lock(mutex);
        const timespec deadline = deadlineIn(std::chrono::seconds(30));
        while (!ready) {
            if (!cond.timedWait(lock, deadline)) return;
        }
        woke = true;
    });
    {
        OMC::MutexLock lock(mutex);
        ready = true;
        cond.notifyOne();
    }
    waiter.join();
    EXPECT_TRUE(woke);
}

TEST(OmcCondition, BroadcastWakesEveryWaiter) {
    OMC::Mutex mutex;
    OMC::Condition cond;
    bool shutdown = false;
    int waiting = 0;
    int woken = 0;
    std::vector<std::thread> threads;
    for (int i = 0; i < 3; ++i) {
        threads.emplace_back([&] {
            OMC::MutexLock lock(mutex);
            ++waiting;
            cond.notifyAll();
            const timespec deadline = deadlineIn(std::chrono::seconds(30));
            while (!shutdown) {
                if (!cond.timedWait(lock, deadline)) return;
            }
            ++woken;
        });
    }
    {
        OMC::MutexLock lock(mutex);
        const timespec deadline = deadlineIn(std::chrono::seconds(30));
        while (waiting < 3) ASSERT_TRUE(cond.timedWait(lock, deadline));
        shutdown = true;
        cond.notifyAll();
    }
    for (std::thread& t : threads) t.join();
    EXPECT_EQ(woken, 3);
}

TEST(OmcMutexLock, HoldsTheMutexOnlyWhileLocked) {
    OMC::Mutex mutex;
    OMC::MutexLock lock(mutex, false);
    EXPECT_FALSE(lock.isLocked());
    lock.lock();
    EXPECT_TRUE(lock.isLocked());
    bool otherGotIt = true;
    std::thread other([&] {
        OMC::MutexLock inner(mutex, false);
        otherGotIt = false;
        inner.lock();
        otherGotIt = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    lock.release();
    other.join();
    EXPECT_FALSE(lock.isLocked());
    EXPECT_TRUE(otherGotIt);
}

}  // namespace
