#include "bus_device.hpp"

#include "ethtool_reader.hpp"
#include "linux_call_error.hpp"
#include "pci_address.hpp"

#include <array>
#include <cstring>
#include <linux/if.h>

namespace orv::linuxhost {

namespace {

bool virtualPlaceholder(std::string_view busInfo)
{
    static constexpr std::array<std::string_view, 3> placeholders{"N/A", "tun", "tap"};
    for (auto placeholder : placeholders) {
        if (busInfo == placeholder) return true;
    }
    return false;
}

std::string busOf(std::string_view busInfo)
{
    if (parsePciAddress(busInfo)) return "pci";
    if (busInfo.substr(0, 4) == "usb-") return "usb";
    return {};
}

// The driver info's bus device; nothing when the driver does not answer or the link is gone.
std::optional<BusDevice> askDriver(const std::string& name, EthtoolChannel& channel)
{
    try {
        const ethtool_drvinfo info = EthtoolReader(channel, name).driverInfo();
        return busDeviceFromDriverInfo(std::string_view(info.bus_info, strnlen(info.bus_info, sizeof info.bus_info)));
    } catch (const LinuxCallError& error) {
        if (error.unsupported() || error.vanished()) return std::nullopt;
        throw;
    }
}

}  // namespace

std::optional<BusDevice> busDeviceFromDriverInfo(std::string_view busInfo)
{
    if (busInfo.empty() || virtualPlaceholder(busInfo)) return std::nullopt;
    return BusDevice{std::string(busInfo), busOf(busInfo)};
}

bool recognizeNic(LinkRecord& link, EthtoolChannel& channel, bool kernelNamesParents)
{
    if (kernelNamesParents) return link.onBus();
    link.parentDevice.clear();
    link.parentBus.clear();
    if (link.flags & IFF_LOOPBACK) return false;
    auto device = askDriver(link.name, channel);
    if (!device) return false;
    link.parentDevice = std::move(device->device);
    link.parentBus = std::move(device->bus);
    return true;
}

}  // namespace orv::linuxhost
