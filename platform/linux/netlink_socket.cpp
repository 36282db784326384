#include "netlink_socket.hpp"

#include "linux_call_error.hpp"

#include <cerrno>
#include <ctime>

namespace orv::linuxhost {

namespace {

int keepMessage(const nlmsghdr* message, void* data)
{
    auto* answers = static_cast<std::vector<NetlinkMessage>*>(data);
    const auto* bytes = reinterpret_cast<const std::uint8_t*>(message);
    answers->emplace_back(bytes, bytes + message->nlmsg_len);
    return MNL_CB_OK;
}

}  // namespace

NetlinkSocket::NetlinkSocket(int bus)
    : socket_(mnl_socket_open2(bus, SOCK_CLOEXEC)), portId_(0), sequence_(static_cast<std::uint32_t>(time(nullptr)))
{
    if (!socket_) throw LinuxCallError("socket", "netlink", errno);
    if (mnl_socket_bind(socket_, 0, MNL_SOCKET_AUTOPID) < 0) {
        int error = errno;
        mnl_socket_close(socket_);
        throw LinuxCallError("bind", "netlink", error);
    }
    portId_ = mnl_socket_get_portid(socket_);
}

NetlinkSocket::~NetlinkSocket() { mnl_socket_close(socket_); }

int NetlinkSocket::transact(nlmsghdr* request, std::vector<NetlinkMessage>& answers)
{
    return exchange(request, answers, true);
}

int NetlinkSocket::ask(nlmsghdr* request, std::vector<NetlinkMessage>& answers)
{
    return exchange(request, answers, false);
}

int NetlinkSocket::exchange(nlmsghdr* request, std::vector<NetlinkMessage>& answers, bool untilAcknowledged)
{
    if (untilAcknowledged) request->nlmsg_flags |= NLM_F_ACK;
    request->nlmsg_seq = nextSequence();
    if (mnl_socket_sendto(socket_, request, request->nlmsg_len) < 0) return errno;
    std::vector<char> buffer(32768);
    for (;;) {
        ssize_t received = mnl_socket_recvfrom(socket_, buffer.data(), buffer.size());
        if (received < 0) return errno;
        errno = 0;
        int status = mnl_cb_run(buffer.data(), static_cast<std::size_t>(received), request->nlmsg_seq, portId_,
                                keepMessage, &answers);
        if (status < 0) return errno ? errno : EPROTO;
        if (status == MNL_CB_STOP || (!untilAcknowledged && !answers.empty())) return 0;
    }
}

}  // namespace orv::linuxhost
