#include "interface_addresses.hpp"

#include "linux_call_error.hpp"

#include <algorithm>
#include <arpa/inet.h>
#include <cerrno>
#include <memory>
#include <net/if.h>
#include <netinet/in.h>

namespace orv::linuxhost {

namespace {

// The interface an entry belongs to: IPv4 labels carry ":alias" after the name,
// and a colon never appears in an interface name.
std::string interfaceOf(const ifaddrs& entry)
{
    std::string name = entry.ifa_name ? entry.ifa_name : "";
    return name.substr(0, name.find(':'));
}

InterfaceAddresses& slotFor(std::vector<InterfaceAddresses>& interfaces, const std::string& name)
{
    auto it = std::find_if(interfaces.begin(), interfaces.end(),
                           [&](const InterfaceAddresses& entry) { return entry.name == name; });
    if (it != interfaces.end()) return *it;
    interfaces.push_back({name, std::nullopt, {}});
    return interfaces.back();
}

void addIpv4(InterfaceAddresses& slot, const ifaddrs& entry)
{
    if (slot.ipv4) return;  // the first IPv4 address only
    Ipv4Assignment assignment;
    assignment.address = reinterpret_cast<const sockaddr_in*>(entry.ifa_addr)->sin_addr.s_addr;
    if (entry.ifa_netmask) assignment.netmask = reinterpret_cast<const sockaddr_in*>(entry.ifa_netmask)->sin_addr.s_addr;
    slot.ipv4 = assignment;
}

void addIpv6(InterfaceAddresses& slot, const ifaddrs& entry)
{
    const auto* address = reinterpret_cast<const sockaddr_in6*>(entry.ifa_addr);
    char text[INET6_ADDRSTRLEN] = {};
    if (!inet_ntop(AF_INET6, &address->sin6_addr, text, sizeof text)) return;
    Ipv6Assignment assignment{text, 0};
    if (entry.ifa_netmask) {
        const auto* mask = reinterpret_cast<const sockaddr_in6*>(entry.ifa_netmask);
        assignment.prefixLength = prefixLength(mask->sin6_addr.s6_addr, 16);
    }
    slot.ipv6.push_back(std::move(assignment));
}

}  // namespace

std::uint32_t prefixLength(const std::uint8_t* mask, std::size_t bytes)
{
    std::uint32_t length = 0;
    for (std::size_t i = 0; i < bytes; ++i) {
        for (int bit = 7; bit >= 0; --bit) {
            if (!((mask[i] >> bit) & 1u)) return length;
            ++length;
        }
    }
    return length;
}

std::vector<InterfaceAddresses> collectInterfaceAddresses(const ifaddrs* list)
{
    std::vector<InterfaceAddresses> interfaces;
    for (const ifaddrs* entry = list; entry; entry = entry->ifa_next) {
        if (!entry->ifa_name || (entry->ifa_flags & IFF_LOOPBACK)) continue;
        InterfaceAddresses& slot = slotFor(interfaces, interfaceOf(*entry));
        if (!entry->ifa_addr) continue;
        if (entry->ifa_addr->sa_family == AF_INET) addIpv4(slot, *entry);
        if (entry->ifa_addr->sa_family == AF_INET6) addIpv6(slot, *entry);
    }
    return interfaces;
}

std::vector<InterfaceAddresses> readInterfaceAddresses()
{
    ifaddrs* list = nullptr;
    if (getifaddrs(&list) != 0) throw LinuxCallError("getifaddrs", "interfaces", errno);
    std::unique_ptr<ifaddrs, void (*)(ifaddrs*)> owner(list, freeifaddrs);
    return collectInterfaceAddresses(list);
}

}  // namespace orv::linuxhost
