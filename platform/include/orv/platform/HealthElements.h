// Hardware elements whose health the host reports, answered by the platform
// substitute in use: for each watched hardware class, the elements with their
// key bindings and their HealthState.
#ifndef ORV_PLATFORM_HEALTHELEMENTS_H
#define ORV_PLATFORM_HEALTHELEMENTS_H

#include <cstdint>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace orv::platform {

// One key binding: a string, or (for hosts that name an element by a number)
// an unsigned 32-bit integer.
struct HealthKey {
    std::string name;
    std::optional<std::string> text;  // set for a string key
    uint32_t number = 0;              // the value of a numeric key
};

// A descriptive property of an element beside its keys and HealthState (for
// example ElementName, a sensor's CurrentReading, a drive's OperationalStatus),
// typed as the element's class declares it.
using HealthPropertyValue =
    std::variant<std::string, bool, uint16_t, uint32_t, uint64_t, int32_t, int64_t, std::vector<uint16_t>>;

struct HealthProperty {
    std::string name;
    HealthPropertyValue value;
};

struct HealthElement {
    std::string className;               // class of the element's own path
    std::optional<std::string> hostName; // host name of its path, when it has one
    std::vector<HealthKey> keys;
    // The HealthState property: absent (nullopt) or present; a present value
    // may be null.
    std::optional<std::optional<uint16_t>> healthState;
    // Other properties the host reports, in its order; none on hosts that give
    // only keys and health.
    std::vector<HealthProperty> properties;
};

// The elements reported under the watched class, in the host's order. Throws
// std::runtime_error when the host cannot report them.
std::vector<HealthElement> healthElementsOf(const std::string& watchedClass);

} // namespace orv::platform

#endif
