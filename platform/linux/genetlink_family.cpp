#include "genetlink_family.hpp"

#include <cerrno>
#include <linux/genetlink.h>

namespace orv::linuxhost {

namespace {

int familyIdOf(const nlattr* attribute, void* data)
{
    if (mnl_attr_get_type(attribute) == CTRL_ATTR_FAMILY_ID && mnl_attr_validate(attribute, MNL_TYPE_U16) == 0) {
        *static_cast<int*>(data) = mnl_attr_get_u16(attribute);
    }
    return MNL_CB_OK;
}

}  // namespace

int resolveGenlFamily(NetlinkSocket& socket, const char* name, std::uint16_t& id)
{
    std::vector<char> buffer(MNL_SOCKET_BUFFER_SIZE);
    nlmsghdr* request = mnl_nlmsg_put_header(buffer.data());
    request->nlmsg_type = GENL_ID_CTRL;
    request->nlmsg_flags = NLM_F_REQUEST;
    auto* header = static_cast<genlmsghdr*>(mnl_nlmsg_put_extra_header(request, sizeof(genlmsghdr)));
    header->cmd = CTRL_CMD_GETFAMILY;
    header->version = 1;
    mnl_attr_put_strz(request, CTRL_ATTR_FAMILY_NAME, name);
    std::vector<NetlinkMessage> answers;
    if (int error = socket.transact(request, answers)) return error;
    int found = -1;
    for (const auto& answer : answers) {
        const auto* message = reinterpret_cast<const nlmsghdr*>(answer.data());
        if (message->nlmsg_type != GENL_ID_CTRL) continue;
        mnl_attr_parse(message, sizeof(genlmsghdr), familyIdOf, &found);
    }
    if (found < 0) return EPROTO;
    id = static_cast<std::uint16_t>(found);
    return 0;
}

}  // namespace orv::linuxhost
