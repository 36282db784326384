// Interface address records: one configured address of a network interface,
// taken from an entry of the interface-address list, with the endpoint
// instance that stands for it in an IP-changed indication.
#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <cstddef>
#include <cstring>
#include <stdexcept>

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObjectPath.h>
#include <omc/ComputerSystem.h>

#include "KernelIpIndication.h"

namespace ORV {

namespace {

constexpr const char* kNamespace = "root/cimv2";
constexpr const char* kIPv4Class = "Orvane_KernelIPv4ProtocolEndpoint";
constexpr const char* kIPv6Class = "Orvane_KernelIPv6ProtocolEndpoint";
constexpr const char* kNameFormat = "Talmek Interface Name";
constexpr CMPIUint16 kIPv4ProtocolIFType = 4096;
constexpr CMPIUint16 kIPv6ProtocolIFType = 4097;

// The prefix of an IPv6 netmask is read over the size of an IPv6 socket
// address counted from the mask's first byte: the 16 mask bytes, the scope
// identifier that follows them, and 8 bytes beyond the socket address. Those
// last 8 bytes are not the entry's to read; they count as zero here.
constexpr std::size_t kPrefixBytes = sizeof(sockaddr_in6);
constexpr std::size_t kMaskOffset = offsetof(sockaddr_in6, sin6_addr);

// The address text of `family` at `binary` into `out` (`size` bytes);
// empty and false when it cannot be rendered.
bool renderAddress(int family, const void* binary, char* out, std::size_t size) {
    if (binary == nullptr || inet_ntop(family, binary, out, static_cast<socklen_t>(size)) == nullptr) {
        out[0] = '\0';
        return false;
    }
    return true;
}

const void* ipv4Bytes(const sockaddr* address) {
    return address == nullptr ? nullptr : &reinterpret_cast<const sockaddr_in*>(address)->sin_addr;
}

const void* ipv6Bytes(const sockaddr* address) {
    return address == nullptr ? nullptr : &reinterpret_cast<const sockaddr_in6*>(address)->sin6_addr;
}

// The endpoint instance with the properties every family shares.
CmpiInstance newEndpointInstance(const IAddress& record, const CmpiContext& context, CmpiBroker* broker,
                                 const std::string& ifname, CMPIUint16 protocolIFType) {
    const std::string className = record.getCreationClassName();
    CmpiInstance instance(CmpiObjectPath(kNamespace, className.c_str()));
    instance.setProperty("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
    instance.setProperty("SystemName", CmpiData(OMC::getComputerSystemName(context, *broker)));
    instance.setProperty("CreationClassName", CmpiData(className.c_str()));
    instance.setProperty("Name", CmpiData(ifname.c_str()));
    instance.setProperty("ElementName", CmpiData(ifname.c_str()));
    instance.setProperty("NameFormat", CmpiData(kNameFormat));
    instance.setProperty("ProtocolIFType", CmpiData(protocolIFType));
    return instance;
}

}  // namespace

IAddress::~IAddress() = default;

// ---------------------------------------------------------------------------
// IPv4

IPv4Address::IPv4Address(ifaddrs const* entry) : IAddress(entry->ifa_addr->sa_family) {
    if (!renderAddress(AF_INET, ipv4Bytes(entry->ifa_addr), _addr, sizeof _addr)) {
        throw std::invalid_argument("Address conversion failed");
    }
    renderAddress(AF_INET, ipv4Bytes(entry->ifa_netmask), _netmask, sizeof _netmask);
}

CmpiInstance IPv4Address::buildInterfaceObject(CmpiContext const& context, CmpiBroker* broker,
                                               std::string const& ifname) {
    CmpiInstance instance = newEndpointInstance(*this, context, broker, ifname, kIPv4ProtocolIFType);
    instance.setProperty("IPv4Address", CmpiData(_addr));
    instance.setProperty("SubnetMask", CmpiData(_netmask));
    return instance;
}

bool IPv4Address::isEqual(IAddress const* other) const {
    const IPv4Address* peer = dynamic_cast<const IPv4Address*>(other);
    if (peer == nullptr) {
        return false;
    }
    if (peer == this) {
        return true;
    }
    return std::strcmp(_addr, peer->_addr) == 0 && std::strcmp(_netmask, peer->_netmask) == 0;
}

std::string IPv4Address::getAddress() const { return _addr; }

std::string IPv4Address::getCreationClassName() const { return kIPv4Class; }

// ---------------------------------------------------------------------------
// IPv6

IPv6Address::IPv6Address(ifaddrs const* entry) : IAddress(entry->ifa_addr->sa_family), _prefix(0) {
    renderAddress(AF_INET6, ipv6Bytes(entry->ifa_addr), _addr, sizeof _addr);
    unsigned char window[kMaskOffset + kPrefixBytes] = {};
    if (entry->ifa_netmask != nullptr) {
        std::memcpy(window, entry->ifa_netmask, sizeof(sockaddr_in6));
    }
    _prefix = getPrefix(window + kMaskOffset, kPrefixBytes);
}

int IPv6Address::getPrefix(unsigned char const* mask, std::size_t length) {
    if (length == 0) {
        return 0;
    }
    int count = 0;
    std::size_t index = 0;
    while (index < length && mask[index] == 0xFF) {
        count += 8;
        ++index;
    }
    if (index == length) {
        return static_cast<int>(length * 8);
    }
    // Bits 7 down to 1 of the first byte that is not all ones; bit 0 is left out.
    bool clearSeen = false;
    for (int bit = 7; bit >= 1; --bit) {
        const bool set = (mask[index] >> bit) & 1u;
        if (set && clearSeen) {
            return 0;
        }
        if (set) {
            ++count;
        } else {
            clearSeen = true;
        }
    }
    for (++index; index < length; ++index) {
        if (mask[index] != 0) {
            return 0;
        }
    }
    return count;
}

CmpiInstance IPv6Address::buildInterfaceObject(CmpiContext const& context, CmpiBroker* broker,
                                               std::string const& ifname) {
    CmpiInstance instance = newEndpointInstance(*this, context, broker, ifname, kIPv6ProtocolIFType);
    // The property name is written one letter short of the class's IPv6Address;
    // indication consumers read it under this name.
    instance.setProperty("IPv6ddress", CmpiData(_addr));
    instance.setProperty("PrefixLength", CmpiData(static_cast<CMPIUint8>(_prefix)));
    return instance;
}

bool IPv6Address::isEqual(IAddress const* other) const {
    const IPv6Address* peer = dynamic_cast<const IPv6Address*>(other);
    if (peer == nullptr) {
        return false;
    }
    if (peer == this) {
        return true;
    }
    return std::strcmp(_addr, peer->_addr) == 0;
}

std::string IPv6Address::getAddress() const { return _addr; }

std::string IPv6Address::getCreationClassName() const { return kIPv6Class; }

}  // namespace ORV
