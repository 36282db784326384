// The path of an ethtool ioctl request to the kernel. The readers talk to this
// interface so that tests can replay answers captured from real drivers.
#pragma once

#include <cstddef>
#include <string>

namespace orv::linuxhost {

class EthtoolChannel {
public:
    virtual ~EthtoolChannel() = default;
    // Sends the command buffer (its first word is the ETHTOOL_* command) for the
    // named interface; the kernel's answer is written back into the buffer.
    // Returns 0 or the errno of the refusal.
    virtual int exchange(const std::string& ifname, void* buffer, std::size_t size) = 0;
};

// SIOCETHTOOL on a datagram socket of the calling thread's network namespace.
class IoctlEthtoolChannel final : public EthtoolChannel {
public:
    IoctlEthtoolChannel();
    ~IoctlEthtoolChannel() override;
    IoctlEthtoolChannel(const IoctlEthtoolChannel&) = delete;
    IoctlEthtoolChannel& operator=(const IoctlEthtoolChannel&) = delete;

    int exchange(const std::string& ifname, void* buffer, std::size_t size) override;

private:
    int socket_;
};

}  // namespace orv::linuxhost
