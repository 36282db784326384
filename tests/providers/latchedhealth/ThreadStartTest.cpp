// Starting the monitor threads, in child processes: the second initialize that
// comes before either new thread has run starts a second pair, and a thread
// that cannot be created ends the process after one log line.
//
// This executable replaces pthread_create for the libraries it loads, so that
// threads started by the family's test build can be held back before they run
// or refused.
#include <dlfcn.h>
#include <pthread.h>
#include <signal.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <condition_variable>
#include <cstring>
#include <mutex>
#include <string>

#include <orv/testsupport/SyslogCapture.h>

#include "LatchedHealthFixture.h"

namespace {

using StartRoutine = void* (*)(void*);
using CreateFunction = int (*)(pthread_t*, const pthread_attr_t*, StartRoutine, void*);

std::mutex g_mutex;
std::condition_variable g_released;
bool g_holding = false;
// Monitor threads created so far; the one numbered g_refuse (from 1) is refused.
std::atomic<int> g_created{0};
std::atomic<int> g_refuse{0};

bool startedByFamily(StartRoutine routine) {
    Dl_info info{};
    return dladdr(reinterpret_cast<void*>(routine), &info) != 0 && info.dli_fname != nullptr &&
           std::strstr(info.dli_fname, "latchedhealthundertest") != nullptr;
}

struct HeldStart {
    StartRoutine routine;
    void* argument;
};

void* heldThread(void* raw) {
    HeldStart start = *static_cast<HeldStart*>(raw);
    delete static_cast<HeldStart*>(raw);
    {
        std::unique_lock lock(g_mutex);
        g_released.wait(lock, [] { return !g_holding; });
    }
    return start.routine(start.argument);
}

void holdMonitorThreads(bool hold) {
    std::lock_guard lock(g_mutex);
    g_holding = hold;
    g_released.notify_all();
}

orv::testsupport::SyslogCapture* g_log = nullptr;

// On abort the child tells its parent what it logged, on standard error.
void reportLogOnAbort(int) {
    if (g_log != nullptr) {
        for (const orv::testsupport::SyslogLine& line : g_log->lines()) {
            std::string shown = "[" + std::to_string(line.priority) + ":";
            for (char c : line.text) {
                shown += c == '\n' ? std::string("\\n") : std::string(1, c);
            }
            shown += "]";
            (void)!write(2, shown.data(), shown.size());
        }
    }
    signal(SIGABRT, SIG_DFL);
    raise(SIGABRT);
}

}  // namespace

extern "C" __attribute__((visibility("default"))) int pthread_create(pthread_t* thread, const pthread_attr_t* attr,
                                                                     StartRoutine routine, void* argument) {
    static const auto real = reinterpret_cast<CreateFunction>(dlsym(RTLD_NEXT, "pthread_create"));
    if (!startedByFamily(routine)) {
        return real(thread, attr, routine, argument);
    }
    if (++g_created == g_refuse.load()) {
        return EAGAIN;
    }
    return real(thread, attr, heldThread, new HeldStart{routine, argument});
}

namespace latched {
namespace {

using ThreadStartDeathTest = LatchedHealthTest;

void waitForThreads(LatchedHealthTest& test, unsigned count) {
    for (int i = 0; i < 3000 && test.threadsRunningNow() < count; ++i) {
        usleep(1000);
    }
}

TEST_F(ThreadStartDeathTest, SecondInitializeBeforeEitherThreadRunsStartsASecondPair) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            holdMonitorThreads(true);
            start(false);
            const orv::host::Reply enabled = enableIpIndications();
            holdMonitorThreads(false);
            waitForThreads(*this, 4);
            _exit(enabled.rc() == CMPI_RC_OK ? static_cast<int>(threadsRunningNow()) : 100 + enabled.rc());
        },
        ::testing::ExitedWithCode(4), "");
}

TEST_F(ThreadStartDeathTest, InitializeAfterTheThreadsRunStartsNoMore) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            start();
            const orv::host::Reply enabled = enableIpIndications();
            usleep(100000);
            _exit(enabled.rc() == CMPI_RC_OK ? static_cast<int>(threadsRunningNow()) : 100 + enabled.rc());
        },
        ::testing::ExitedWithCode(2), "");
}

TEST_F(ThreadStartDeathTest, HealthThreadThatCannotBeCreatedEndsTheProcess) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(
        {
            orv::testsupport::SyslogCapture log;
            g_log = &log;
            signal(SIGABRT, reportLogOnAbort);
            g_refuse = 1;
            start(false);
        },
        "\\[3:StartHealthMonitorThread failed to start health monitoring thread\\\\n\\]");
}

TEST_F(ThreadStartDeathTest, KernelIpThreadThatCannotBeCreatedEndsTheProcess) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(
        {
            orv::testsupport::SyslogCapture log;
            g_log = &log;
            signal(SIGABRT, reportLogOnAbort);
            g_refuse = 2;
            start(false);
        },
        "\\[3:StartKernelIpMonitorThread failed to start Kernel Ip monitoring thread\\\\n\\]");
}

}  // namespace
}  // namespace latched
