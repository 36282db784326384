// The identity the host's firmware gives the machine (the DMI system
// information): vendor, product name, serial number and UUID, answered by the
// platform substitute in use.
#ifndef ORV_PLATFORM_SYSTEMIDENTITY_H
#define ORV_PLATFORM_SYSTEMIDENTITY_H

#include <optional>
#include <string>

namespace orv::platform {

// Each value is absent when the host does not tell it (no firmware table, a
// file the caller may not read, an empty field).
struct SystemIdentity {
    std::optional<std::string> vendor;
    std::optional<std::string> product;
    std::optional<std::string> serialNumber;
    std::optional<std::string> uuid;

    bool operator==(const SystemIdentity&) const = default;
};

// The machine's identity. Throws std::runtime_error when the host cannot be
// asked at all (a rejected fixture, an injected failure).
SystemIdentity systemIdentity();

} // namespace orv::platform

#endif
