// Captures what the kernel answers to the substitute's ethtool netlink queries
// for one interface, as replay files for the unit tests:
// capture_ethtool_netlink <ifname> <dir>.
#include "ethtool_netlink_channel.hpp"
#include "support/netlink_replay.hpp"

#include <cstring>
#include <iostream>
#include <linux/ethtool_netlink.h>

using namespace orv::linuxhost;

int main(int argc, char** argv)
{
    if (argc != 3) {
        std::cerr << "usage: capture_ethtool_netlink <ifname> <directory>\n";
        return 2;
    }
    GenlEthtoolChannel kernel;
    orv::linuxtest::NetlinkRecordingChannel recorder(kernel, argv[2]);
    for (std::uint8_t command : {ETHTOOL_MSG_LINKINFO_GET, ETHTOOL_MSG_LINKMODES_GET, ETHTOOL_MSG_WOL_GET,
                                 ETHTOOL_MSG_RINGS_GET, ETHTOOL_MSG_PAUSE_GET, ETHTOOL_MSG_COALESCE_GET}) {
        NetlinkMessage answer;
        if (int error = recorder.query(command, argv[1], answer)) {
            std::cerr << "message " << unsigned(command) << ": " << std::strerror(error) << "\n";
        }
    }
    return 0;
}
