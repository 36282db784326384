#include "genl_reply.hpp"

#include <libmnl/libmnl.h>
#include <linux/ethtool_netlink.h>
#include <linux/genetlink.h>

namespace orv::linuxtest {

GenlReply::GenlReply(std::uint8_t reply) : buffer_(MNL_SOCKET_BUFFER_SIZE), header_(mnl_nlmsg_put_header(buffer_.data()))
{
    header_->nlmsg_type = 0x15;  // a family id as the controller hands them out
    auto* genl = static_cast<genlmsghdr*>(mnl_nlmsg_put_extra_header(header_, sizeof(genlmsghdr)));
    genl->cmd = reply;
    genl->version = ETHTOOL_GENL_VERSION;
    nlattr* nest = mnl_attr_nest_start(header_, 1);  // the reply header: device index and name
    mnl_attr_put_u32(header_, ETHTOOL_A_HEADER_DEV_INDEX, 2);
    mnl_attr_put_strz(header_, ETHTOOL_A_HEADER_DEV_NAME, "eth0");
    mnl_attr_nest_end(header_, nest);
}

GenlReply& GenlReply::u8(std::uint16_t type, std::uint8_t value)
{
    mnl_attr_put_u8(header_, type, value);
    return *this;
}

GenlReply& GenlReply::u32(std::uint16_t type, std::uint32_t value)
{
    mnl_attr_put_u32(header_, type, value);
    return *this;
}

GenlReply& GenlReply::binary(std::uint16_t type, const void* data, std::size_t size)
{
    mnl_attr_put(header_, type, size, data);
    return *this;
}

GenlReply& GenlReply::bitList(std::uint16_t type, std::uint32_t size, const std::vector<ListedBit>& bits,
                              bool withMask)
{
    nlattr* nest = mnl_attr_nest_start(header_, type);
    if (!withMask) mnl_attr_put(header_, ETHTOOL_A_BITSET_NOMASK, 0, nullptr);
    mnl_attr_put_u32(header_, ETHTOOL_A_BITSET_SIZE, size);
    nlattr* list = mnl_attr_nest_start(header_, ETHTOOL_A_BITSET_BITS);
    for (const auto& bit : bits) {
        nlattr* one = mnl_attr_nest_start(header_, ETHTOOL_A_BITSET_BITS_BIT);
        mnl_attr_put_u32(header_, ETHTOOL_A_BITSET_BIT_INDEX, bit.index);
        mnl_attr_put_strz(header_, ETHTOOL_A_BITSET_BIT_NAME, bit.name.c_str());
        if (bit.value) mnl_attr_put(header_, ETHTOOL_A_BITSET_BIT_VALUE, 0, nullptr);
        mnl_attr_nest_end(header_, one);
    }
    mnl_attr_nest_end(header_, list);
    mnl_attr_nest_end(header_, nest);
    return *this;
}

GenlReply& GenlReply::compact(std::uint16_t type, std::uint32_t size, const std::vector<std::uint32_t>& value,
                              const std::vector<std::uint32_t>& mask, bool withMask)
{
    nlattr* nest = mnl_attr_nest_start(header_, type);
    if (!withMask) mnl_attr_put(header_, ETHTOOL_A_BITSET_NOMASK, 0, nullptr);
    mnl_attr_put_u32(header_, ETHTOOL_A_BITSET_SIZE, size);
    mnl_attr_put(header_, ETHTOOL_A_BITSET_VALUE, value.size() * 4, value.data());
    if (!mask.empty()) mnl_attr_put(header_, ETHTOOL_A_BITSET_MASK, mask.size() * 4, mask.data());
    mnl_attr_nest_end(header_, nest);
    return *this;
}

orv::linuxhost::NetlinkMessage GenlReply::message() const
{
    const auto* bytes = reinterpret_cast<const std::uint8_t*>(buffer_.data());
    return orv::linuxhost::NetlinkMessage(bytes, bytes + header_->nlmsg_len);
}

}  // namespace orv::linuxtest
