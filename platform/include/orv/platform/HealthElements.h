// Hardware elements whose health the host reports, answered by the platform
// substitute in use: for each watched hardware class, the elements with their
// key bindings and their HealthState.
#ifndef ORV_PLATFORM_HEALTHELEMENTS_H
#define ORV_PLATFORM_HEALTHELEMENTS_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::platform {

// One key binding: a string, or (for hosts that name an element by a number)
// an unsigned 32-bit integer.
struct HealthKey {
    std::string name;
    std::optional<std::string> text;  // set for a string key
    uint32_t number = 0;              // the value of a numeric key
};

struct HealthElement {
    std::string className;               // class of the element's own path
    std::optional<std::string> hostName; // host name of its path, when it has one
    std::vector<HealthKey> keys;
    // The HealthState property: absent (nullopt) or present; a present value
    // may be null.
    std::optional<std::optional<uint16_t>> healthState;
};

// The elements reported under the watched class, in the host's order. Throws
// std::runtime_error when the host cannot report them.
std::vector<HealthElement> healthElementsOf(const std::string& watchedClass);

} // namespace orv::platform

#endif
