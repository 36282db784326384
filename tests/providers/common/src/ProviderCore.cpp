#include "orv/providertest/ProviderCore.h"

#include <cmpift.h>

#include <cstdlib>
#include <mutex>
#include <stdexcept>

namespace orv::providertest {

struct ProviderCore::WarningLog {
    mutable std::mutex mutex;
    std::vector<std::string> lines;
};

namespace {

// The variable's value, or else the folder of the build that compiled this file.
std::filesystem::path fromEnvironment(const char* name, const char* builtIn) {
    const char* value = std::getenv(name);
    return value != nullptr && *value != '\0' ? value : builtIn;
}

orv::host::CoreConfig configFor(const ProviderCoreOptions& options,
                                const std::shared_ptr<ProviderCore::WarningLog>& warnings) {
    orv::host::CoreConfig config;
    config.warningSink = [warnings](const std::string& line) {
        std::lock_guard<std::mutex> lock(warnings->mutex);
        warnings->lines.push_back(line);
    };
    config.providerDirs = options.providerDirs;
    config.providerDirs.push_back(ProviderCore::providerDir());
    config.mofPaths = {ProviderCore::mofFile()};
    config.mofPaths.insert(config.mofPaths.end(), options.mofs.begin(), options.mofs.end());
    if (options.projectRegistrations) {
        config.registrationFiles.push_back(ProviderCore::registrationFile());
    }
    config.registrationFiles.insert(config.registrationFiles.end(), options.registrations.begin(),
                                    options.registrations.end());
    return config;
}

orv::host::CallOptions withProperties(const PropertyList& properties) {
    orv::host::CallOptions options;
    options.properties = properties;
    return options;
}

}  // namespace

std::filesystem::path ProviderCore::buildDir() { return fromEnvironment("ORV_BUILD_DIR", ORV_PROVIDER_TEST_BUILD_DIR); }
std::filesystem::path ProviderCore::sourceDir() { return fromEnvironment("ORV_SOURCE_DIR", ORV_PROVIDER_TEST_SOURCE_DIR); }
std::filesystem::path ProviderCore::registrationFile() { return sourceDir() / "cim/mof/orvprovider.reg"; }
std::filesystem::path ProviderCore::mofFile() { return sourceDir() / "cim/mof/orvprovider.mof"; }
std::filesystem::path ProviderCore::providerDir() { return buildDir() / "lib"; }

ProviderCore::ProviderCore(const ProviderCoreOptions& options)
    : warnings_(std::make_shared<WarningLog>()),
      core_(std::make_unique<orv::host::BrokerCore>(configFor(options, warnings_))) {}

std::vector<std::string> ProviderCore::warnings() const {
    std::lock_guard<std::mutex> lock(warnings_->mutex);
    return warnings_->lines;
}

ProviderCore::~ProviderCore() = default;

CMPIObjectPath* ProviderCore::path(std::string_view className, const StringKeys& keys, std::string_view ns) {
    const CMPIBroker* mb = broker();
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIObjectPath* op = mb->eft->newObjectPath(mb, std::string(ns).c_str(), std::string(className).c_str(), &st);
    if (st.rc != CMPI_RC_OK || op == nullptr) {
        throw std::runtime_error("newObjectPath failed with rc " + std::to_string(st.rc));
    }
    for (const auto& [name, value] : keys) {
        // A chars value is passed as the characters themselves, as CMPI requires.
        st = op->ft->addKey(op, name.c_str(), reinterpret_cast<const CMPIValue*>(value.c_str()), CMPI_chars);
        if (st.rc != CMPI_RC_OK) {
            throw std::runtime_error("addKey " + name + " failed with rc " + std::to_string(st.rc));
        }
    }
    return op;
}

orv::host::Reply ProviderCore::enumerateInstances(std::string_view className, const PropertyList& properties) {
    return core_->enumerateInstances(path(className), withProperties(properties));
}

orv::host::Reply ProviderCore::enumerateInstanceNames(std::string_view className) {
    return core_->enumerateInstanceNames(path(className));
}

orv::host::Reply ProviderCore::getInstance(std::string_view className, const StringKeys& keys,
                                           const PropertyList& properties) {
    return core_->getInstance(path(className, keys), withProperties(properties));
}

}  // namespace orv::providertest
