// Which links are NICs: a link is a NIC when it sits on a bus device. Kernels
// since 5.16 name that device in the link's rtnetlink answer; on older ones it
// is taken from the driver info the driver reports (ETHTOOL_GDRVINFO bus_info).
#pragma once

#include "ethtool_channel.hpp"
#include "rtnetlink_links.hpp"

#include <optional>
#include <string>
#include <string_view>

namespace orv::linuxhost {

struct BusDevice {
    std::string device;  // "0000:00:03.0", "usb-0000:00:14.0-1"
    std::string bus;     // "pci", "usb"; empty when the address form names none
};

// The bus device a driver info bus_info names: nothing when it is empty or the
// placeholder of a virtual driver ("N/A" of a bridge, "tun" and "tap"). A PCI
// address is on "pci", "usb-..." on "usb", any other form on an unnamed bus.
std::optional<BusDevice> busDeviceFromDriverInfo(std::string_view busInfo);

// True when the link is a NIC. A kernel that names parent devices
// (`kernelNamesParents`) decides alone: the link names its bus device. On one
// that does not, every link that is not a loopback is asked for its driver
// info through `channel` (so all links are judged alike, whatever a backported
// kernel may send), and the bus device found there is written into the link.
// A driver that does not answer the query or a link that vanished is no NIC;
// any other refusal throws LinuxCallError.
bool recognizeNic(LinkRecord& link, EthtoolChannel& channel, bool kernelNamesParents);

}  // namespace orv::linuxhost
