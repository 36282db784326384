// One physical NIC of the running machine behind the NIC library's Pnic
// interface. A pnic object lives for one request and is that request's
// snapshot of the NIC: its link (one rtnetlink answer: flags, MTU, state,
// address, counters), link settings, driver info, wake-on-LAN and PCI identity
// are each read at most once per object, when first needed (or handed over by
// the listing that made it); Refresh() reads them afresh. The other records
// are asked when called. A kernel refusal (the NIC vanished, the driver does
// not implement the query) fails that operation alone with NodeMgrException.
#pragma once

#include "ethtool_reader.hpp"
#include "linux_call_error.hpp"
#include "pci_identity.hpp"
#include "rtnetlink_links.hpp"

#include "nodemgr/network/Pnic.h"

#include <memory>
#include <net/if.h>
#include <optional>
#include <string>

namespace orv::linuxhost {

class LinuxPciDevice final : public NodeMgr::Network::PciDevice {
public:
    explicit LinuxPciDevice(const PciDeviceInfo& info) : info_(info) {}
    uint16_t GetSegment() const override { return info_.address.segment; }
    uint8_t GetBus() const override { return info_.address.bus; }
    uint8_t GetSlot() const override { return info_.address.slot; }
    uint8_t GetFunction() const override { return info_.address.function; }
    uint16_t GetVendorId() const override { return info_.vendorId; }
    uint16_t GetDeviceId() const override { return info_.deviceId; }

private:
    PciDeviceInfo info_;
};

// The kernel paths the NICs of a backend share, all of the namespace the
// backend was made in: the ethtool ioctl socket, the ethtool netlink channel
// (null: the ioctls answer everything), the rtnetlink socket, and the sysfs
// root the PCI identity files are read under.
struct NicKernel {
    explicit NicKernel(std::shared_ptr<EthtoolChannel> ethtoolChannel,
                       std::shared_ptr<EthtoolNetlinkChannel> netlinkChannel = nullptr,
                       std::shared_ptr<RouteLinks> routeLinks = nullptr, std::string sys = "/sys")
        : ethtool(std::move(ethtoolChannel)), netlink(std::move(netlinkChannel)), route(std::move(routeLinks)),
          sysRoot(std::move(sys))
    {
    }

    std::shared_ptr<EthtoolChannel> ethtool;
    std::shared_ptr<EthtoolNetlinkChannel> netlink;
    std::shared_ptr<RouteLinks> route;  // null: the pnic opens one of its own
    std::string sysRoot = "/sys";
};

class LinuxPnic final : public NodeMgr::Network::Pnic {
public:
    // `link` is the listing's answer for the NIC; without it the link is asked
    // by name when first needed. `pci` holds the identities of the listing.
    LinuxPnic(std::string name, NicKernel kernel, std::optional<LinkRecord> link = std::nullopt,
              std::shared_ptr<PciIdentities> pci = nullptr);

    void Refresh() override;
    void SaveConfig() override;
    void LoadConfig() override;
    void Print(std::ostream& out) const override;
    std::string GetName() const override;
    std::vector<NodeMgr::Lib::NodeMgrObject*> GetChildren() const override;

