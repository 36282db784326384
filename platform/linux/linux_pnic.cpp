#include "linux_pnic.hpp"

#include "link_modes.hpp"
#include "pnic_records.hpp"

#include "nodemgr/lib/NodeMgrException.h"

#include <cerrno>
#include <linux/if.h>
#include <ostream>

namespace orv::linuxhost {

namespace NN = NodeMgr::Network;
using NodeMgr::Lib::NodeMgrException;

LinuxPnic::LinuxPnic(std::string name, NicKernel kernel, std::optional<LinkRecord> link,
                     std::shared_ptr<PciIdentities> pci)
    : name_(std::move(name)), kernel_(std::move(kernel)), pciIdentities_(std::move(pci)), link_(std::move(link))
{
    if (!kernel_.route) kernel_.route = std::make_shared<RouteLinks>();
    if (!pciIdentities_) pciIdentities_ = std::make_shared<PciIdentities>(kernel_.sysRoot);
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

const LinkRecord& LinuxPnic::link() const
{
    if (!link_) link_ = kernel_.route->named(name_);
    return *link_;
}

const rtnl_link_stats64& LinuxPnic::statistics() const
{
    if (!link().statistics) throw LinuxCallError("RTM_GETLINK", name_, ENODATA);
    return *link().statistics;
}

bool LinuxPnic::linkUp() const
{
    return administrativelyUp() && link().carrier.value_or(false);
}

const LinkSettings& LinuxPnic::settings() const
{
    if (settingsError_) throw *settingsError_;
    if (!settings_) {
        try {
            settings_ = ethtool().linkSettings();
        } catch (const LinuxCallError& error) {
            settingsError_ = error;
            throw;
        }
    }
    return *settings_;
}

const LinkSettings* LinuxPnic::settingsIfSupported() const
{
    try {
        return &settings();
    } catch (const LinuxCallError& error) {
        if (!error.unsupported()) throw;
        return nullptr;
    }
}

const ethtool_drvinfo& LinuxPnic::driverInfo() const
{
    if (!driver_) driver_ = ethtool().driverInfo();
    return *driver_;
}

std::optional<ethtool_wolinfo> LinuxPnic::wakeOnLan() const
{
    if (!wol_) wol_ = ethtool().wakeOnLan();
    return *wol_;
}

void LinuxPnic::Refresh()
{
    link_.reset();
    settings_.reset();
    settingsError_.reset();
    driver_.reset();
    pci_.reset();
    wol_.reset();
}
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
        std::optional<PciDeviceInfo> info;
        try {
            info = pciIdentities_->of(driverInfo().bus_info);
        } catch (const LinuxCallError&) {
            // no driver info (the NIC vanished): no bus address to follow
        }
        pci_ = info ? std::make_unique<LinuxPciDevice>(*info) : nullptr;
    }
    return pci_->get();
}

NN::Duplex LinuxPnic::GetConfiguredDuplex() const
{
    return guarded("GetConfiguredDuplex", [&] {
        const auto& current = settings();
        return current.autoneg == AUTONEG_ENABLE ? NN::DUPLEX_MODE_AUTO : toDuplex(current.duplex);
    });
}

NN::Duplex LinuxPnic::GetDuplex() const
{
    return guarded("GetDuplex", [&] {
        if (!linkUp()) return NN::DUPLEX_MODE_AUTO;  // drivers keep the last speed and duplex after the link drops
        const LinkSettings* current = settingsIfSupported();
        return current ? toDuplex(current->duplex) : NN::DUPLEX_MODE_AUTO;
    });
}

bool LinuxPnic::IsLinkUp() const
{
    return guarded("IsLinkUp", [&] { return linkUp(); });
}

bool LinuxPnic::IsOperationalLinkUp() const
{
    return guarded("IsOperationalLinkUp", [&] { return link().operstate == IF_OPER_UP; });
}

bool LinuxPnic::IsAdministrativeLinkUp() const
{
    return guarded("IsAdministrativeLinkUp", [&] { return administrativelyUp(); });
}

bool LinuxPnic::IsEnabled() const
{
    return guarded("IsEnabled", [&] { return administrativelyUp(); });
}

NN::LinkSpeed LinuxPnic::GetConfiguredLinkSpeed() const
{
    return guarded("GetConfiguredLinkSpeed", [&] {
        const auto& current = settings();
        return current.autoneg == AUTONEG_ENABLE ? NN::CONNECTION_AUTO : toLinkSpeed(current.speed);
    });
}

NN::LinkSpeed LinuxPnic::GetLinkSpeed() const
{
    return guarded("GetLinkSpeed", [&] {
        if (!linkUp()) return NN::CONNECTION_AUTO;
        const LinkSettings* current = settingsIfSupported();
        return current ? toLinkSpeed(current->speed) : NN::CONNECTION_AUTO;
    });
}

void LinuxPnic::SetLinkSpeedAndDuplex(NN::LinkSpeed, NN::Duplex) { refuse("SetLinkSpeedAndDuplex"); }

uint32_t LinuxPnic::GetHardwareCapabilities() const { return 0; }

std::string LinuxPnic::GetDriverName() const
{
    return guarded("GetDriverName", [&] { return toDriverInfo(driverInfo()).name; });
}

std::vector<NN::LinkMode> LinuxPnic::GetSupportedModes() const
{
    return guarded("GetSupportedModes", [&] { return toLinkModes(settings().supported); });
}

NN::PnicPortMode LinuxPnic::GetPort() const
{
    return guarded("GetPort", [&] { return static_cast<NN::PnicPortMode>(recordPort(settings().port)); });
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
        return toMacAddress(permanent.size() == 6 ? permanent : link().address);
    });
}

NN::MacAddress LinuxPnic::GetVirtualMacAddress() const
{
    return guarded("GetVirtualMacAddress", [&] {
        return toMacAddress(link().address);
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
    return guarded("GetMTU", [&] { return link().mtu; });
}

bool LinuxPnic::IsPseudoDevice() const { return false; }

void LinuxPnic::GetSourcePortStats(NN::PnicSourcePortStats& stats) const
{
    guarded("GetSourcePortStats", [&] {
        const auto& counters = statistics();
        stats = NN::PnicSourcePortStats{counters.tx_packets, counters.rx_packets, counters.tx_bytes, counters.rx_bytes};
    });
}

void LinuxPnic::GetPnicStats(NN::PnicStats& stats) const
{
    guarded("GetPnicStats", [&] {
        const auto& counters = statistics();
        std::vector<DriverStatistic> driver;
        try {
            driver = ethtool().driverStatistics();
        } catch (const LinuxCallError& error) {
            if (!error.unsupported()) throw;
        }
        stats = toStats(counters, driver);
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
        fillLinkPart(info, settings(), up);
        fillWakeOnPart(info, wakeOnLan());
        fillMessageLevel(info, ethtool().messageLevel());
        info.viraddr = addressText(link().address);
    });
}

void LinuxPnic::GetPnicPauseInfo(NN::PnicPauseInfo& info) const
{
    guarded("GetPnicPauseInfo", [&] {
        auto pause = ethtool().pause();
        info = toPauseInfo(pause, settingsIfSupported());
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
    guarded("GetPnicDriverInfo", [&] { info = toDriverInfo(driverInfo()); });
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
