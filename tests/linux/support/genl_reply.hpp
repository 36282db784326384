// Ethtool netlink reply messages built by hand, attribute by attribute, for
// the forms and values no NIC of this machine answers (bit lists, link modes).
#pragma once

#include "netlink_socket.hpp"

#include <cstdint>
#include <string>
#include <vector>

namespace orv::linuxtest {

struct ListedBit {
    std::uint32_t index;
    std::string name;
    bool value;
};

class GenlReply {
public:
    explicit GenlReply(std::uint8_t reply);
    GenlReply& u8(std::uint16_t type, std::uint8_t value);
    GenlReply& u32(std::uint16_t type, std::uint32_t value);
    GenlReply& binary(std::uint16_t type, const void* data, std::size_t size);
    // A bitset in bit-list form; `withMask` false adds ETHTOOL_A_BITSET_NOMASK.
    GenlReply& bitList(std::uint16_t type, std::uint32_t size, const std::vector<ListedBit>& bits, bool withMask);
    // A bitset in compact form: value words and, when not empty, mask words;
    // `withMask` false adds ETHTOOL_A_BITSET_NOMASK.
    GenlReply& compact(std::uint16_t type, std::uint32_t size, const std::vector<std::uint32_t>& value,
                       const std::vector<std::uint32_t>& mask, bool withMask);
    orv::linuxhost::NetlinkMessage message() const;

private:
    std::vector<char> buffer_;
    nlmsghdr* header_;
};

}  // namespace orv::linuxtest
