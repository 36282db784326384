#include "kernel_release.hpp"

#include <charconv>
#include <optional>
#include <sys/utsname.h>

namespace orv::linuxhost {

namespace {

// The decimal number at the front of text, removed from it.
std::optional<unsigned> takeNumber(std::string_view& text)
{
    unsigned value = 0;
    auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (ec != std::errc() || end == text.data()) return std::nullopt;
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
    return value;
}

}  // namespace

bool releaseNamesParentDevices(std::string_view release)
{
    const auto major = takeNumber(release);
    if (!major || release.empty() || release.front() != '.') return false;
    release.remove_prefix(1);
    const auto minor = takeNumber(release);
    if (!minor) return false;
    return *major > 5 || (*major == 5 && *minor >= 16);
}

bool kernelNamesParentDevices()
{
    static const bool names = [] {
        utsname name{};
        return ::uname(&name) == 0 && releaseNamesParentDevices(name.release);
    }();
    return names;
}

}  // namespace orv::linuxhost
