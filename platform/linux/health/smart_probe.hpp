// Where the disk readers get SMART answers from: the drives themselves
// (DeviceSmartProbe, through the kernel's NVMe admin and SG_IO ioctls), or a
// test's byte buffers.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

struct AtaSmartAnswers {
    // The drive was in standby: it was not asked for SMART, so as not to spin it up.
    bool standby = false;
    std::vector<std::uint8_t> statusSense;  // sense data of SMART RETURN STATUS; empty when refused
    std::vector<std::uint8_t> data, thresholds;  // the sectors; empty when refused
};

class SmartProbe {
public:
    virtual ~SmartProbe() = default;
    // The SMART / Health log of the NVMe controller at <dev>/<node>; nothing
    // when the controller cannot be asked.
    virtual std::optional<std::vector<std::uint8_t>> nvmeHealthLog(const std::string& node) = 0;
    // The SMART answers of the ATA disk at <dev>/<node> (none asked of a
    // drive in standby); nothing when it cannot be opened.
    virtual std::optional<AtaSmartAnswers> ataSmart(const std::string& node) = 0;
};

class DeviceSmartProbe final : public SmartProbe {
public:
    explicit DeviceSmartProbe(std::string devRoot) : devRoot_(std::move(devRoot)) {}
    std::optional<std::vector<std::uint8_t>> nvmeHealthLog(const std::string& node) override;
    std::optional<AtaSmartAnswers> ataSmart(const std::string& node) override;

private:
    std::string devRoot_;
};

}  // namespace orv::linuxhost::health
