// Disks of the block layer (<sys>/block entries with a bus device: NVMe
// namespaces, SCSI and ATA disks, virtio disks, MMC cards), with an identity
// that survives reboots and what is needed to ask their SMART status.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

enum class DiskBus { Nvme, Ata, Scsi, Other };

struct BlockDisk {
    std::string name;  // "sda", "nvme0n1", "vda"
    DiskBus bus = DiskBus::Other;
    // "wwid:<world-wide id>", else "serial:<serial>[/ns<n>]", else "path:<device path>".
    std::string id;
    std::optional<std::string> model;
    std::optional<std::uint64_t> sectors;  // 512-byte sectors
    // The device node (under /dev) that answers SMART: the NVMe controller
    // ("nvme0") or the disk itself ("sda"); empty when the bus has none we ask.
    std::string smartNode;
};

// Every disk in name order; devices without a bus device (loop, md, dm,
// zram) and SCSI devices that are not disks (optical drives, enclosures) are
// left out.
std::vector<BlockDisk> readBlockDisks(const std::string& sysRoot);

}  // namespace orv::linuxhost::health
