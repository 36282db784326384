// Simulated hosts for the hypervisor software identity and installed-software
// providers: a version record (or a failing version service), the alternate
// boot bank's boot.cfg under a root directory of the test's own, and a time
// zone chosen by the test.
#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"

namespace swid {

using Json = nlohmann::ordered_json;
using orv::providertest::NamedValue;

inline constexpr const char* kSoftwareClass = "Orvane_HypervisorSoftwareIdentity";
inline constexpr const char* kAssociationClass = "Orvane_InstalledSoftwareIdentity";
inline constexpr const char* kSystemClass = "OMC_UnitaryComputerSystem";
inline constexpr const char* kPrimaryId = "Orvane Zolti 6.0.0 build-4192238";
inline constexpr const char* kAlternateId = "Alt Boot Bank: Orvane Zolti 6.0.0 build-4192238";
inline constexpr long kUptimeSeconds = 864000;

struct VersionRecord {
    std::string product = "Orvane Zolti";
    std::string productVersion = "6.0.0";
    std::string buildVersion = "build-4192238";
    std::string buildDate = "Jul 5 2016";
    std::string buildTime = "12:34:56";
    unsigned long talmekBuild = 4192238;
};

// The version section of a record.
// A file name in the temporary folder that no other test process uses.
std::filesystem::path scratchFile(const std::string& name);

Json versionSection(const VersionRecord& record = {});
// The version section of a service that fails with code 77, errno 16, "Device busy".
Json failingVersionSection();

// A host with the version section, on the hypervisor kernel or not.
Json hostWith(const Json& version, bool osIsTmk = true);

// The properties of the running image's instance built from the default
// record, LastStartTime left out (see withoutLastStartTime).
std::vector<NamedValue> primaryProperties();
// The properties of the alternate bank's instance of "build=6.0.0-3.58.4192238".
std::vector<NamedValue> alternateProperties();

// The text of the named value, or "<absent>".
std::string textOf(const std::vector<NamedValue>& values, const std::string& name);

// The properties of instance without LastStartTime.
std::vector<NamedValue> withoutLastStartTime(const CMPIInstance* instance);
// LastStartTime of instance in seconds since the epoch; nullopt when absent.
std::optional<long long> lastStartSeconds(const CMPIInstance* instance);

// InstanceID keys of the returned paths, or InstanceID properties of the returned instances.
std::vector<std::string> instanceIdsOf(const orv::host::Reply& reply);

class SwidTest : public ::testing::Test {
protected:
    // Points ORV_ROOT at an empty root directory and sets TZ to UTC.
    SwidTest();
    ~SwidTest() override;

    void serve(const Json& fixture) { host_.write(fixture); }
    // Writes <root>/altbootbank/boot.cfg.
    void writeBootCfg(const std::string& content) const;
    void removeBootCfg() const;
    static void setTimeZone(const char* tz);

    orv::providertest::ProviderCore& provider() { return *provider_; }
    // A fresh broker core (and so fresh provider objects), for tests that start over.
    void restartCore(const orv::providertest::ProviderCoreOptions& options = {});

    // The path of the host's computer system, as the association names it.
    CMPIObjectPath* systemPath(const char* nameSpace = "root/cimv2");
    CMPIObjectPath* softwarePath(const std::string& instanceId);

private:
    orv::providertest::SimHost host_;  // before the core: it selects the platform
    std::filesystem::path root_;
    std::unique_ptr<orv::providertest::ProviderCore> provider_;
};

}  // namespace swid
