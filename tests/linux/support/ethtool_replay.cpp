#include "ethtool_replay.hpp"

#include "capture_file.hpp"

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <vector>

namespace orv::linuxtest {

namespace {

unsigned commandOf(const void* buffer)
{
    std::uint32_t command = 0;
    std::memcpy(&command, buffer, sizeof command);
    return command;
}

std::string fileFor(const std::string& directory, unsigned command, unsigned n)
{
    char name[32];
    std::snprintf(name, sizeof name, "/%02x.%u", command, n);
    return directory + name;
}

}  // namespace

RecordingChannel::RecordingChannel(orv::linuxhost::EthtoolChannel& inner, std::string directory)
    : inner_(inner), directory_(std::move(directory))
{
}

int RecordingChannel::exchange(const std::string& ifname, void* buffer, std::size_t size)
{
    const unsigned command = commandOf(buffer);
    int error = inner_.exchange(ifname, buffer, size);
    writeCapture(fileFor(directory_, command, counts_[command]++), error, static_cast<const std::uint8_t*>(buffer),
                 size);
    return error;
}

ReplayChannel::ReplayChannel(std::string directory) : directory_(std::move(directory)) {}

unsigned ReplayChannel::exchanges(unsigned command) const
{
    auto it = counts_.find(command);
    return it == counts_.end() ? 0 : it->second;
}

int ReplayChannel::exchange(const std::string&, void* buffer, std::size_t size)
{
    const unsigned command = commandOf(buffer);
    int error = 0;
    std::vector<std::uint8_t> bytes;
    if (!readCapture(fileFor(directory_, command, counts_[command]++), error, bytes)) return EOPNOTSUPP;
    if (error) return error;
    if (bytes.size() > size) throw std::runtime_error("captured answer larger than the request buffer");
    std::memcpy(buffer, bytes.data(), bytes.size());
    return 0;
}

}  // namespace orv::linuxtest
