// The heartbeat provider under test: a configuration file under a root folder
// of the test's own (ORV_ROOT), the broker core serving the provider library,
// and a record of every heartbeat the provider delivered.
//
// The provider's state is process-wide and its shutdown flag is never reset
// while the library stays loaded, so every test runs in a process of its own
// (each test case is its own ctest entry).
#pragma once

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include <orv/testsupport/SyslogCapture.h>

#include "orv/providertest/ProviderCore.h"

namespace heartbeat {

inline constexpr const char* kClassName = "Orvane_CIMHeartbeat";
inline constexpr const char* kQuery = "SELECT * FROM Orvane_CIMHeartbeat";
// How long a heartbeat due at once may take to arrive on a loaded machine.
inline constexpr std::chrono::seconds kAtOnce{10};
inline constexpr std::uint64_t kMicrosecondsPerSecond = 1000000;

// One delivered heartbeat, read while it was being delivered.
struct ReceivedHeartbeat {
    std::string nameSpace;
    std::string className;
    std::string hostname;
    std::optional<std::uint32_t> stamp;
    std::uint64_t indicationTime = 0;  // microseconds
    bool indicationTimeIsInterval = true;
    std::chrono::steady_clock::time_point received;
};

// Heartbeats in the order they arrived, safe to read while the thread delivers.
class HeartbeatLog {
public:
    void add(ReceivedHeartbeat heartbeat);
    std::vector<ReceivedHeartbeat> all() const;
    std::size_t size() const;
    // Waits until at least `count` heartbeats arrived or `timeout` passed.
    bool waitFor(std::size_t count, std::chrono::milliseconds timeout) const;

private:
    mutable std::mutex mutex_;
    mutable std::condition_variable arrived_;
    std::vector<ReceivedHeartbeat> heartbeats_;
};

// The system-log lines of the configuration reader.
orv::testsupport::SyslogLine openFailureLine(const std::filesystem::path& config, int seconds);
orv::testsupport::SyslogLine belowMinimumLine(int value);

// What the instance handed to deliverIndication holds.
ReceivedHeartbeat readHeartbeat(const char* ns, const CMPIInstance* indication);

// The host name as the provider reads it.
std::string hostName();

// Threads of this process now.
std::size_t threadCount();
// Waits up to `timeout` for the process to have `count` threads (a joined
// thread may stay listed for a moment while the kernel finishes it).
bool threadCountSettlesAt(std::size_t count, std::chrono::milliseconds timeout = std::chrono::seconds(2));

// A root folder of this process's own, with ORV_ROOT pointing at it; removed
// with the object.
class ConfigRoot {
public:
    ConfigRoot();
    ~ConfigRoot();
    ConfigRoot(const ConfigRoot&) = delete;
    ConfigRoot& operator=(const ConfigRoot&) = delete;

    // Writes etc/sfcb/sfcb.cfg under the root.
    void writeConfig(const std::string& content) const;
    std::filesystem::path configPath() const;

private:
    std::filesystem::path root_;
};

// The heartbeat provider loaded by the broker core on a subscription's first
// filter, as a broker loads an indication provider.
class HeartbeatTest : public ::testing::Test {
protected:
    HeartbeatTest();
    ~HeartbeatTest() override;

    // Activates a filter on the heartbeat class: the core loads the provider,
    // whose initialize starts the thread.
    void start();
    // The broker core's terminating shutdown.
    void stop();

    orv::host::BrokerCore& core() { return provider_->core(); }

    ConfigRoot root_;
    orv::testsupport::SyslogCapture syslog_;
    HeartbeatLog heartbeats_;
    std::size_t threadsBefore_ = 0;

private:
    std::unique_ptr<orv::providertest::ProviderCore> provider_;
    std::uint64_t subscriber_ = 0;
};

}  // namespace heartbeat
