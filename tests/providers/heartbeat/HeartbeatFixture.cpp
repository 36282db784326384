#include "HeartbeatFixture.h"

#include <syslog.h>
#include <unistd.h>

#include <cmpift.h>

#include <cstdlib>
#include <fstream>
#include <thread>
#include <utility>

#include "orv/providertest/ReturnedValues.h"

namespace heartbeat {
namespace {

constexpr std::size_t kHostNameLength = 80;

std::string textOf(const CMPIString* text) {
    const char* chars = text != nullptr ? text->ft->getCharPtr(text, nullptr) : nullptr;
    return chars != nullptr ? chars : "";
}

CMPIData property(const CMPIInstance* instance, const char* name) {
    CMPIStatus status{CMPI_RC_OK, nullptr};
    CMPIData data = instance->ft->getProperty(instance, name, &status);
    if (status.rc != CMPI_RC_OK) {
        data.state = CMPI_nullValue;
        data.type = CMPI_null;
    }
    return data;
}

}  // namespace

void HeartbeatLog::add(ReceivedHeartbeat heartbeat) {
    {
        std::lock_guard lock(mutex_);
        heartbeats_.push_back(std::move(heartbeat));
    }
    arrived_.notify_all();
}

std::vector<ReceivedHeartbeat> HeartbeatLog::all() const {
    std::lock_guard lock(mutex_);
    return heartbeats_;
}

std::size_t HeartbeatLog::size() const {
    std::lock_guard lock(mutex_);
    return heartbeats_.size();
}

bool HeartbeatLog::waitFor(std::size_t count, std::chrono::milliseconds timeout) const {
    std::unique_lock lock(mutex_);
    return arrived_.wait_for(lock, timeout, [&] { return heartbeats_.size() >= count; });
}

orv::testsupport::SyslogLine openFailureLine(const std::filesystem::path& config, int seconds) {
    return {LOG_ERR, "Open file to read: " + config.string() + " failed, using default: " + std::to_string(seconds) +
                         " seconds"};
}

orv::testsupport::SyslogLine belowMinimumLine(int value) {
    return {LOG_WARNING,
            "heartbeat_interval (" + std::to_string(value) + ") is below minimum value (30), using the default."};
}

ReceivedHeartbeat readHeartbeat(const char* ns, const CMPIInstance* indication) {
    ReceivedHeartbeat heartbeat;
    heartbeat.received = std::chrono::steady_clock::now();
    heartbeat.nameSpace = ns != nullptr ? ns : "";
    heartbeat.className = orv::providertest::classNameOf(indication);
    CMPIData host = property(indication, "hostname");
    if (host.type == CMPI_string && host.state == CMPI_goodValue) {
        heartbeat.hostname = textOf(host.value.string);
    }
    CMPIData stamp = property(indication, "stamp");
    if (stamp.type == CMPI_uint32 && stamp.state == CMPI_goodValue) {
        heartbeat.stamp = stamp.value.uint32;
    }
    CMPIData when = property(indication, "IndicationTime");
    if (when.type == CMPI_dateTime && when.state == CMPI_goodValue) {
        heartbeat.indicationTime = when.value.dateTime->ft->getBinaryFormat(when.value.dateTime, nullptr);
        heartbeat.indicationTimeIsInterval = when.value.dateTime->ft->isInterval(when.value.dateTime, nullptr) != 0;
    }
    return heartbeat;
}

std::string hostName() {
    char name[kHostNameLength] = {};
    (void)::gethostname(name, sizeof name - 1);
    return name;
}

std::size_t threadCount() {
    std::size_t count = 0;
    for ([[maybe_unused]] const auto& task : std::filesystem::directory_iterator("/proc/self/task")) {
        ++count;
    }
    return count;
}

bool threadCountSettlesAt(std::size_t count, std::chrono::milliseconds timeout) {
    const auto end = std::chrono::steady_clock::now() + timeout;
    while (threadCount() != count) {
        if (std::chrono::steady_clock::now() >= end) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

namespace {

// Sanitizer runtimes start a helper thread of their own along with the first
// thread the process creates: let that happen before threads are counted.
std::size_t threadsAfterWarmUp() {
    std::thread([] {}).join();
    return threadCount();
}

}  // namespace

ConfigRoot::ConfigRoot()
    : root_(std::filesystem::temp_directory_path() / ("orv-heartbeat-root-" + std::to_string(::getpid()))) {
    std::filesystem::remove_all(root_);
    std::filesystem::create_directories(root_ / "etc/sfcb");
    ::setenv("ORV_ROOT", root_.c_str(), 1);
}

ConfigRoot::~ConfigRoot() {
    ::unsetenv("ORV_ROOT");
    std::error_code ignored;
    std::filesystem::remove_all(root_, ignored);
}

std::filesystem::path ConfigRoot::configPath() const { return root_ / "etc/sfcb/sfcb.cfg"; }

void ConfigRoot::writeConfig(const std::string& content) const {
    std::ofstream out(configPath(), std::ios::binary | std::ios::trunc);
    out << content;
}

HeartbeatTest::HeartbeatTest()
    : threadsBefore_(threadsAfterWarmUp()), provider_(std::make_unique<orv::providertest::ProviderCore>()) {
    subscriber_ = core().addIndicationSubscriber([this](std::string_view ns, const CMPIInstance* indication) {
        heartbeats_.add(readHeartbeat(std::string(ns).c_str(), indication));
    });
}

HeartbeatTest::~HeartbeatTest() {
    stop();
    core().removeIndicationSubscriber(subscriber_);
}

void HeartbeatTest::start() {
    const orv::host::Reply reply = core().activateFilter("root/cimv2", kQuery);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
}

void HeartbeatTest::stop() { core().shutdown(); }

}  // namespace heartbeat
