#include "linux_call_error.hpp"

#include <cerrno>
#include <cstring>

namespace orv::linuxhost {

namespace {
std::string describe(const std::string& call, const std::string& object, int error)
{
    return call + " on " + object + ": " + std::strerror(error);
}
}  // namespace

LinuxCallError::LinuxCallError(std::string call, std::string object, int error)
    : std::runtime_error(describe(call, object, error)),
      call_(std::move(call)),
      object_(std::move(object)),
      error_(error)
{
}

bool LinuxCallError::unsupported() const noexcept
{
    return error_ == EOPNOTSUPP || error_ == ENOTSUP;
}

bool LinuxCallError::vanished() const noexcept
{
    return error_ == ENODEV || error_ == ENOENT || error_ == ENXIO;
}

}  // namespace orv::linuxhost
