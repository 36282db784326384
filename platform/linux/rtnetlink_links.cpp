#include "rtnetlink_links.hpp"

#include "linux_call_error.hpp"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <linux/rtnetlink.h>
#include <net/if.h>

namespace orv::linuxhost {

namespace {

std::string attributeText(const nlattr* attribute)
{
    const char* text = static_cast<const char*>(mnl_attr_get_payload(attribute));
    return std::string(text, strnlen(text, mnl_attr_get_payload_len(attribute)));
}

std::uint32_t attributeU32(const nlattr* attribute)
{
    return mnl_attr_get_payload_len(attribute) >= sizeof(std::uint32_t) ? mnl_attr_get_u32(attribute) : 0;
}

int readAttribute(const nlattr* attribute, void* data)
{
    auto& link = *static_cast<LinkRecord*>(data);
    const std::uint16_t length = mnl_attr_get_payload_len(attribute);
    const auto* payload = static_cast<const std::uint8_t*>(mnl_attr_get_payload(attribute));
    switch (mnl_attr_get_type(attribute)) {
    case IFLA_IFNAME: link.name = attributeText(attribute); break;
    case IFLA_MTU: link.mtu = attributeU32(attribute); break;
    case IFLA_OPERSTATE: if (length >= 1) link.operstate = payload[0]; break;
    case IFLA_CARRIER: if (length >= 1) link.carrier = payload[0] != 0; break;
    case IFLA_ADDRESS: link.address.assign(payload, payload + length); break;
    case IFLA_PARENT_DEV_NAME: link.parentDevice = attributeText(attribute); break;
    case IFLA_PARENT_DEV_BUS_NAME: link.parentBus = attributeText(attribute); break;
    case IFLA_STATS64:
        if (length >= sizeof(rtnl_link_stats64)) {
            rtnl_link_stats64 statistics;
            std::memcpy(&statistics, payload, sizeof statistics);
            link.statistics = statistics;
        }
        break;
    default: break;
    }
    return MNL_CB_OK;
}

}  // namespace

std::optional<LinkRecord> parseLinkRecord(const NetlinkMessage& message)
{
    const auto* header = reinterpret_cast<const nlmsghdr*>(message.data());
    if (message.size() < NLMSG_LENGTH(sizeof(ifinfomsg)) || header->nlmsg_len > message.size()) return std::nullopt;
    if (header->nlmsg_len < NLMSG_LENGTH(sizeof(ifinfomsg)) || header->nlmsg_type != RTM_NEWLINK) return std::nullopt;
    const auto* info = static_cast<const ifinfomsg*>(mnl_nlmsg_get_payload(header));
    LinkRecord link;
    link.index = info->ifi_index;
    link.flags = info->ifi_flags;
    if (mnl_attr_parse(header, sizeof(ifinfomsg), readAttribute, &link) < 0 || link.name.empty()) return std::nullopt;
    return link;
}

std::string addressText(const std::vector<std::uint8_t>& address)
{
    std::string text;
    for (std::size_t i = 0; i < address.size(); ++i) {
        char part[4];
        std::snprintf(part, sizeof part, i ? ":%02x" : "%02x", address[i]);
        text += part;
    }
    return text;
}

nlmsghdr* buildLinkRequest(char* buffer, const std::string& ifname)
{
    nlmsghdr* request = mnl_nlmsg_put_header(buffer);
    request->nlmsg_type = RTM_GETLINK;
    request->nlmsg_flags = NLM_F_REQUEST | (ifname.empty() ? NLM_F_DUMP : 0);
    auto* info = static_cast<ifinfomsg*>(mnl_nlmsg_put_extra_header(request, sizeof(ifinfomsg)));
    info->ifi_family = AF_UNSPEC;
    if (!ifname.empty()) mnl_attr_put_strz(request, IFLA_IFNAME, ifname.c_str());
    return request;
}

RouteLinks::RouteLinks()
{
    try {
        socket_ = std::make_unique<NetlinkSocket>(NETLINK_ROUTE);
    } catch (const LinuxCallError&) {
        // tried again at the first request
    }
}

std::vector<NetlinkMessage> RouteLinks::request(const std::string& ifname)
{
    std::vector<char> buffer(MNL_SOCKET_BUFFER_SIZE);
    std::vector<NetlinkMessage> answers;
    std::lock_guard<std::mutex> lock(mutex_);
    if (!socket_) socket_ = std::make_unique<NetlinkSocket>(NETLINK_ROUTE);
    nlmsghdr* message = buildLinkRequest(buffer.data(), ifname);
    const int error = ifname.empty() ? socket_->transact(message, answers) : socket_->ask(message, answers);
    if (error) {
        throw LinuxCallError("RTM_GETLINK", ifname.empty() ? "every link" : ifname, error);
    }
    return answers;
}

std::vector<LinkRecord> RouteLinks::all()
{
    std::vector<LinkRecord> links;
    for (const auto& message : request({})) {
        if (auto link = parseLinkRecord(message)) links.push_back(std::move(*link));
    }
    std::sort(links.begin(), links.end(), [](const LinkRecord& a, const LinkRecord& b) { return a.index < b.index; });
    return links;
}

LinkRecord RouteLinks::named(const std::string& ifname)
{
    if (ifname.empty() || ifname.size() >= IFNAMSIZ) throw LinuxCallError("RTM_GETLINK", ifname, ENODEV);
    for (const auto& message : request(ifname)) {
        if (auto link = parseLinkRecord(message)) return *link;
    }
    throw LinuxCallError("RTM_GETLINK", ifname, ENODATA);
}

}  // namespace orv::linuxhost
