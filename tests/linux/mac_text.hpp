// A MAC address the way ip and ethtool print it, for comparing with their output.
#pragma once

#include "nodemgr/network/MacAddress.h"

#include <cstdio>
#include <string>

namespace orv::linuxtest {

inline std::string macText(const NodeMgr::Network::MacAddress& mac)
{
    unsigned char bytes[6];
    mac.GetBinaryAddress(bytes);
    char text[18];
    std::snprintf(text, sizeof text, "%02x:%02x:%02x:%02x:%02x:%02x", bytes[0], bytes[1], bytes[2], bytes[3], bytes[4],
                  bytes[5]);
    return text;
}

}  // namespace orv::linuxtest
