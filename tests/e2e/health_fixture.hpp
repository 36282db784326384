// The simulated host of the end-to-end latched health tests: the shipped
// example host with a "health" section of two elements of each of the twelve
// watched classes, served by the health elements test provider, and with
// vif0's IPv4 address chosen by the test. Every write replaces the file in one
// rename, so a running broker sees either the old host or the new one.
#pragma once

#include <array>
#include <string>

namespace orv::e2e {

// The classes the health monitor watches, in the order of its pass.
extern const std::array<const char*, 12> kWatchedClasses;

// One of the two elements of a watched class: `First` is listed first in the
// fixture, so a pass reads it before `Second`.
enum class Element { First, Second };

// The element's path as wbemcli prints it without the host: "root/cimv2:Class."
// and its keys sorted by name (canonicalPath of broker_answers.hpp).
std::string elementPath(const std::string& watchedClass, Element element);

class HealthFixture {
public:
    // A fresh folder of the test's own, named after `name` and this process,
    // holds the fixture file (and whatever else the test keeps there); the
    // destructor removes it.
    explicit HealthFixture(const std::string& name);
    ~HealthFixture();
    HealthFixture(const HealthFixture&) = delete;
    HealthFixture& operator=(const HealthFixture&) = delete;

    // Writes the host: every watched class's first element with HealthState
    // `first`, its second with `second`, vif0's IPv4 address `vif0Address`.
    void write(int first, int second, const std::string& vif0Address = "10.0.0.10") const;

    const std::string& path() const { return path_; }
    const std::string& folder() const { return folder_; }

private:
    std::string folder_;
    std::string path_;
};

}  // namespace orv::e2e
