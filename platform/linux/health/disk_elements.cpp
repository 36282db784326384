#include "disk_elements.hpp"

#include "ata_smart.hpp"
#include "element_builder.hpp"
#include "nvme_smart.hpp"

namespace orv::linuxhost::health {

std::optional<std::uint16_t> diskHealth(const BlockDisk& disk, SmartProbe& probe)
{
    if (disk.smartNode.empty()) return std::nullopt;
    if (disk.bus == DiskBus::Nvme) {
        std::optional<std::vector<std::uint8_t>> bytes = probe.nvmeHealthLog(disk.smartNode);
        if (!bytes) return std::nullopt;
        std::optional<NvmeHealthLog> log = parseNvmeHealthLog(bytes->data(), bytes->size());
        if (!log) return std::nullopt;
        return nvmeHealth(*log);
    }
    if (disk.bus == DiskBus::Ata) {
        std::optional<AtaSmartAnswers> answers = probe.ataSmart(disk.smartNode);
        if (!answers || answers->standby) return std::nullopt;
        return ataSmartHealth(smartThresholdExceeded(answers->statusSense.data(), answers->statusSense.size()),
                              parseSmartAttributes(answers->data, answers->thresholds));
    }
    return std::nullopt;
}

orv::platform::HealthElement diskElement(const BlockDisk& disk, std::optional<std::uint16_t> health)
{
    orv::platform::HealthElement element = keyedElement(kDiskDriveClass, "DeviceID", disk.id);
    addProperty(element, "ElementName", disk.model.value_or(disk.name));
    addProperty(element, "Name", disk.name);
    if (disk.sectors) addProperty(element, "MaxMediaSize", *disk.sectors * 512 / 1000);
    setHealth(element, health);
    return element;
}

std::vector<orv::platform::HealthElement> diskElements(const std::string& sysRoot, SmartProbe& probe)
{
    return elementsFrom(readBlockDisks(sysRoot),
                        [&probe](const BlockDisk& disk) { return diskElement(disk, diskHealth(disk, probe)); });
}

}  // namespace orv::linuxhost::health
