// Provider registrations in sfcb's providerRegister format:
//
//   # comment
//   [CIM_EthernetPort]
//      provider: EthernetPort-Provider
//      location: orvprovider
//      type: instance method
//      namespace: root/cimv2 root/interop
//      group: orv
//      unload: never
//
// Keys: provider, location, type, namespace, group, unload, parameters, user.
// provider, location and type are required; namespace defaults to root/cimv2.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "orv/repository/errors.hpp"

namespace orv::repository {

// Kinds of MI a provider serves for a class ("type:" words).
enum class ProviderKind : std::uint8_t {
    Instance = 1U << 0U,
    Association = 1U << 1U,
    Method = 1U << 2U,
    Indication = 1U << 3U,
    Property = 1U << 4U,
    Class = 1U << 5U,
    Qualifier = 1U << 6U,
};

struct ProviderRegistration {
    std::string className;  // as written between the brackets
    std::string provider;   // provider name: the factory is <provider>_Create_<Kind>MI
    std::string location;   // library base name: lib<location>.so
    std::uint8_t kinds = 0;  // bit set of ProviderKind
    std::vector<std::string> namespaces;
    std::string group;
    bool unloadNever = false;  // "unload: never"
    std::string parameters;    // free text handed to the provider
    std::string user;
    std::string file;  // where the block starts
    int line = 0;

    bool has(ProviderKind kind) const noexcept {
        return (kinds & static_cast<std::uint8_t>(kind)) != 0;
    }
};

class RegistrationSet {
public:
    // Throws RegistrationError ("file:line: what was expected").
    static RegistrationSet parseFile(const std::filesystem::path& file);
    static RegistrationSet parseText(std::string_view text, std::string_view fileName);

    // Every registration, in file order.
    const std::vector<ProviderRegistration>& all() const noexcept { return entries_; }
    // The registrations of a class (any case), in file order.
    std::vector<const ProviderRegistration*> forClass(std::string_view className) const;

private:
    std::vector<ProviderRegistration> entries_;
};

}  // namespace orv::repository