    NodeMgr::Network::PciDevice* GetPciDevice() const override;
    NodeMgr::Network::Duplex GetConfiguredDuplex() const override;
    NodeMgr::Network::Duplex GetDuplex() const override;
    bool IsLinkUp() const override;
    bool IsOperationalLinkUp() const override;
    bool IsAdministrativeLinkUp() const override;
    bool IsEnabled() const override;
    NodeMgr::Network::LinkSpeed GetConfiguredLinkSpeed() const override;
    NodeMgr::Network::LinkSpeed GetLinkSpeed() const override;
    void SetLinkSpeedAndDuplex(NodeMgr::Network::LinkSpeed speed, NodeMgr::Network::Duplex duplex) override;
    uint32_t GetHardwareCapabilities() const override;
    std::string GetDriverName() const override;
    std::vector<NodeMgr::Network::LinkMode> GetSupportedModes() const override;
    NodeMgr::Network::PnicPortMode GetPort() const override;
    std::string GetHint() const override;
    NodeMgr::Network::MacAddress GetMacAddress() const override;
    NodeMgr::Network::MacAddress GetVirtualMacAddress() const override;
    bool GetResPoolsSchedAllowed() const override;
    void SetEnabled(bool enabled) override;
    void SetResPoolsSchedAllowed(bool allowed) override;
    bool GetResPoolsSchedSupported() const override;
    bool GetWakeOnLANEnabled() const override;
    bool GetWakeOnLANSupported() const override;
    void SetWakeOnLANEnabled(bool enabled) override;
    std::string GetDPStatus() const override;
    void GetCdpInfo(NodeMgr::Network::PnicDiscoveryInfo& info) const override;
    void GetLldpInfo(NodeMgr::Network::PnicDiscoveryInfo& info) const override;
    uint32_t GetMTU() const override;
    bool IsPseudoDevice() const override;
    void GetSourcePortStats(NodeMgr::Network::PnicSourcePortStats& stats) const override;
    void GetPnicStats(NodeMgr::Network::PnicStats& stats) const override;
    void GetPnicPrivStats(std::string& text) const override;
    void GetPnicInfo(NodeMgr::Network::PnicInfo& info) const override;
    void GetPnicPauseInfo(NodeMgr::Network::PnicPauseInfo& info) const override;
    void GetPnicCoalesceInfo(NodeMgr::Network::PnicCoalesceInfo& info) const override;
    void GetPnicRingInfo(NodeMgr::Network::PnicRingInfo& preset, NodeMgr::Network::PnicRingInfo& current) const override;
    void GetPnicOffloadInfo(NodeMgr::Network::PnicOffloadInfo& info) const override;
    void GetPnicSoftwareSimulationInfo(NodeMgr::Network::PnicSoftwareSimulationInfo& info) const override;
    void GetPnicDriverInfo(NodeMgr::Network::PnicDriverInfo& info) const override;
    void SetPnicInfo(const NodeMgr::Network::PnicInfo& info) override;
    void SetPnicPauseInfo(const NodeMgr::Network::PnicPauseInfo& info) override;
    void SetPnicCoalesceInfo(const NodeMgr::Network::PnicCoalesceInfo& info) override;
    void SetPnicRingInfo(const NodeMgr::Network::PnicRingInfo& info) override;
    void SetPnicOffloadInfo(const NodeMgr::Network::PnicOffloadInfo& info) override;
    void SetPnicSoftwareSimulationInfo(const NodeMgr::Network::PnicSoftwareSimulationInfo& info) override;
    void DumpRegister(std::string& text) const override;
    void DumpEEPROM(std::vector<uint8_t>& bytes) const override;
    void ChangeEEPROM(uint32_t offset, const std::vector<uint8_t>& bytes) override;
    void ChangeEEPROM(const std::string& imagePath) override;
    void RestartNegotiation() override;
    void IdentifyNic(uint32_t seconds) override;
    bool RunSelfTest(bool offline, std::string& report) override;

private:
    // Runs one operation; a kernel refusal becomes NodeMgrException naming it.
    template <typename Operation>
    auto guarded(const char* operation, Operation&& body) const -> decltype(body());
    [[noreturn]] void refuse(const char* operation) const;
    EthtoolReader ethtool() const { return EthtoolReader(*kernel_.ethtool, name_, kernel_.netlink.get()); }
    const LinkRecord& link() const;
    const rtnl_link_stats64& statistics() const;
    bool administrativelyUp() const { return (link().flags & IFF_UP) != 0; }
    bool linkUp() const;
    const LinkSettings& settings() const;
    // Link settings, or nothing when the driver does not implement them.
    const LinkSettings* settingsIfSupported() const;
    const ethtool_drvinfo& driverInfo() const;
    std::optional<ethtool_wolinfo> wakeOnLan() const;

    std::string name_;
    NicKernel kernel_;
    std::shared_ptr<PciIdentities> pciIdentities_;
    mutable std::optional<LinkRecord> link_;
    mutable std::optional<LinkSettings> settings_;
    mutable std::optional<LinuxCallError> settingsError_;  // the refusal of the settings, kept like an answer
    mutable std::optional<ethtool_drvinfo> driver_;
    mutable std::optional<std::unique_ptr<LinuxPciDevice>> pci_;  // outer: looked up yet; null: not on PCI
    mutable std::optional<std::optional<ethtool_wolinfo>> wol_;  // outer: asked yet; inner: supported
};

}  // namespace orv::linuxhost
