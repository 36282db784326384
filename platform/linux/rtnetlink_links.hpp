// The interfaces of the calling thread's network namespace as rtnetlink
// (RTM_GETLINK) describes them: one message per link carries its name, flags,
// MTU, operational state, carrier, address, parent bus device and 64-bit
// counters, so every value of a link comes from one consistent answer.
#pragma once

#include "netlink_socket.hpp"

#include <cstdint>
#include <linux/if_link.h>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost {

struct LinkRecord {
    int index = 0;
    std::string name;
    std::uint32_t flags = 0;                 // IFF_* as the kernel answers them (IFF_LOWER_UP included)
    std::uint32_t mtu = 0;
    std::uint8_t operstate = 0;              // IF_OPER_*
    std::optional<bool> carrier;             // IFLA_CARRIER
    std::vector<std::uint8_t> address;       // current link-layer address
    std::string parentDevice;                // the bus device ("0000:00:03.0", "virtio2"); empty: none
    std::string parentBus;                   // its bus ("pci", "virtio", "usb")
    std::optional<rtnl_link_stats64> statistics;

    // A NIC: the interface sits on a bus device.
    bool onBus() const { return !parentDevice.empty(); }
};

// One RTM_NEWLINK message; nothing when it is not one or is cut short.
std::optional<LinkRecord> parseLinkRecord(const NetlinkMessage& message);
// "aa:bb:cc:dd:ee:ff" as ip and sysfs write a link-layer address.
std::string addressText(const std::vector<std::uint8_t>& address);

// The request for the named link (ifname not empty) or for every link (a dump),
// written into buffer (MNL_SOCKET_BUFFER_SIZE bytes).
nlmsghdr* buildLinkRequest(char* buffer, const std::string& ifname);

// One rtnetlink socket, opened in the constructing thread's network namespace
// (a socket that could not be opened is tried again at the next request);
// requests are serialised.
class RouteLinks {
public:
    RouteLinks();
    // Every link, in interface-index order. Throws LinuxCallError("RTM_GETLINK").
    std::vector<LinkRecord> all();
    // The named link. Throws LinuxCallError("RTM_GETLINK", name, ENODEV) when
    // there is no such link, with the kernel's errno on any other refusal.
    LinkRecord named(const std::string& ifname);

private:
    std::vector<NetlinkMessage> request(const std::string& ifname);

    std::mutex mutex_;
    std::unique_ptr<NetlinkSocket> socket_;
};

}  // namespace orv::linuxhost
