// libFuzzer target: the provider registration reader. Malformed input must end
// in RegistrationError.
#include <cstddef>
#include <cstdint>
#include <string_view>

#include "orv/repository/registration.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    try {
        const auto set = orv::repository::RegistrationSet::parseText(text, "fuzz.reg");
        for (const auto& r : set.all()) {
            (void)set.forClass(r.className);
        }
    } catch (const orv::repository::RegistrationError&) {
    }
    return 0;
}
