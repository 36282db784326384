// The kernel's network interfaces with their addresses, from getifaddrs: per
// interface the first IPv4 address with its netmask and every IPv6 address with
// its prefix length. Loopback interfaces are left out.
#pragma once

#include <cstdint>
#include <ifaddrs.h>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost {

struct Ipv4Assignment {
    std::uint32_t address = 0;  // network byte order, as inet_ntoa takes it
    std::uint32_t netmask = 0;  // network byte order
};

struct Ipv6Assignment {
    std::string address;        // inet_ntop text
    std::uint32_t prefixLength = 0;
};

struct InterfaceAddresses {
    std::string name;
    std::optional<Ipv4Assignment> ipv4;
    std::vector<Ipv6Assignment> ipv6;
};

// Interfaces in the order getifaddrs first names them (its link entries come in
// interface-index order). IPv4 alias labels ("eth0:1") count for their interface.
std::vector<InterfaceAddresses> collectInterfaceAddresses(const ifaddrs* list);
// getifaddrs of the calling thread's network namespace; throws LinuxCallError.
std::vector<InterfaceAddresses> readInterfaceAddresses();
// Leading one bits of a netmask of the given number of bytes.
std::uint32_t prefixLength(const std::uint8_t* mask, std::size_t bytes);

}  // namespace orv::linuxhost
