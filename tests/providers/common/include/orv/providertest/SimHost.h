// The simulated host that providers under test see: a sim fixture file that
// the platform library inside liborvprovider.so reads.
//
// The platform substitute is chosen once per loaded provider library from
// ORV_PLATFORM and ORV_SIM_FIXTURE, so the fixture lives at one path for the
// whole test process; SimHost points both variables there. Each write()
// replaces the file in one rename, and the substitute reads it again on its
// next call, so a test may change the host between requests.
//
//   orv::providertest::SimHost host;
//   host.write(orv::providertest::SimHost::withHost({{"tcpipStacks", ...}}));
#pragma once

#include <nlohmann/json.hpp>

#include <filesystem>

namespace orv::providertest {

class SimHost {
public:
    // Host name and fully qualified name of every fixture made by withHost().
    static constexpr const char* kHostName = "simhost";
    static constexpr const char* kFqdn = "simhost.providers.test";

    // Creates the fixture folder and points the platform variables at it.
    SimHost();
    // Removes the fixture file and its folder.
    ~SimHost();
    SimHost(const SimHost&) = delete;
    SimHost& operator=(const SimHost&) = delete;

    // Replaces the fixture with `fixture` in one step.
    void write(const nlohmann::ordered_json& fixture) const;

    const std::filesystem::path& path() const { return file_; }

    // `sections` (an object of fixture sections) preceded by the "host"
    // section naming kHostName / kFqdn on a hypervisor kernel.
    static nlohmann::ordered_json withHost(const nlohmann::ordered_json& sections = nlohmann::ordered_json::object());

private:
    std::filesystem::path folder_;
    std::filesystem::path file_;
};

}  // namespace orv::providertest
