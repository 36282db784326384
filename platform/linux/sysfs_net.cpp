#include "sysfs_net.hpp"

#include "linux_call_error.hpp"
#include "text_files.hpp"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <system_error>

namespace fs = std::filesystem;

namespace orv::linuxhost {

namespace {

// The bus a sysfs device sits on: the name its `subsystem` link points to.
std::string subsystemOf(const std::string& deviceDir)
{
    std::error_code ec;
    auto subsystem = fs::read_symlink(deviceDir + "/subsystem", ec);
    return ec ? std::string() : subsystem.filename().string();
}

// The PCI function at dir, named addressName in its parent.
std::optional<PciDeviceInfo> readPciFunction(const std::string& dir, const std::string& addressName)
{
    auto address = parsePciAddress(addressName);
    if (!address || subsystemOf(dir) != "pci") return std::nullopt;
    auto vendor = readNumber(dir + "/vendor");
    auto device = readNumber(dir + "/device");
    if (!vendor || !device) return std::nullopt;
    PciDeviceInfo info;
    info.address = *address;
    info.vendorId = static_cast<std::uint16_t>(*vendor);
    info.deviceId = static_cast<std::uint16_t>(*device);
    return info;
}

std::string requireLine(const std::string& path)
{
    const std::string text = readFileOrThrow(path);
    std::string_view view(text);
    return std::string(trimmed(view.substr(0, view.find('\n'))));
}

}  // namespace

SysfsNet::SysfsNet(std::string sysRoot) : root_(std::move(sysRoot)) {}

std::string SysfsNet::netDir(const std::string& name) const
{
    return root_ + "/class/net/" + name;
}

std::vector<std::string> SysfsNet::devicesWhere(bool busOnly) const
{
    std::vector<std::pair<std::uint64_t, std::string>> found;
    std::error_code ec;
    for (fs::directory_iterator it(root_ + "/class/net", ec), end; !ec && it != end; it.increment(ec)) {
        std::string name = it->path().filename().string();
        if (busOnly && !hasBusDevice(name)) continue;
        auto index = readNumber(netDir(name) + "/ifindex");
        if (!index) continue;  // vanished while listing
        found.emplace_back(*index, name);
    }
    std::sort(found.begin(), found.end());
    std::vector<std::string> names;
    for (auto& entry : found) names.push_back(std::move(entry.second));
    return names;
}

std::vector<std::string> SysfsNet::allDevices() const { return devicesWhere(false); }

std::vector<std::string> SysfsNet::busDevices() const { return devicesWhere(true); }

bool SysfsNet::hasBusDevice(const std::string& name) const
{
    std::error_code ec;
    return fs::is_symlink(netDir(name) + "/device", ec);
}

std::optional<PciDeviceInfo> SysfsNet::pciDevice(const std::string& name) const
{
    // The class entry names the whole device path: .../<bus parent>/<bus device>/net/<name>.
    std::error_code ec;
    const fs::path classTarget = fs::read_symlink(netDir(name), ec);
    if (ec) return std::nullopt;
    const fs::path deviceDir = classTarget.parent_path().parent_path();
    const std::string device = netDir(name) + "/device";
    const std::string bus = subsystemOf(device);
    if (bus == "pci") return readPciFunction(device, deviceDir.filename().string());
    // A virtio device is a function of the PCI device right above it; any other
    // bus (USB, SDIO, a platform device) ends the search: the NIC is not on PCI.
    if (bus == "virtio") return readPciFunction(device + "/..", deviceDir.parent_path().filename().string());
    return std::nullopt;
}

SysfsLinkAttributes SysfsNet::linkAttributes(const std::string& name) const
{
    const std::string dir = netDir(name);
    SysfsLinkAttributes attributes;
    auto number = [&](const char* file) { return numberAttribute(name, file); };
    attributes.ifindex = static_cast<int>(number("ifindex"));
    attributes.flags = static_cast<std::uint32_t>(number("flags"));
    attributes.mtu = static_cast<std::uint32_t>(number("mtu"));
    attributes.operstate = requireLine(dir + "/operstate");
    attributes.address = requireLine(dir + "/address");
    attributes.carrier = carrier(name);
    attributes.speed = speed(name);
    attributes.duplex = duplex(name);
    return attributes;
}

std::uint64_t SysfsNet::numberAttribute(const std::string& name, const char* file) const
{
    const std::string path = netDir(name) + "/" + file;
    auto value = parseNumber(requireLine(path));
    if (!value) throw LinuxCallError("parse", path, EINVAL);
    return *value;
}

std::optional<std::int64_t> SysfsNet::speed(const std::string& name) const
{
    return readSignedNumber(netDir(name) + "/speed");
}

std::string SysfsNet::duplex(const std::string& name) const
{
    return readLine(netDir(name) + "/duplex").value_or("");
}

std::optional<bool> SysfsNet::carrier(const std::string& name) const
{
    auto value = readNumber(netDir(name) + "/carrier");
    if (!value) return std::nullopt;
    return *value != 0;
}

}  // namespace orv::linuxhost
