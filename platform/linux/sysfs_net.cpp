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

bool isPciFunctionDir(const fs::path& dir)
{
    if (!parsePciAddress(dir.filename().string())) return false;
    std::error_code ec;
    auto subsystem = fs::read_symlink(dir / "subsystem", ec);
    return !ec && subsystem.filename() == "pci";
}

std::optional<PciDeviceInfo> readPciFunction(const fs::path& dir)
{
    auto vendor = readNumber((dir / "vendor").string());
    auto device = readNumber((dir / "device").string());
    if (!vendor || !device) return std::nullopt;
    PciDeviceInfo info;
    info.address = *parsePciAddress(dir.filename().string());
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
    std::error_code ec;
    fs::path dir = fs::canonical(netDir(name) + "/device", ec);
    if (ec) return std::nullopt;
    fs::path stop = fs::canonical(root_, ec);
    for (; !ec && dir != stop && dir.has_relative_path(); dir = dir.parent_path()) {
        if (isPciFunctionDir(dir)) return readPciFunction(dir);
    }
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
    attributes.speed = readSignedNumber(dir + "/speed");
    attributes.duplex = readLine(dir + "/duplex").value_or("");
    return attributes;
}

std::uint64_t SysfsNet::numberAttribute(const std::string& name, const char* file) const
{
    const std::string path = netDir(name) + "/" + file;
    auto value = parseNumber(requireLine(path));
    if (!value) throw LinuxCallError("parse", path, EINVAL);
    return *value;
}

std::optional<bool> SysfsNet::carrier(const std::string& name) const
{
    auto value = readNumber(netDir(name) + "/carrier");
    if (!value) return std::nullopt;
    return *value != 0;
}

}  // namespace orv::linuxhost
