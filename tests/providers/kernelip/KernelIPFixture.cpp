#include "KernelIPFixture.h"

namespace kernelip {
namespace {

Json vnicJson(const std::optional<Vnic>& vnic) {
    if (!vnic) {
        return nullptr;
    }
    Json ipv6 = Json::array();
    for (const IPv6& address : vnic->ipv6) {
        ipv6.push_back({{"address", address.address}, {"prefixLength", address.prefixLength}});
    }
    Json json = {{"name", vnic->name}, {"ipv6", ipv6}};
    if (vnic->ipv4) {
        json["ipv4"] = {{"address", vnic->ipv4->first}, {"netmask", vnic->ipv4->second}};
    }
    return json;
}

}  // namespace

Json fault(const std::string& call, const std::string& node, const std::string& param) {
    Json rule = {{"call", call}};
    if (!node.empty()) {
        rule["node"] = node;
    }
    if (!param.empty()) {
        rule["param"] = param;
    }
    return rule;
}

Json hostWith(const std::vector<std::optional<Vnic>>& vnics, const Json& faults) {
    Json list = Json::array();
    for (const std::optional<Vnic>& vnic : vnics) {
        list.push_back(vnicJson(vnic));
    }
    return orv::providertest::SimHost::withHost(
        {{"tcpipStacks", {{"defaultTcpipStack", {{"vnics", list}}}}}, {"faults", faults}});
}

std::vector<std::optional<Vnic>> threeVnics() {
    return {
        Vnic{"vif0", {{"10.0.0.10", "255.255.255.0"}}, {{"fe80::1", 64}, {"fd00::10", 48}}},
        Vnic{"vif1", {{"10.0.1.10", "255.255.0.0"}}, {{"fd01::10", 64}}},
        Vnic{"vif2", {{"192.168.5.7", "255.255.255.128"}}, {{"fd02::7", 112}}},
    };
}

std::vector<NamedValue> commonProperties(const std::string& className, const std::string& ifname,
                                         unsigned protocolIFType) {
    return {
        {"SystemCreationClassName", CMPI_string, "OMC_UnitaryComputerSystem"},
        {"SystemName", CMPI_string, orv::providertest::SimHost::kFqdn},
        {"CreationClassName", CMPI_string, className},
        {"Name", CMPI_string, ifname},
        {"ElementName", CMPI_string, ifname},
        {"NameFormat", CMPI_string, "Talmek Interface Name"},
        {"ProtocolIFType", CMPI_uint16, std::to_string(protocolIFType)},
    };
}

std::vector<NamedValue> ipv4Properties(const std::string& className, const std::string& ifname,
                                       const std::string& address, const std::string& netmask) {
    std::vector<NamedValue> properties = commonProperties(className, ifname, 4096);
    properties.push_back({"IPv4Address", CMPI_string, address});
    properties.push_back({"SubnetMask", CMPI_string, netmask});
    return properties;
}

std::vector<NamedValue> ipv6Properties(const std::string& className, const std::string& ifname,
                                       const std::string& address, unsigned prefixLength) {
    std::vector<NamedValue> properties = commonProperties(className, ifname, 4097);
    properties.push_back({"IPv6Address", CMPI_string, address});
    properties.push_back({"PrefixLength", CMPI_uint8, std::to_string(prefixLength)});
    return properties;
}

std::vector<std::pair<std::string, std::string>> endpointsOf(const orv::host::Reply& reply) {
    std::vector<std::pair<std::string, std::string>> endpoints;
    for (const CMPIInstance* instance : reply.instances()) {
        const std::optional<NamedValue> name = orv::providertest::propertyOf(instance, "Name");
        endpoints.emplace_back(orv::providertest::classNameOf(instance), name ? name->text : "<no Name>");
    }
    return endpoints;
}

}  // namespace kernelip
