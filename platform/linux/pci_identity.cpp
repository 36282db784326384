#include "pci_identity.hpp"

#include "text_files.hpp"

namespace orv::linuxhost {

std::optional<PciDeviceInfo> readPciIdentity(const std::string& sysRoot, const std::string& busInfo)
{
    auto address = parsePciAddress(busInfo);
    if (!address) return std::nullopt;
    const std::string dir = sysRoot + "/bus/pci/devices/" + busInfo + "/";
    auto vendor = readAttributeNumber(dir + "vendor");
    if (!vendor) return std::nullopt;
    auto device = readAttributeNumber(dir + "device");
    if (!device) return std::nullopt;
    PciDeviceInfo info;
    info.address = *address;
    info.vendorId = static_cast<std::uint16_t>(*vendor);
    info.deviceId = static_cast<std::uint16_t>(*device);
    return info;
}

std::optional<PciDeviceInfo> PciIdentities::of(const std::string& busInfo)
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = read_.find(busInfo);
    if (found == read_.end()) found = read_.emplace(busInfo, readPciIdentity(sysRoot_, busInfo)).first;
    return found->second;
}

}  // namespace orv::linuxhost
