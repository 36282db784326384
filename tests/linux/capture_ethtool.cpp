// Captures what the kernel answers to the substitute's ethtool queries for one
// interface, as replay files for the unit tests: capture_ethtool <ifname> <dir>.
#include "ethtool_reader.hpp"
#include "rtnetlink_links.hpp"
#include "linux_call_error.hpp"
#include "support/ethtool_replay.hpp"

#include <cstdio>
#include <fstream>
#include <iostream>
#include <linux/netlink.h>

using namespace orv::linuxhost;

namespace {

template <typename Query>
void attempt(const char* what, Query&& query)
{
    try {
        query();
    } catch (const LinuxCallError& error) {
        std::cerr << what << ": " << error.what() << "\n";
    }
}

// The RTM_NEWLINK answer for the interface, as hexadecimal bytes.
void captureLinkAnswer(const std::string& ifname, const std::string& directory)
{
    NetlinkSocket route(NETLINK_ROUTE);
    std::vector<char> buffer(MNL_SOCKET_BUFFER_SIZE);
    std::vector<NetlinkMessage> answers;
    if (route.transact(buildLinkRequest(buffer.data(), ifname), answers) != 0 || answers.empty()) return;
    std::ofstream out(directory + "/rtm_newlink.hex");
    for (std::size_t i = 0; i < answers.front().size(); ++i) {
        char hex[4];
        std::snprintf(hex, sizeof hex, "%02x", answers.front()[i]);
        out << hex << ((i % 16 == 15) ? "\n" : " ");
    }
    out << "\n";
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc != 3) {
        std::cerr << "usage: capture_ethtool <ifname> <directory>\n";
        return 2;
    }
    IoctlEthtoolChannel kernel;
    orv::linuxtest::RecordingChannel recorder(kernel, argv[2]);
    EthtoolReader reader(recorder, argv[1]);
    attempt("link settings", [&] { reader.linkSettings(); });
    attempt("driver info", [&] { reader.driverInfo(); });
    attempt("wake-on-lan", [&] { reader.wakeOnLan(); });
    attempt("coalesce", [&] { reader.coalesce(); });
    attempt("pause", [&] { reader.pause(); });
    attempt("rings", [&] { reader.rings(); });
    attempt("message level", [&] { reader.messageLevel(); });
    attempt("permanent address", [&] { reader.permanentAddress(); });
    attempt("driver statistics", [&] { reader.driverStatistics(); });
    captureLinkAnswer(argv[1], argv[2]);
    return 0;
}
