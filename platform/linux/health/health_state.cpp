#include "health_state.hpp"

#include <algorithm>

namespace orv::linuxhost::health {

std::optional<std::uint16_t> worse(std::optional<std::uint16_t> a, std::optional<std::uint16_t> b)
{
    if (!a) return b;
    if (!b) return a;
    return std::max(*a, *b);
}

std::vector<std::uint16_t> operationalStatusFor(std::optional<std::uint16_t> state)
{
    if (!state) return {};
    if (*state <= kOk) return {2};
    if (*state < kMajorFailure) return {3};
    if (*state < kNonRecoverable) return {6};
    return {7};
}

}  // namespace orv::linuxhost::health
