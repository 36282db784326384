// The "tcpipStacks" section: each stack's virtual NICs and their addresses.
#include <arpa/inet.h>

#include "ListReader.h"
#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

uint32_t readDottedQuad(const JsonNode& node)
{
    const std::string text = node.text(15);
    in_addr address{};
    if (inet_pton(AF_INET, text.c_str(), &address) != 1) {
        node.fail("expected a dotted IPv4 address, got \"" + text + "\"");
    }
    return address.s_addr;
}

Ipv4Model readIpv4(const JsonNode& node)
{
    JsonObject object = node.object();
    Ipv4Model ipv4;
    ipv4.address = readDottedQuad(object.required("address"));
    ipv4.netmask = readDottedQuad(object.required("netmask"));
    object.finish();
    return ipv4;
}

Ipv6Model readIpv6(const JsonNode& node)
{
    JsonObject object = node.object();
    Ipv6Model ipv6;
    ipv6.address = object.required("address").text(sizeof(TcpipKsi_VnicIPv6AddrSummary::address), true);
    ipv6.prefixLength = static_cast<uint32_t>(object.required("prefixLength").unsignedInteger(UINT32_MAX));
    object.finish();
    return ipv6;
}

VnicModel readVnic(const JsonNode& node)
{
    VnicModel vnic;
    if (node.isNull()) {
        vnic.emptySlot = true;
        return vnic;
    }
    JsonObject object = node.object();
    vnic.name = object.required("name").text(SIZE_MAX, true);
    if (std::optional<JsonNode> ipv4 = object.optionalNonNull("ipv4")) {
        vnic.ipv4 = readIpv4(*ipv4);
    }
    vnic.ipv6 = readInstanceList<Ipv6Model>(object, "ipv6", readIpv6);
    object.finish();
    return vnic;
}

StackModel readStack(const JsonNode& node)
{
    JsonObject object = node.object();
    StackModel stack;
    stack.vnics = readInstanceList<VnicModel>(object, "vnics", readVnic);
    object.finish();
    return stack;
}

} // namespace

std::map<std::string, StackModel> readTcpipStacks(const JsonNode& node)
{
    JsonObject object = node.object();
    std::map<std::string, StackModel> stacks;
    for (const std::string& name : object.keys()) {
        stacks[name] = readStack(object.required(name.c_str()));
    }
    object.finish();
    return stacks;
}

} // namespace orv::platform::sim
