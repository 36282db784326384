// Captured ethtool netlink answers: a channel that records the kernel's reply
// messages into a directory, and one that replays such a directory. One file
// per message type, named "msg<ETHTOOL_MSG_* number>": either "errno <number>"
// or the reply message (netlink header included) as hexadecimal bytes.
#pragma once

#include "ethtool_netlink_channel.hpp"

#include <map>
#include <string>

namespace orv::linuxtest {

std::string netlinkCaptureFile(const std::string& directory, unsigned command);

class NetlinkRecordingChannel final : public orv::linuxhost::EthtoolNetlinkChannel {
public:
    NetlinkRecordingChannel(orv::linuxhost::EthtoolNetlinkChannel& inner, std::string directory);
    int query(std::uint8_t command, const std::string& ifname, orv::linuxhost::NetlinkMessage& answer) override;

private:
    orv::linuxhost::EthtoolNetlinkChannel& inner_;
    std::string directory_;
};

class NetlinkReplayChannel final : public orv::linuxhost::EthtoolNetlinkChannel {
public:
    // `missing` answers a message type without a capture file: EOPNOTSUPP (a
    // kernel that does not know it) unless a test says otherwise.
    explicit NetlinkReplayChannel(std::string directory, int missing = EOPNOTSUPP);
    int query(std::uint8_t command, const std::string& ifname, orv::linuxhost::NetlinkMessage& answer) override;
    unsigned queries(unsigned command) const;

private:
    std::string directory_;
    int missing_;
    std::map<unsigned, unsigned> counts_;
};

// Answers every query with one errno: ENOENT stands for a kernel without the
// ethtool family.
class RefusingNetlinkChannel final : public orv::linuxhost::EthtoolNetlinkChannel {
public:
    explicit RefusingNetlinkChannel(int error) : error_(error) {}
    int query(std::uint8_t, const std::string&, orv::linuxhost::NetlinkMessage&) override
    {
        ++queries_;
        return error_;
    }
    unsigned queries() const { return queries_; }

private:
    int error_;
    unsigned queries_ = 0;
};

}  // namespace orv::linuxtest
