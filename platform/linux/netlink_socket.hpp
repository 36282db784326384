// A netlink request/answer exchange over libmnl: one request, every answer
// message copied out, the kernel's acknowledgement or error turned into errno.
#pragma once

#include <cstdint>
#include <libmnl/libmnl.h>
#include <vector>

namespace orv::linuxhost {

using NetlinkMessage = std::vector<std::uint8_t>;

class NetlinkSocket {
public:
    explicit NetlinkSocket(int bus);  // NETLINK_ROUTE, NETLINK_GENERIC
    ~NetlinkSocket();
    NetlinkSocket(const NetlinkSocket&) = delete;
    NetlinkSocket& operator=(const NetlinkSocket&) = delete;

    // Sends the request (an acknowledgement is asked for) and collects every answer
    // message until the acknowledgement or the end of a dump. Returns 0 or errno.
    int transact(nlmsghdr* request, std::vector<NetlinkMessage>& answers);
    // A request that the kernel answers with one message (a get that is no
    // dump): no acknowledgement is asked for, the first answer ends it.
    int ask(nlmsghdr* request, std::vector<NetlinkMessage>& answers);
    std::uint32_t nextSequence() { return ++sequence_; }

private:
    int exchange(nlmsghdr* request, std::vector<NetlinkMessage>& answers, bool untilAcknowledged);

    mnl_socket* socket_;
    std::uint32_t portId_;
    std::uint32_t sequence_;
};

}  // namespace orv::linuxhost
