#include "linux_pnic.hpp"

#include "link_modes.hpp"
#include "link_statistics.hpp"
#include "linux_call_error.hpp"
#include "pnic_records.hpp"

#include "nodemgr/lib/NodeMgrException.h"

#include <linux/netlink.h>
#include <net/if.h>
#include <ostream>

namespace orv::linuxhost {

namespace NN = NodeMgr::Network;
using NodeMgr::Lib::NodeMgrException;

LinuxPnic::LinuxPnic(std::string name, std::string sysRoot, std::shared_ptr<EthtoolChannel> channel,
                     std::shared_ptr<EthtoolNetlinkChannel> netlink, std::shared_ptr<RouteStatistics> route)
    : name_(std::move(name)),
      sysfs_(std::move(sysRoot)),
      channel_(std::move(channel)),
      netlink_(std::move(netlink)),
      route_(route ? std::move(route) : std::make_shared<RouteStatistics>())
{
}

template <typename Operation>
auto LinuxPnic::guarded(const char* operation, Operation&& body) const -> decltype(body())
{
    try {
        return body();
    } catch (const LinuxCallError& error) {
        throw NodeMgrException(std::string(operation) + " failed for " + name_ + ": " + error.what());
    }
}

void LinuxPnic::refuse(const char* operation) const
{
    throw NodeMgrException(std::string(operation) + " is not available for " + name_ + " on this host");
}

bool LinuxPnic::linkUp() const
{
    const bool up = sysfs_.numberAttribute(name_, "flags") & IFF_UP;
    return up && sysfs_.carrier(name_).value_or(false);
}

std::optional<ethtool_wolinfo> LinuxPnic::wakeOnLan() const
{
    if (wol_) return *wol_;
    try {
        wol_ = ethtool().wakeOnLan();
    } catch (const LinuxCallError& error) {
        if (!error.unsupported()) throw;
        wol_ = std::optional<ethtool_wolinfo>();
    }
    return *wol_;
}

void LinuxPnic::Refresh() { wol_.reset(); }
void LinuxPnic::SaveConfig() { refuse("SaveConfig"); }
void LinuxPnic::LoadConfig() { refuse("LoadConfig"); }

void LinuxPnic::Print(std::ostream& out) const
{
    out << "pnic " << name_ << '\n';
}

std::string LinuxPnic::GetName() const { return name_; }

std::vector<NodeMgr::Lib::NodeMgrObject*> LinuxPnic::GetChildren() const { return {}; }

NN::PciDevice* LinuxPnic::GetPciDevice() const
{
    if (!pci_) {
        auto info = sysfs_.pciDevice(name_);
        if (info) pci_ = std::make_unique<LinuxPciDevice>(*info);
    }
    return pci_.get();
}

NN::Duplex LinuxPnic::GetConfiguredDuplex() const
{
    return guarded("GetConfiguredDuplex", [&] {
        auto settings = ethtool().linkSettings();
        return settings.autoneg == AUTONEG_ENABLE ? NN::DUPLEX_MODE_AUTO : toDuplex(settings.duplex);
    });
}

NN::Duplex LinuxPnic::GetDuplex() const
{
    return guarded("GetDuplex", [&] {
        if (!linkUp()) return NN::DUPLEX_MODE_AUTO;  // drivers keep the last speed and duplex after the link drops
        auto duplex = sysfs_.duplex(name_);
        return duplex == "full" ? NN::DUPLEX_MODE_FULL : duplex == "half" ? NN::DUPLEX_MODE_HALF : NN::DUPLEX_MODE_AUTO;
    });
}

bool LinuxPnic::IsLinkUp() const
{
    return guarded("IsLinkUp", [&] { return linkUp(); });
}

bool LinuxPnic::IsOperationalLinkUp() const
{
    return guarded("IsOperationalLinkUp", [&] { return attributes().operstate == "up"; });
}

bool LinuxPnic::IsAdministrativeLinkUp() const
{
    return guarded("IsAdministrativeLinkUp", [&] { return (sysfs_.numberAttribute(name_, "flags") & IFF_UP) != 0; });
}

bool LinuxPnic::IsEnabled() const
{
    return guarded("IsEnabled", [&] { return (sysfs_.numberAttribute(name_, "flags") & IFF_UP) != 0; });
}

NN::LinkSpeed LinuxPnic::GetConfiguredLinkSpeed() const
{
    return guarded("GetConfiguredLinkSpeed", [&] {
        auto settings = ethtool().linkSettings();
        return settings.autoneg == AUTONEG_ENABLE ? NN::CONNECTION_AUTO : toLinkSpeed(settings.speed);
    });
}

NN::LinkSpeed LinuxPnic::GetLinkSpeed() const
{
    return guarded("GetLinkSpeed", [&] {
        if (!linkUp()) return NN::CONNECTION_AUTO;
        auto speed = sysfs_.speed(name_).value_or(-1);
        return speed > 0 ? toLinkSpeed(static_cast<std::uint32_t>(speed)) : NN::CONNECTION_AUTO;
    });
}

void LinuxPnic::SetLinkSpeedAndDuplex(NN::LinkSpeed, NN::Duplex) { refuse("SetLinkSpeedAndDuplex"); }

uint32_t LinuxPnic::GetHardwareCapabilities() const { return 0; }

std::string LinuxPnic::GetDriverName() const
{
    return guarded("GetDriverName", [&] { return toDriverInfo(ethtool().driverInfo()).name; });
}

std::vector<NN::LinkMode> LinuxPnic::GetSupportedModes() const
{
    return guarded("GetSupportedModes", [&] { return toLinkModes(ethtool().linkSettings().supported); });
}

NN::PnicPortMode LinuxPnic::GetPort() const
{
    return guarded("GetPort", [&] { return static_cast<NN::PnicPortMode>(recordPort(ethtool().linkSettings().port)); });
}

std::string LinuxPnic::GetHint() const { return {}; }

NN::MacAddress LinuxPnic::GetMacAddress() const
{
    return guarded("GetMacAddress", [&] {
        std::vector<std::uint8_t> permanent;
        try {
            permanent = ethtool().permanentAddress();
        } catch (const LinuxCallError& error) {
            if (!error.unsupported()) throw;
        }
        if (permanent.size() == 6) {
            std::array<unsigned char, 6> bytes{};
            std::copy(permanent.begin(), permanent.end(), bytes.begin());
            return NN::MacAddress(bytes);
        }
        return GetVirtualMacAddress();
    });
}

NN::MacAddress LinuxPnic::GetVirtualMacAddress() const
{
    return guarded("GetVirtualMacAddress", [&] {
        auto bytes = parseMac(attributes().address);
        return bytes ? NN::MacAddress(*bytes) : NN::MacAddress();
    });
}

bool LinuxPnic::GetResPoolsSchedAllowed() const { return false; }
void LinuxPnic::SetEnabled(bool) { refuse("SetEnabled"); }
void LinuxPnic::SetResPoolsSchedAllowed(bool) { refuse("SetResPoolsSchedAllowed"); }
bool LinuxPnic::GetResPoolsSchedSupported() const { return false; }

bool LinuxPnic::GetWakeOnLANEnabled() const
{
    return guarded("GetWakeOnLANEnabled", [&] {
        auto wol = wakeOnLan();
        return wol && wol->wolopts != 0;
    });
}

bool LinuxPnic::GetWakeOnLANSupported() const
{
    return guarded("GetWakeOnLANSupported", [&] {
        auto wol = wakeOnLan();
        return wol && wol->supported != 0;
    });
}

void LinuxPnic::SetWakeOnLANEnabled(bool) { refuse("SetWakeOnLANEnabled"); }
std::string LinuxPnic::GetDPStatus() const { return {}; }
void LinuxPnic::GetCdpInfo(NN::PnicDiscoveryInfo& info) const { info.fields.clear(); }
void LinuxPnic::GetLldpInfo(NN::PnicDiscoveryInfo& info) const { info.fields.clear(); }

uint32_t LinuxPnic::GetMTU() const
{
    return guarded("GetMTU", [&] { return static_cast<uint32_t>(sysfs_.numberAttribute(name_, "mtu")); });
}

bool LinuxPnic::IsPseudoDevice() const { return false; }

void LinuxPnic::GetSourcePortStats(NN::PnicSourcePortStats& stats) const
{
    guarded("GetSourcePortStats", [&] {
        auto link = route_->read(name_);
        stats = NN::PnicSourcePortStats{link.tx_packets, link.rx_packets, link.tx_bytes, link.rx_bytes};
    });
}

void LinuxPnic::GetPnicStats(NN::PnicStats& stats) const
{
    guarded("GetPnicStats", [&] {
        auto link = route_->read(name_);
        std::vector<DriverStatistic> driver;
        try {
            driver = ethtool().driverStatistics();
        } catch (const LinuxCallError& error) {
            if (!error.unsupported()) throw;
        }
        stats = toStats(link, driver);
    });
}

void LinuxPnic::GetPnicPrivStats(std::string& text) const
{
    guarded("GetPnicPrivStats", [&] {
        text.clear();
        for (const auto& statistic : ethtool().driverStatistics()) {
            text += statistic.name + ": " + std::to_string(statistic.value) + "\n";
        }
    });
}

void LinuxPnic::GetPnicInfo(NN::PnicInfo& info) const
{
    guarded("GetPnicInfo", [&] {
        const bool up = linkUp();
        EthtoolReader reader = ethtool();
        fillLinkPart(info, reader.linkSettings(), up);
        fillWakeOnPart(info, wakeOnLan());
        std::optional<std::uint32_t> level;
        try {
            level = reader.messageLevel();
        } catch (const LinuxCallError& error) {
            if (!error.unsupported()) throw;
        }
        fillMessageLevel(info, level);
        info.viraddr = attributes().address;
    });
}

void LinuxPnic::GetPnicPauseInfo(NN::PnicPauseInfo& info) const
{
    guarded("GetPnicPauseInfo", [&] {
        EthtoolReader reader = ethtool();
        auto pause = reader.pause();
        std::optional<LinkSettings> settings;
        try {
            settings = reader.linkSettings();
        } catch (const LinuxCallError& error) {
            if (!error.unsupported()) throw;
        }
        info = toPauseInfo(pause, settings ? &*settings : nullptr);
    });
}

void LinuxPnic::GetPnicCoalesceInfo(NN::PnicCoalesceInfo& info) const
{
    guarded("GetPnicCoalesceInfo", [&] { info = toCoalesceInfo(ethtool().coalesce()); });
}

void LinuxPnic::GetPnicRingInfo(NN::PnicRingInfo& preset, NN::PnicRingInfo& current) const
{
    guarded("GetPnicRingInfo", [&] { toRingInfo(ethtool().rings(), preset, current); });
}

void LinuxPnic::GetPnicOffloadInfo(NN::PnicOffloadInfo& info) const
{
    guarded("GetPnicOffloadInfo", [&] { info = toOffloadInfo(ethtool().activeFeatures()); });
}

void LinuxPnic::GetPnicSoftwareSimulationInfo(NN::PnicSoftwareSimulationInfo& info) const
{
    info = NN::PnicSoftwareSimulationInfo{};
}

void LinuxPnic::GetPnicDriverInfo(NN::PnicDriverInfo& info) const
{
    guarded("GetPnicDriverInfo", [&] { info = toDriverInfo(ethtool().driverInfo()); });
}

void LinuxPnic::SetPnicInfo(const NN::PnicInfo&) { refuse("SetPnicInfo"); }
void LinuxPnic::SetPnicPauseInfo(const NN::PnicPauseInfo&) { refuse("SetPnicPauseInfo"); }
void LinuxPnic::SetPnicCoalesceInfo(const NN::PnicCoalesceInfo&) { refuse("SetPnicCoalesceInfo"); }
void LinuxPnic::SetPnicRingInfo(const NN::PnicRingInfo&) { refuse("SetPnicRingInfo"); }
void LinuxPnic::SetPnicOffloadInfo(const NN::PnicOffloadInfo&) { refuse("SetPnicOffloadInfo"); }
void LinuxPnic::SetPnicSoftwareSimulationInfo(const NN::PnicSoftwareSimulationInfo&) { refuse("SetPnicSoftwareSimulationInfo"); }
void LinuxPnic::DumpRegister(std::string&) const { refuse("DumpRegister"); }
void LinuxPnic::DumpEEPROM(std::vector<uint8_t>&) const { refuse("DumpEEPROM"); }
void LinuxPnic::ChangeEEPROM(uint32_t, const std::vector<uint8_t>&) { refuse("ChangeEEPROM"); }
void LinuxPnic::ChangeEEPROM(const std::string&) { refuse("ChangeEEPROM"); }
void LinuxPnic::RestartNegotiation() { refuse("RestartNegotiation"); }
void LinuxPnic::IdentifyNic(uint32_t) { refuse("IdentifyNic"); }
bool LinuxPnic::RunSelfTest(bool, std::string&) { refuse("RunSelfTest"); }

}  // namespace orv::linuxhost
