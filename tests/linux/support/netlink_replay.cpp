#include "netlink_replay.hpp"

#include "capture_file.hpp"

#include <cerrno>

namespace orv::linuxtest {

using orv::linuxhost::NetlinkMessage;

std::string netlinkCaptureFile(const std::string& directory, unsigned command)
{
    return directory + "/msg" + std::to_string(command);
}

NetlinkRecordingChannel::NetlinkRecordingChannel(orv::linuxhost::EthtoolNetlinkChannel& inner,
                                                 std::string directory)
    : inner_(inner), directory_(std::move(directory))
{
}

int NetlinkRecordingChannel::query(std::uint8_t command, const std::string& ifname, NetlinkMessage& answer)
{
    int error = inner_.query(command, ifname, answer);
    writeCapture(netlinkCaptureFile(directory_, command), error, answer.data(), error ? 0 : answer.size());
    return error;
}

NetlinkReplayChannel::NetlinkReplayChannel(std::string directory, int missing)
    : directory_(std::move(directory)), missing_(missing)
{
}

unsigned NetlinkReplayChannel::queries(unsigned command) const
{
    auto it = counts_.find(command);
    return it == counts_.end() ? 0 : it->second;
}

int NetlinkReplayChannel::query(std::uint8_t command, const std::string&, NetlinkMessage& answer)
{
    ++counts_[command];
    int error = 0;
    if (!readCapture(netlinkCaptureFile(directory_, command), error, answer)) return missing_;
    return error;
}

}  // namespace orv::linuxtest
