// Registration files written by a test, for routing a class of the test's
// choosing to a provider of the library (ProviderCoreOptions::registrations).
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orv::providertest {

struct Registration {
    std::string className;
    std::string provider;
    std::string type = "instance";
    std::string nameSpace = "root/cimv2";
};

// Writes one providerRegister block per entry, all with location orvprovider.
void writeRegistrationFile(const std::filesystem::path& file, const std::vector<Registration>& entries);

}  // namespace orv::providertest
