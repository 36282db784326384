// Captured ethtool answers: a channel that records what the kernel answered
// into a directory, and one that replays such a directory. One file per
// exchange, named "<command in hex>.<n>" for the n-th exchange of that command
// (0-based): either "errno <number>" or the answer buffer as hexadecimal bytes.
#pragma once

#include "ethtool_channel.hpp"

#include <map>
#include <string>

namespace orv::linuxtest {

class RecordingChannel final : public orv::linuxhost::EthtoolChannel {
public:
    RecordingChannel(orv::linuxhost::EthtoolChannel& inner, std::string directory);
    int exchange(const std::string& ifname, void* buffer, std::size_t size) override;

private:
    orv::linuxhost::EthtoolChannel& inner_;
    std::string directory_;
    std::map<unsigned, unsigned> counts_;
};

class ReplayChannel final : public orv::linuxhost::EthtoolChannel {
public:
    explicit ReplayChannel(std::string directory);
    // Answers EOPNOTSUPP for a command that has no capture file.
    int exchange(const std::string& ifname, void* buffer, std::size_t size) override;
    unsigned exchanges(unsigned command) const;

private:
    std::string directory_;
    std::map<unsigned, unsigned> counts_;
};

}  // namespace orv::linuxtest
