#include "link_statistics.hpp"

#include "linux_call_error.hpp"

#include <cerrno>
#include <cstring>
#include <linux/rtnetlink.h>
#include <net/if.h>

namespace orv::linuxhost {

namespace {

int findStatistics(const nlattr* attribute, void* data)
{
    if (mnl_attr_get_type(attribute) != IFLA_STATS64) return MNL_CB_OK;
    if (mnl_attr_get_payload_len(attribute) < sizeof(rtnl_link_stats64)) return MNL_CB_OK;
    auto* found = static_cast<std::optional<rtnl_link_stats64>*>(data);
    rtnl_link_stats64 statistics;
    std::memcpy(&statistics, mnl_attr_get_payload(attribute), sizeof statistics);
    *found = statistics;
    return MNL_CB_OK;
}

}  // namespace

nlmsghdr* buildLinkRequest(char* buffer, const std::string& ifname)
{
    nlmsghdr* request = mnl_nlmsg_put_header(buffer);
    request->nlmsg_type = RTM_GETLINK;
    request->nlmsg_flags = NLM_F_REQUEST;
    auto* info = static_cast<ifinfomsg*>(mnl_nlmsg_put_extra_header(request, sizeof(ifinfomsg)));
    info->ifi_family = AF_UNSPEC;
    mnl_attr_put_strz(request, IFLA_IFNAME, ifname.c_str());
    return request;
}

std::optional<rtnl_link_stats64> parseLinkStatistics(const NetlinkMessage& answer)
{
    const auto* message = reinterpret_cast<const nlmsghdr*>(answer.data());
    if (answer.size() < sizeof(nlmsghdr) || message->nlmsg_len > answer.size()) return std::nullopt;
    if (message->nlmsg_type != RTM_NEWLINK) return std::nullopt;
    std::optional<rtnl_link_stats64> found;
    mnl_attr_parse(message, sizeof(ifinfomsg), findStatistics, &found);
    return found;
}

rtnl_link_stats64 readLinkStatistics(NetlinkSocket& route, const std::string& ifname)
{
    if (ifname.empty() || ifname.size() >= IFNAMSIZ) throw LinuxCallError("RTM_GETLINK", ifname, ENODEV);
    std::vector<char> buffer(MNL_SOCKET_BUFFER_SIZE);
    std::vector<NetlinkMessage> answers;
    if (int error = route.transact(buildLinkRequest(buffer.data(), ifname), answers)) {
        throw LinuxCallError("RTM_GETLINK", ifname, error);
    }
    for (const auto& answer : answers) {
        if (auto statistics = parseLinkStatistics(answer)) return *statistics;
    }
    throw LinuxCallError("RTM_GETLINK", ifname, ENODATA);
}

rtnl_link_stats64 RouteStatistics::read(const std::string& ifname)
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (!socket_) socket_ = std::make_unique<NetlinkSocket>(NETLINK_ROUTE);
    return readLinkStatistics(*socket_, ifname);
}

}  // namespace orv::linuxhost
