// The id of a generic-netlink family, asked of the controller by name
// (CTRL_CMD_GETFAMILY). A family the running kernel does not have answers ENOENT.
#pragma once

#include "netlink_socket.hpp"

#include <cstdint>

namespace orv::linuxhost {

// 0 and the id in `id`, or the errno of the refusal.
int resolveGenlFamily(NetlinkSocket& socket, const char* name, std::uint16_t& id);

}  // namespace orv::linuxhost
