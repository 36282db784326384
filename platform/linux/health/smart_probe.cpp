#include "smart_probe.hpp"

#include "ata_smart.hpp"
#include "nvme_smart.hpp"

#include <cerrno>
#include <fcntl.h>
#include <linux/nvme_ioctl.h>
#include <scsi/sg.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace orv::linuxhost::health {

namespace {

constexpr std::uint8_t kNvmeGetLogPage = 0x02;
constexpr std::uint32_t kNvmeSmartLog = 0x02;
constexpr std::uint32_t kAllNamespaces = 0xFFFFFFFF;
constexpr unsigned kTimeoutMs = 5000;

class Descriptor {
public:
    explicit Descriptor(const std::string& path) : fd_(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC)) {}
    ~Descriptor()
    {
        if (fd_ >= 0) ::close(fd_);
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    int get() const { return fd_; }

private:
    int fd_;
};

// One ATA PASS-THROUGH (16) command; the data read (one sector when `reads`)
// and the sense data. False when the kernel refuses the call.
bool passThrough(int fd, std::array<std::uint8_t, 16> cdb, bool reads, std::vector<std::uint8_t>& data,
                 std::vector<std::uint8_t>& sense)
{
    data.assign(reads ? kAtaSectorSize : 0, 0);
    sense.assign(64, 0);
    sg_io_hdr_t io{};
    io.interface_id = 'S';
    io.dxfer_direction = reads ? SG_DXFER_FROM_DEV : SG_DXFER_NONE;
    io.cmd_len = static_cast<unsigned char>(cdb.size());
    io.cmdp = cdb.data();
    io.dxfer_len = static_cast<unsigned>(data.size());
    io.dxferp = reads ? data.data() : nullptr;
    io.mx_sb_len = static_cast<unsigned char>(sense.size());
    io.sbp = sense.data();
    io.timeout = kTimeoutMs;
    int result;
    do {
        result = ::ioctl(fd, SG_IO, &io);
    } while (result < 0 && errno == EINTR);
    if (result < 0 || io.host_status != 0) return false;
    sense.resize(io.sb_len_wr);
    // A READ that ended in CHECK CONDITION brought no usable sector.
    if (reads && (io.status != 0 || (io.driver_status & 0x0f) != 0)) data.clear();
    return true;
}

}  // namespace

std::optional<std::vector<std::uint8_t>> DeviceSmartProbe::nvmeHealthLog(const std::string& node)
{
    Descriptor device(devRoot_ + "/" + node);
    if (device.get() < 0) return std::nullopt;
    std::vector<std::uint8_t> log(kNvmeHealthLogSize, 0);
    nvme_admin_cmd command{};
    command.opcode = kNvmeGetLogPage;
    command.nsid = kAllNamespaces;
    command.addr = reinterpret_cast<std::uint64_t>(log.data());
    command.data_len = static_cast<std::uint32_t>(log.size());
    command.cdw10 = (static_cast<std::uint32_t>(log.size() / 4 - 1) << 16) | kNvmeSmartLog;  // dwords - 1, log id
    command.timeout_ms = kTimeoutMs;
    int result;
    do {
        result = ::ioctl(device.get(), NVME_IOCTL_ADMIN_CMD, &command);
    } while (result < 0 && errno == EINTR);
    if (result != 0) return std::nullopt;  // < 0: refused; > 0: the controller's status
    return log;
}

std::optional<AtaSmartAnswers> DeviceSmartProbe::ataSmart(const std::string& node)
{
    Descriptor device(devRoot_ + "/" + node);
    if (device.get() < 0) return std::nullopt;
    AtaSmartAnswers answers;
    std::vector<std::uint8_t> none, sense;
    if (passThrough(device.get(), ataCheckPowerModeBlock(), false, none, sense) &&
        ataCountRegister(sense.data(), sense.size()) == kAtaPowerModeStandby) {
        answers.standby = true;
        return answers;
    }
    auto ask = [&](SmartCommand command, std::vector<std::uint8_t>& data, std::vector<std::uint8_t>& senseOut) {
        if (!passThrough(device.get(), ataSmartCommandBlock(command), command != SmartCommand::ReturnStatus, data, senseOut)) {
            data.clear();
            senseOut.clear();
        }
    };
    ask(SmartCommand::ReturnStatus, none, answers.statusSense);
    ask(SmartCommand::ReadData, answers.data, sense);
    if (!answers.data.empty()) ask(SmartCommand::ReadThresholds, answers.thresholds, sense);
    return answers;
}

}  // namespace orv::linuxhost::health
