#include "ethtool_replay.hpp"

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iomanip>
#include <sstream>
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
    std::ofstream out(fileFor(directory_, command, counts_[command]++));
    if (error) {
        out << "errno " << error << "\n";
        return error;
    }
    const auto* bytes = static_cast<const std::uint8_t*>(buffer);
    for (std::size_t i = 0; i < size; ++i) {
        out << std::hex << std::setw(2) << std::setfill('0') << unsigned(bytes[i]) << ((i % 16 == 15) ? "\n" : " ");
    }
    out << "\n";
    return 0;
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
    std::ifstream in(fileFor(directory_, command, counts_[command]++));
    if (!in) return EOPNOTSUPP;
    std::string first;
    in >> first;
    if (first == "errno") {
        int error = 0;
        in >> error;
        return error;
    }
    std::vector<std::uint8_t> bytes;
    for (std::string word = first; !word.empty(); word.clear(), in >> word) {
        bytes.push_back(static_cast<std::uint8_t>(std::stoul(word, nullptr, 16)));
    }
    if (bytes.size() > size) throw std::runtime_error("captured answer larger than the request buffer");
    std::memcpy(buffer, bytes.data(), bytes.size());
    return 0;
}

}  // namespace orv::linuxtest
