#include "ethtool_netlink_channel.hpp"

#include "genetlink_family.hpp"
#include "linux_call_error.hpp"

#include <cerrno>
#include <linux/ethtool_netlink.h>
#include <linux/genetlink.h>
#include <net/if.h>
#include <vector>

namespace orv::linuxhost {

namespace {

// Every ETHTOOL_MSG_*_GET request names its device in attribute 1, the header nest.
constexpr std::uint16_t kRequestHeader = ETHTOOL_A_LINKINFO_HEADER;

nlmsghdr* buildQuery(char* buffer, std::uint16_t family, std::uint8_t command, const std::string& ifname)
{
    nlmsghdr* request = mnl_nlmsg_put_header(buffer);
    request->nlmsg_type = family;
    request->nlmsg_flags = NLM_F_REQUEST;
    auto* header = static_cast<genlmsghdr*>(mnl_nlmsg_put_extra_header(request, sizeof(genlmsghdr)));
    header->cmd = command;
    header->version = ETHTOOL_GENL_VERSION;
    nlattr* nest = mnl_attr_nest_start(request, kRequestHeader);
    mnl_attr_put_strz(request, ETHTOOL_A_HEADER_DEV_NAME, ifname.c_str());
    mnl_attr_put_u32(request, ETHTOOL_A_HEADER_FLAGS, ETHTOOL_FLAG_COMPACT_BITSETS);
    mnl_attr_nest_end(request, nest);
    return request;
}

}  // namespace

GenlEthtoolChannel::GenlEthtoolChannel(std::string family, std::chrono::milliseconds retryAfter)
    : family_(std::move(family)), retryAfter_(retryAfter)
{
}

int GenlEthtoolChannel::open()
{
    if (socket_) return 0;
    const auto now = std::chrono::steady_clock::now();
    if (openError_ != 0 && now - failedAt_ < retryAfter_) return openError_;
    try {
        auto socket = std::make_unique<NetlinkSocket>(NETLINK_GENERIC);
        openError_ = resolveGenlFamily(*socket, family_.c_str(), familyId_);
        if (openError_ == 0) socket_ = std::move(socket);
    } catch (const LinuxCallError& error) {
        openError_ = error.error();
    }
    failedAt_ = now;
    return openError_;
}

int GenlEthtoolChannel::query(std::uint8_t command, const std::string& ifname, NetlinkMessage& answer)
{
    if (ifname.empty() || ifname.size() >= IFNAMSIZ) return ENODEV;
    std::lock_guard<std::mutex> lock(mutex_);
    if (int error = open()) return error;
    std::vector<char> buffer(MNL_SOCKET_BUFFER_SIZE);
    std::vector<NetlinkMessage> answers;
    if (int error = socket_->transact(buildQuery(buffer.data(), familyId_, command, ifname), answers)) return error;
    for (auto& message : answers) {
        if (reinterpret_cast<const nlmsghdr*>(message.data())->nlmsg_type == familyId_) {
            answer = std::move(message);
            return 0;
        }
    }
    return EPROTO;
}

}  // namespace orv::linuxhost
