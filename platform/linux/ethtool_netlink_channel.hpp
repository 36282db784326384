// The path of an ethtool netlink request ("ethtool" generic-netlink family) to
// the kernel. The readers talk to this interface so that tests can replay
// answers captured from real drivers or built by hand.
#pragma once

#include "netlink_socket.hpp"

#include <chrono>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>

namespace orv::linuxhost {

class EthtoolNetlinkChannel {
public:
    virtual ~EthtoolNetlinkChannel() = default;
    // Sends the ETHTOOL_MSG_*_GET `command` for the named interface, bitsets
    // asked in compact form, and copies the reply message into `answer`.
    // Returns 0 or the errno of the refusal: ENOENT when the kernel has no
    // ethtool family, EOPNOTSUPP when it does not know the message type or the
    // driver does not implement it.
    virtual int query(std::uint8_t command, const std::string& ifname, NetlinkMessage& answer) = 0;
};

// One generic-netlink socket of the calling thread's network namespace, opened
// and the family resolved at the first query; queries are serialised. When the
// socket cannot be opened or the family is unknown, queries answer that error
// until `retryAfter` has passed, then the next query tries again.
class GenlEthtoolChannel final : public EthtoolNetlinkChannel {
public:
    // `family` is the generic-netlink family name; only tests name another one.
    explicit GenlEthtoolChannel(std::string family = "ethtool",
                                std::chrono::milliseconds retryAfter = std::chrono::seconds(10));

    int query(std::uint8_t command, const std::string& ifname, NetlinkMessage& answer) override;

private:
    int open();

    std::string family_;
    std::mutex mutex_;
    std::unique_ptr<NetlinkSocket> socket_;
    std::uint16_t familyId_ = 0;
    std::chrono::milliseconds retryAfter_;
    int openError_ = 0;  // of the last attempt that failed
    std::chrono::steady_clock::time_point failedAt_;
};

}  // namespace orv::linuxhost
