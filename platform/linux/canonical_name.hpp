// The host's canonical name, resolved by a thread of its own so that no
// request ever waits on the resolver: a request gets the last answer for the
// current host name; a new host name (or the first request) waits a short,
// bounded time for its first answer and otherwise gets the plain host name
// until the answer arrives. Answers are refreshed in the background once they
// are older than the refresh period.
#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

namespace orv::linuxhost {

class CanonicalNameCache {
public:
    using Clock = std::chrono::steady_clock;
    // The canonical name of a host name, nothing when the resolver knows none.
    using Resolver = std::function<std::optional<std::string>(const std::string&)>;

    struct Timing {
        std::chrono::milliseconds firstWait{25};  // a new host name waits at most this long
        std::chrono::seconds refresh{300};        // answers older than this are asked again
    };

    CanonicalNameCache(Resolver resolver, Timing timing);
    // Waits for a lookup in progress to end.
    ~CanonicalNameCache();
    CanonicalNameCache(const CanonicalNameCache&) = delete;
    CanonicalNameCache& operator=(const CanonicalNameCache&) = delete;

    // The canonical name of hostName as far as known now; hostName itself otherwise.
    std::string nameFor(const std::string& hostName);

private:
    struct Answer {
        std::string hostName;
        std::string canonical;
        Clock::time_point at;
    };

    bool fresh(const std::string& hostName, Clock::time_point now) const;
    void request(const std::string& hostName);  // mutex_ held; starts the worker once
    void work();

    Resolver resolver_;
    Timing timing_;
    std::mutex mutex_;
    std::condition_variable changed_;
    std::optional<Answer> answer_;
    std::optional<std::string> wanted_;  // host name waiting for the worker
    std::optional<std::string> resolving_;  // host name the worker is resolving
    bool stopping_ = false;
    std::thread worker_;                 // started by the first request
};

// getaddrinfo(AI_CANONNAME) of the name; nothing when it fails or names nothing.
std::optional<std::string> resolveCanonicalName(const std::string& hostName);

}  // namespace orv::linuxhost
