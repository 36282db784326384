// A heartbeat thread that cannot be created: initialize logs the failure and
// raises it with CMPI_RC_ERR_FAILED. This executable defines pthread_create,
// which the provider library then reaches instead of the C library's; it
// refuses while a test asks it to and otherwise passes the call on.
#include <dlfcn.h>
#include <pthread.h>
#include <syslog.h>

#include <atomic>
#include <cerrno>

#include <cmpi/CmpiStatus.h>

#include "DirectProvider.h"
#include "HeartbeatFixture.h"

namespace {

std::atomic<bool> refuseThreads{false};

using CreateThread = int (*)(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);

}  // namespace

extern "C" __attribute__((visibility("default"))) int pthread_create(pthread_t* thread, const pthread_attr_t* attr,
                                                                     void* (*start)(void*), void* arg) {
    if (refuseThreads.load()) {
        return EAGAIN;
    }
    static const auto next = reinterpret_cast<CreateThread>(::dlsym(RTLD_NEXT, "pthread_create"));
    return next(thread, attr, start, arg);
}

namespace heartbeat {
namespace {

using orv::testsupport::SyslogLine;

TEST_F(HeartbeatTest, ThreadThatCannotStartFailsInitializeWithALogLine) {
    root_.writeConfig("heartbeatInterval: 30\n");
    DirectProvider direct(core().broker(), heartbeats_);
    refuseThreads = true;
    bool failed = false;
    try {
        (void)direct.create();
    } catch (const CmpiStatus& status) {
        failed = true;
        EXPECT_EQ(status.rc(), CMPI_RC_ERR_FAILED);
        EXPECT_STREQ(status.msg(), "Failed to start heartbeat indication thread");
    }
    refuseThreads = false;
    EXPECT_TRUE(failed);
    EXPECT_EQ(syslog_.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed to start heartbeat indication thread"}}));
    EXPECT_EQ(heartbeats_.size(), 0u);
}

}  // namespace
}  // namespace heartbeat
