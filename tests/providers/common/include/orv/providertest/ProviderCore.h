// The broker core serving the built provider library, for provider tests.
//
// It loads build/lib/liborvprovider.so with the project's registration
// cim/mof/orvprovider.reg and classes cim/mof/orvprovider.mof, exactly as orv-cimhost does, and sends requests through
// the ordinary CMPI function tables. Paths made by the helpers live as long as
// the ProviderCore; each Reply owns what it returned.
//
//   SimHost host;                       // first: the platform reads it
//   host.write(SimHost::withHost(...));
//   ProviderCore provider;
//   orv::host::Reply reply = provider.enumerateInstances("Orvane_Processor");
#pragma once

#include <cmpidt.h>

#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "orv/host/broker_core.hpp"

namespace orv::providertest {

inline constexpr std::string_view kNamespace = "root/cimv2";

// String-valued keys of an instance path, in order.
using StringKeys = std::vector<std::pair<std::string, std::string>>;
// A property list; std::nullopt asks for every property.
using PropertyList = std::optional<std::vector<std::string>>;

struct ProviderCoreOptions {
    // Read the project's registration file (before `registrations`).
    bool projectRegistrations = true;
    // More registration files, for example to route a class of the test's
    // choosing to a provider.
    std::vector<std::filesystem::path> registrations;
    // Folders searched for provider libraries before the build's.
    std::vector<std::filesystem::path> providerDirs{};
    // More MOF files, read after the project's.
    std::vector<std::filesystem::path> mofs{};
};

class ProviderCore {
public:
    // ORV_BUILD_DIR and ORV_SOURCE_DIR when set, else the build and source
    // folders this fixture was compiled in.
    static std::filesystem::path buildDir();
    static std::filesystem::path sourceDir();
    static std::filesystem::path registrationFile();  // cim/mof/orvprovider.reg
    static std::filesystem::path mofFile();           // cim/mof/orvprovider.mof
    static std::filesystem::path providerDir();       // build/lib

    explicit ProviderCore(const ProviderCoreOptions& options = {});
    ~ProviderCore();
    ProviderCore(const ProviderCore&) = delete;
    ProviderCore& operator=(const ProviderCore&) = delete;

    orv::host::BrokerCore& core() { return *core_; }
    // The core's warnings so far, one line each (at start, the class repository's
    // about the MOF, such as the known AutoSense type change); kept here rather than
    // written to standard error, which the tests of provider output capture.
    std::vector<std::string> warnings() const;
    const CMPIBroker* broker() const { return core_->broker(); }

    // A path of the class (no keys), or of an instance with string keys.
    CMPIObjectPath* path(std::string_view className, const StringKeys& keys = {},
                         std::string_view ns = kNamespace);

    orv::host::Reply enumerateInstances(std::string_view className, const PropertyList& properties = std::nullopt);
    orv::host::Reply enumerateInstanceNames(std::string_view className);
    orv::host::Reply getInstance(std::string_view className, const StringKeys& keys,
                                 const PropertyList& properties = std::nullopt);

    struct WarningLog;

private:
    std::shared_ptr<WarningLog> warnings_;
    std::unique_ptr<orv::host::BrokerCore> core_;
    // Declared after the core: destroyed first, as the core requires.
    orv::host::ObjectScope scope_;
};

}  // namespace orv::providertest
