// Test helper: a simulated host whose fixture file the test writes, selected
// as the platform substitute for the calls that follow.
#pragma once

#include <nlohmann/json.hpp>

#include <string>

#include "orv/platform/simgen/HostGenerator.h"

namespace orv::platform::test {

using Json = nlohmann::ordered_json;

class SimHost {
public:
    // Writes fixture to a fresh file and selects the sim substitute on it.
    explicit SimHost(const Json& fixture);
    explicit SimHost(const std::string& fixtureText);
    ~SimHost();
    SimHost(const SimHost&) = delete;
    SimHost& operator=(const SimHost&) = delete;

    // Replaces the file (a new inode, as editors and tools do).
    void rewrite(const Json& fixture);
    void rewriteText(const std::string& text);
    const std::string& path() const { return path_; }

private:
    std::string dir_;
    std::string path_;
};

// The generator's default host: 4 NICs (the last without PCI device),
// 2 vNICs with 2 IPv6 addresses each, 2 packages x 8 cores.
Json defaultHost();

// Adds a fault rule to a fixture.
void addFault(Json& fixture, Json rule);

// Writes text to path atomically (write then rename).
void writeFileAtomically(const std::string& path, const std::string& text);

} // namespace orv::platform::test
