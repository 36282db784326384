// Failed logins per client address: a growing delay before each further 401 once an
// address has failed a few times in a row, and log lines limited to one a second per
// address (the ones held back are counted in the next line). A success clears the
// address; an address quiet for a minute is forgotten. Not thread-safe: the server
// calls it from its I/O thread only.
#pragma once

#include <chrono>
#include <cstddef>
#include <optional>
#include <string>
#include <unordered_map>

namespace orv::http::detail {

class LoginThrottle {
public:
    using Clock = std::chrono::steady_clock;

    struct Verdict {
        std::chrono::milliseconds delay{0};  // before the 401 goes out
        std::optional<std::string> logLine;  // a line to log now, if any
    };

    // Failures answered without delay before the delay starts growing.
    static constexpr unsigned kFreeFailures = 3;
    static constexpr std::chrono::milliseconds kFirstDelay{100};
    static constexpr std::chrono::milliseconds kLongestDelay{5000};
    static constexpr std::chrono::seconds kForgetAfter{60};
    static constexpr std::size_t kMaxAddresses = 10000;

    Verdict failed(const std::string& address, const std::string& user, Clock::time_point now);
    void succeeded(const std::string& address);
    std::size_t trackedAddresses() const noexcept { return entries_.size(); }

private:
    struct Entry {
        unsigned failures = 0;
        Clock::time_point lastFailure{};
        Clock::time_point lastLogged{};
        bool logged = false;
        unsigned notLogged = 0;
    };

    static std::chrono::milliseconds delayAfter(unsigned failures);
    void forgetQuiet(Clock::time_point now);

    std::unordered_map<std::string, Entry> entries_;
};

}  // namespace orv::http::detail
