#include "block_disks.hpp"

#include "../text_files.hpp"
#include "sysfs_dir.hpp"

#include <filesystem>

namespace orv::linuxhost::health {

namespace {

// Runs of blanks made one space, ends trimmed; nothing when empty.
std::optional<std::string> tidy(const std::optional<std::string>& text)
{
    if (!text) return std::nullopt;
    std::string out;
    for (char c : *text) {
        const bool blank = c == ' ' || c == '\t';
        if (blank && (out.empty() || out.back() == ' ')) continue;
        out += blank ? ' ' : c;
    }
    while (!out.empty() && out.back() == ' ') out.pop_back();
    if (out.empty()) return std::nullopt;
    return out;
}

std::string linkName(const std::string& path)
{
    std::error_code ec;
    const std::filesystem::path target = std::filesystem::canonical(path, ec);
    return ec ? std::string() : target.filename().string();
}

// The controller of an NVMe namespace: its device when that is a controller,
// else (a multipath subsystem) the first controller listed in it.
std::string nvmeController(const std::string& device)
{
    const std::string name = linkName(device);
    if (name.rfind("nvme", 0) == 0 && name.find("subsys") == std::string::npos) return name;
    for (const std::string& entry : entriesStartingWith(device, "nvme")) {
        if (entry.find("subsys") == std::string::npos) return entry;
    }
    return {};
}

std::string identityOf(const std::string& sysRoot, const std::string& dir, const std::string& device, DiskBus bus)
{
    std::optional<std::string> wwid = tidy(readLine(dir + "/wwid"));
    if (!wwid) wwid = tidy(readLine(device + "/wwid"));
    if (wwid) return "wwid:" + *wwid;
    if (std::optional<std::string> serial = tidy(readLine(dir + "/serial"))) return "serial:" + *serial;
    if (bus == DiskBus::Nvme) {
        std::optional<std::string> serial = tidy(readLine(device + "/serial"));
        std::optional<std::uint64_t> nsid = readNumber(dir + "/nsid");
        if (serial && nsid) return "serial:" + *serial + "/ns" + std::to_string(*nsid);
    }
    return "path:" + devicePath(sysRoot, device).value_or(dir);
}

std::optional<BlockDisk> readDisk(const std::string& sysRoot, const std::string& dir, const std::string& name)
{
    const std::string device = dir + "/device";
    if (!exists(device)) return std::nullopt;
    const std::string subsystem = subsystemOf(device);
    BlockDisk disk;
    disk.name = name;
    if (subsystem == "nvme" || subsystem == "nvme-subsystem") {
        disk.bus = DiskBus::Nvme;
        disk.smartNode = nvmeController(device);
    } else if (subsystem == "scsi") {
        if (readNumber(device + "/type").value_or(0) != 0) return std::nullopt;
        disk.bus = tidy(readLine(device + "/vendor")) == "ATA" ? DiskBus::Ata : DiskBus::Scsi;
        if (disk.bus == DiskBus::Ata) disk.smartNode = name;
    }
    disk.id = identityOf(sysRoot, dir, device, disk.bus);
    disk.model = tidy(readLine(device + "/model"));
    disk.sectors = readNumber(dir + "/size");
    return disk;
}

}  // namespace

std::vector<BlockDisk> readBlockDisks(const std::string& sysRoot)
{
    std::vector<BlockDisk> disks;
    const std::string base = sysRoot + "/block";
    for (const std::string& name : directoryEntries(base)) {
        if (std::optional<BlockDisk> disk = readDisk(sysRoot, base + "/" + name, name)) disks.push_back(std::move(*disk));
    }
    return disks;
}

}  // namespace orv::linuxhost::health
