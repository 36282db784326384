#include "login_throttle.hpp"

#include <algorithm>

namespace orv::http::detail {

namespace {

// The user name as sent, made safe for a log line: printable ASCII, at most 64 characters.
std::string printable(const std::string& user) {
    std::string out;
    for (char c : user.substr(0, 64)) {
        out += (c >= 0x20 && c < 0x7f && c != '"') ? c : '?';
    }
    return out;
}

}  // namespace

std::chrono::milliseconds LoginThrottle::delayAfter(unsigned failures) {
    if (failures <= kFreeFailures) {
        return std::chrono::milliseconds(0);
    }
    const unsigned doublings = std::min(failures - kFreeFailures - 1, 16U);
    return std::min(std::chrono::milliseconds(kFirstDelay.count() << doublings), kLongestDelay);
}

void LoginThrottle::forgetQuiet(Clock::time_point now) {
    for (auto it = entries_.begin(); it != entries_.end();) {
        it = now - it->second.lastFailure > kForgetAfter ? entries_.erase(it) : std::next(it);
    }
    while (entries_.size() >= kMaxAddresses) {
        entries_.erase(entries_.begin());
    }
}

LoginThrottle::Verdict LoginThrottle::failed(const std::string& address, const std::string& user,
                                             Clock::time_point now) {
    auto found = entries_.find(address);
    if (found == entries_.end()) {
        if (entries_.size() >= kMaxAddresses) {
            forgetQuiet(now);
        }
        found = entries_.emplace(address, Entry{}).first;
    } else if (now - found->second.lastFailure > kForgetAfter) {
        found->second = Entry{};
    }
    Entry& entry = found->second;
    ++entry.failures;
    entry.lastFailure = now;
    Verdict verdict;
    verdict.delay = delayAfter(entry.failures);
    if (entry.logged && now - entry.lastLogged < std::chrono::seconds(1)) {
        ++entry.notLogged;
        return verdict;
    }
    std::string line = "failed login from " + address + " as user \"" + printable(user) + "\"";
    if (entry.notLogged > 0) {
        line += " (" + std::to_string(entry.notLogged) + " more from this address since the last line)";
    }
    entry.logged = true;
    entry.lastLogged = now;
    entry.notLogged = 0;
    verdict.logLine = std::move(line);
    return verdict;
}

void LoginThrottle::succeeded(const std::string& address) {
    entries_.erase(address);
}

}  // namespace orv::http::detail
