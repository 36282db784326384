// The 64-bit interface counters of rtnetlink (RTM_GETLINK, IFLA_STATS64).
#pragma once

#include "netlink_socket.hpp"

#include <linux/if_link.h>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace orv::linuxhost {

// Asks for one interface by name. Throws LinuxCallError ("RTM_GETLINK", name,
// errno) when the interface is gone or the kernel gives no 64-bit counters.
rtnl_link_stats64 readLinkStatistics(NetlinkSocket& route, const std::string& ifname);
// One rtnetlink socket of the creating thread's network namespace, opened at
// the first read and shared by the NICs of a backend; reads are serialised.
class RouteStatistics {
public:
    // Throws LinuxCallError as readLinkStatistics; a socket that cannot be
    // opened is tried again at the next read.
    rtnl_link_stats64 read(const std::string& ifname);

private:
    std::mutex mutex_;
    std::unique_ptr<NetlinkSocket> socket_;
};

// The request message for one interface, written into buffer (MNL_SOCKET_BUFFER_SIZE bytes).
nlmsghdr* buildLinkRequest(char* buffer, const std::string& ifname);
// The IFLA_STATS64 attribute of an RTM_NEWLINK answer; nothing when it has none.
std::optional<rtnl_link_stats64> parseLinkStatistics(const NetlinkMessage& answer);

}  // namespace orv::linuxhost
