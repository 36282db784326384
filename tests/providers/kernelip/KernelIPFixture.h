// Simulated hosts for the kernel IP endpoint provider: virtual NICs of the
// default TCP/IP stack with their addresses, and injected kernel-read faults.
#pragma once

#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <vector>

#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"

namespace kernelip {

using Json = nlohmann::ordered_json;
using orv::providertest::NamedValue;

inline constexpr const char* kIPv4Class = "Orvane_KernelIPv4ProtocolEndpoint";
inline constexpr const char* kIPv6Class = "Orvane_KernelIPv6ProtocolEndpoint";
inline constexpr const char* kKernelParent = "Orvane_KernelIPProtocolEndpoint";
inline constexpr const char* kCimParent = "CIM_IPProtocolEndpoint";

inline constexpr const char* kVnicsNode = "KSI_NODE_net_tcpip_instances_vNics";
inline constexpr const char* kIPv4Node = "KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr";
inline constexpr const char* kNetmaskNode = "KSI_NODE_net_tcpip_instances_vNics_v4_netmask";
inline constexpr const char* kIPv6ListNode = "KSI_NODE_net_tcpip_instances_vNics_v6_addresses";
inline constexpr const char* kSummaryNode = "KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary";

struct IPv6 {
    std::string address;
    unsigned prefixLength;
};

struct Vnic {
    std::string name;
    std::optional<std::pair<std::string, std::string>> ipv4;  // address, netmask
    std::vector<IPv6> ipv6;
};

// A fault rule: `call` fails, optionally only on `node` and for invocations
// whose parameters include `param`.
Json fault(const std::string& call, const std::string& node = {}, const std::string& param = {});

// A host whose default stack lists `vnics` (std::nullopt: an empty slot).
Json hostWith(const std::vector<std::optional<Vnic>>& vnics, const Json& faults = Json::array());

// vif0: 10.0.0.10/255.255.255.0, fe80::1/64, fd00::10/48
// vif1: 10.0.1.10/255.255.0.0, fd01::10/64
// vif2: 192.168.5.7/255.255.255.128, fd02::7/112
std::vector<std::optional<Vnic>> threeVnics();

// The properties every instance of a record begins with.
std::vector<NamedValue> commonProperties(const std::string& className, const std::string& ifname,
                                         unsigned protocolIFType);
std::vector<NamedValue> ipv4Properties(const std::string& className, const std::string& ifname,
                                       const std::string& address, const std::string& netmask);
std::vector<NamedValue> ipv6Properties(const std::string& className, const std::string& ifname,
                                       const std::string& address, unsigned prefixLength);

// (class, Name) of every returned instance, in order.
std::vector<std::pair<std::string, std::string>> endpointsOf(const orv::host::Reply& reply);

class KernelIPTest : public ::testing::Test {
protected:
    // Writes the host the provider reads on its next request.
    void serve(const Json& fixture) { host_.write(fixture); }
    orv::providertest::ProviderCore& provider() { return provider_; }

private:
    orv::providertest::SimHost host_;  // before the core: it selects the platform
    orv::providertest::ProviderCore provider_;
};

}  // namespace kernelip
