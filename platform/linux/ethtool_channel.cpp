#include "ethtool_channel.hpp"

#include "linux_call_error.hpp"

#include <cerrno>
#include <cstring>
#include <linux/sockios.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

namespace orv::linuxhost {

IoctlEthtoolChannel::IoctlEthtoolChannel() : socket_(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0))
{
    if (socket_ < 0) throw LinuxCallError("socket", "ethtool", errno);
}

IoctlEthtoolChannel::~IoctlEthtoolChannel() { ::close(socket_); }

int IoctlEthtoolChannel::exchange(const std::string& ifname, void* buffer, std::size_t)
{
    if (ifname.empty() || ifname.size() >= IFNAMSIZ) return ENODEV;
    ifreq request{};
    std::memcpy(request.ifr_name, ifname.c_str(), ifname.size());
    request.ifr_data = static_cast<char*>(buffer);
    return ::ioctl(socket_, SIOCETHTOOL, &request) == 0 ? 0 : errno;
}

}  // namespace orv::linuxhost
