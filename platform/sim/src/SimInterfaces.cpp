#include "SimInterfaces.h"

#include <arpa/inet.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace orv::platform::sim {
namespace {

// The stack whose interfaces the list shows, as for the kernel IP nodes.
constexpr const char* kListedStack = "defaultTcpipStack";
// What getifaddrs answers when it fails.
constexpr int kFailure = -1;

// One entry with the storage its pointers refer to. The socket addresses are
// full sockaddr_storage blocks, so a reader of any family's layout stays inside.
struct Entry : ifaddrs {
    std::string name;
    sockaddr_storage address{};
    sockaddr_storage netmask{};
};

class ListBuilder {
public:
    Entry& add(const std::string& name, unsigned flags)
    {
        entries_.push_back(std::make_unique<Entry>());
        Entry& entry = *entries_.back();
        static_cast<ifaddrs&>(entry) = ifaddrs{};
        entry.name = name;
        entry.ifa_name = entry.name.data();
        entry.ifa_flags = flags;
        return entry;
    }

    // Links the entries in order and hands them over; null when empty.
    ifaddrs* release()
    {
        for (size_t i = 0; i + 1 < entries_.size(); ++i) {
            entries_[i]->ifa_next = entries_[i + 1].get();
        }
        ifaddrs* first = entries_.empty() ? nullptr : entries_.front().get();
        for (std::unique_ptr<Entry>& entry : entries_) {
            entry.release();
        }
        entries_.clear();
        return first;
    }

private:
    std::vector<std::unique_ptr<Entry>> entries_;
};

constexpr unsigned kUpFlags = IFF_UP | IFF_RUNNING | IFF_BROADCAST | IFF_MULTICAST;

void setFamily(sockaddr_storage& storage, uint16_t family)
{
    storage.ss_family = family;
}

void addIpv4(ListBuilder& list, const VnicModel& vnic)
{
    Entry& entry = list.add(vnic.name, kUpFlags);
    auto& address = reinterpret_cast<sockaddr_in&>(entry.address);
    auto& netmask = reinterpret_cast<sockaddr_in&>(entry.netmask);
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = vnic.ipv4->address;
    netmask.sin_family = AF_INET;
    netmask.sin_addr.s_addr = vnic.ipv4->netmask;
    entry.ifa_addr = reinterpret_cast<sockaddr*>(&entry.address);
    entry.ifa_netmask = reinterpret_cast<sockaddr*>(&entry.netmask);
}

// The netmask of a prefix length (at most 128 bits count).
void fillPrefixMask(in6_addr& mask, uint32_t prefixLength)
{
    const uint32_t bits = std::min<uint32_t>(prefixLength, 128);
    std::memset(&mask, 0, sizeof mask);
    for (uint32_t byte = 0; byte < bits / 8; ++byte) {
        mask.s6_addr[byte] = 0xFF;
    }
    if (bits % 8 != 0) {
        mask.s6_addr[bits / 8] = static_cast<uint8_t>(0xFF << (8 - bits % 8));
    }
}

// An address text that is not IPv6 cannot be configured on a kernel
// interface, so it has no entry.
void addIpv6(ListBuilder& list, const std::string& name, const Ipv6Model& ipv6)
{
    in6_addr binary{};
    if (inet_pton(AF_INET6, ipv6.address.c_str(), &binary) != 1) {
        return;
    }
    Entry& entry = list.add(name, kUpFlags);
    auto& address = reinterpret_cast<sockaddr_in6&>(entry.address);
    auto& netmask = reinterpret_cast<sockaddr_in6&>(entry.netmask);
    address.sin6_family = AF_INET6;
    address.sin6_addr = binary;
    netmask.sin6_family = AF_INET6;
    fillPrefixMask(netmask.sin6_addr, ipv6.prefixLength);
    entry.ifa_addr = reinterpret_cast<sockaddr*>(&entry.address);
    entry.ifa_netmask = reinterpret_cast<sockaddr*>(&entry.netmask);
}

// Entries the fault rules add for one interface: with an address of the
// rule's family (all zero otherwise), or without an address.
void addInjected(ListBuilder& list, const HostModel& host, const std::string& name)
{
    CallSite site{"getifaddrs", {}, nullptr, name};
    site.entrySite = true;
    for (const FaultRule* rule : host.faults.fireEach(site)) {
        Entry& entry = list.add(name, kUpFlags);
        if (rule->entryFamily) {
            setFamily(entry.address, *rule->entryFamily);
            entry.ifa_addr = reinterpret_cast<sockaddr*>(&entry.address);
        }
    }
}

void addLink(ListBuilder& list, const std::string& name)
{
    Entry& entry = list.add(name, kUpFlags);
    setFamily(entry.address, AF_PACKET);
    entry.ifa_addr = reinterpret_cast<sockaddr*>(&entry.address);
}

std::vector<const VnicModel*> listedVnics(const HostModel& host)
{
    std::vector<const VnicModel*> vnics;
    if (!host.tcpipStacks) {
        return vnics;
    }
    const auto stack = host.tcpipStacks->find(kListedStack);
    if (stack == host.tcpipStacks->end()) {
        return vnics;
    }
    for (const VnicModel& vnic : stack->second.vnics.items) {
        if (!vnic.emptySlot) {
            vnics.push_back(&vnic);
        }
    }
    return vnics;
}

} // namespace

int makeInterfaceList(const HostModel& host, ifaddrs*& list)
{
    list = nullptr;
    if (const FaultRule* rule = host.faults.fire(CallSite{"getifaddrs", {}, nullptr, {}})) {
        errno = EIO;
        return rule->status ? static_cast<int>(*rule->status) : kFailure;
    }
    const std::vector<const VnicModel*> vnics = listedVnics(host);
    ListBuilder builder;
    for (const VnicModel* vnic : vnics) {
        addInjected(builder, host, vnic->name);
        addLink(builder, vnic->name);
    }
    for (const VnicModel* vnic : vnics) {
        if (vnic->ipv4) {
            addIpv4(builder, *vnic);
        }
    }
    for (const VnicModel* vnic : vnics) {
        for (const Ipv6Model& ipv6 : vnic->ipv6.items) {
            addIpv6(builder, vnic->name, ipv6);
        }
    }
    list = builder.release();
    return 0;
}

void freeInterfaceList(ifaddrs* list)
{
    while (list != nullptr) {
        std::unique_ptr<Entry> entry(static_cast<Entry*>(list));
        list = entry->ifa_next;
    }
}

} // namespace orv::platform::sim
