#include "SimPnic.h"

#include "nodemgr/lib/NodeMgrException.h"

namespace orv::platform::sim {
namespace {

using namespace NodeMgr::Network;
using NodeMgr::Lib::NodeMgrException;

// Throws the injected failure of call on this NIC, if one fires.
void checkFault(const HostModel& host, std::string_view call, const std::string& nicName)
{
    const FaultRule* rule = host.faults.fire(CallSite{call, {}, nullptr, nicName});
    if (rule != nullptr) {
        throw NodeMgrException(rule->message.empty() ? "injected failure of " + std::string(call) + " on " + nicName
                                                     : rule->message);
    }
}

class SimPciDevice final : public PciDevice {
public:
    SimPciDevice(const HostModel& host, const NicModel& nic) : host_(host), nic_(nic) {}

    uint16_t GetSegment() const override { return check("GetSegment").segment; }
    uint8_t GetBus() const override { return check("GetBus").bus; }
    uint8_t GetSlot() const override { return check("GetSlot").slot; }
    uint8_t GetFunction() const override { return check("GetFunction").function; }
    uint16_t GetVendorId() const override { return check("GetVendorId").vendorId; }
    uint16_t GetDeviceId() const override { return check("GetDeviceId").deviceId; }

private:
    const PciModel& check(std::string_view call) const
    {
        checkFault(host_, call, nic_.name);
        return *nic_.pci;
    }

    const HostModel& host_;
    const NicModel& nic_;
};

class SimPnic final : public Pnic {
public:
    SimPnic(std::shared_ptr<const HostModel> host, const NicModel& nic)
        : host_(std::move(host)), nic_(nic), pci_(*host_, nic)
    {
    }

    void Refresh() override { check("Refresh"); }
    void SaveConfig() override { check("SaveConfig"); }
    void LoadConfig() override { check("LoadConfig"); }
    void Print(std::ostream& out) const override
    {
        check("Print");
        out << nic_.name << (nic_.enabled ? " enabled" : " disabled") << (nic_.linkUp ? " up " : " down ")
            << nic_.speed << " Mb/s mtu " << nic_.mtu << '\n';
    }
    std::string GetName() const override { return check("GetName").name; }
    std::vector<NodeMgr::Lib::NodeMgrObject*> GetChildren() const override { return check("GetChildren"), std::vector<NodeMgr::Lib::NodeMgrObject*>{}; }

    PciDevice* GetPciDevice() const override
    {
        check("GetPciDevice");
        return nic_.pci ? const_cast<SimPciDevice*>(&pci_) : nullptr;
    }
    Duplex GetConfiguredDuplex() const override { return check("GetConfiguredDuplex").duplex; }
    Duplex GetDuplex() const override { return check("GetDuplex").duplex; }
    bool IsLinkUp() const override { return check("IsLinkUp").linkUp; }
    bool IsOperationalLinkUp() const override { return check("IsOperationalLinkUp").linkUp && nic_.enabled; }
    bool IsAdministrativeLinkUp() const override { return check("IsAdministrativeLinkUp").enabled; }
    bool IsEnabled() const override { return check("IsEnabled").enabled; }
    LinkSpeed GetConfiguredLinkSpeed() const override { return check("GetConfiguredLinkSpeed").speed; }
    LinkSpeed GetLinkSpeed() const override { return check("GetLinkSpeed").speed; }
    void SetLinkSpeedAndDuplex(LinkSpeed, Duplex) override { unavailable("SetLinkSpeedAndDuplex"); }
    uint32_t GetHardwareCapabilities() const override { return check("GetHardwareCapabilities"), 0u; }
    std::string GetDriverName() const override { return record(check("GetDriverName").driver, "GetDriverName").name; }
    std::vector<LinkMode> GetSupportedModes() const override
    {
        return record(check("GetSupportedModes").info, "GetSupportedModes").supportedLinkModes;
    }
    PnicPortMode GetPort() const override { return record(check("GetPort").info, "GetPort").port; }
    std::string GetHint() const override { return check("GetHint"), std::string(); }
    MacAddress GetMacAddress() const override { return MacAddress(check("GetMacAddress").mac); }
    MacAddress GetVirtualMacAddress() const override { return MacAddress(check("GetVirtualMacAddress").mac); }
    bool GetResPoolsSchedAllowed() const override { return check("GetResPoolsSchedAllowed"), false; }
    void SetEnabled(bool) override { unavailable("SetEnabled"); }
    void SetResPoolsSchedAllowed(bool) override { unavailable("SetResPoolsSchedAllowed"); }
    bool GetResPoolsSchedSupported() const override { return check("GetResPoolsSchedSupported"), false; }
    bool GetWakeOnLANEnabled() const override { return check("GetWakeOnLANEnabled").wolEnabled; }
    bool GetWakeOnLANSupported() const override { return check("GetWakeOnLANSupported").wolSupported; }
    void SetWakeOnLANEnabled(bool) override { unavailable("SetWakeOnLANEnabled"); }
    std::string GetDPStatus() const override { return check("GetDPStatus"), std::string(); }
    void GetCdpInfo(PnicDiscoveryInfo& info) const override { check("GetCdpInfo"), info = PnicDiscoveryInfo{}; }
    void GetLldpInfo(PnicDiscoveryInfo& info) const override { check("GetLldpInfo"), info = PnicDiscoveryInfo{}; }
    uint32_t GetMTU() const override { return check("GetMTU").mtu; }
    bool IsPseudoDevice() const override { return !check("IsPseudoDevice").pci.has_value(); }
    void GetSourcePortStats(PnicSourcePortStats& stats) const override
    {
        const PnicStats& all = record(check("GetSourcePortStats").stats, "GetSourcePortStats");
        stats = PnicSourcePortStats{all.packetsTx, all.packetsRx, all.bytesTx, all.bytesRx};
    }
    void GetPnicStats(PnicStats& stats) const override { stats = record(check("GetPnicStats").stats, "GetPnicStats"); }
    void GetPnicPrivStats(std::string& text) const override { check("GetPnicPrivStats"), text.clear(); }
    void GetPnicInfo(PnicInfo& info) const override { info = record(check("GetPnicInfo").info, "GetPnicInfo"); }
    void GetPnicPauseInfo(PnicPauseInfo& info) const override
    {
        info = record(check("GetPnicPauseInfo").pause, "GetPnicPauseInfo");
    }
    void GetPnicCoalesceInfo(PnicCoalesceInfo& info) const override
    {
        info = record(check("GetPnicCoalesceInfo").coalesce, "GetPnicCoalesceInfo");
    }
    void GetPnicRingInfo(PnicRingInfo& preset, PnicRingInfo& current) const override
    {
        const RingsModel& rings = record(check("GetPnicRingInfo").rings, "GetPnicRingInfo");
        preset = rings.preset;
        current = rings.current;
    }
    void GetPnicOffloadInfo(PnicOffloadInfo& info) const override { check("GetPnicOffloadInfo"), info = PnicOffloadInfo{}; }
    void GetPnicSoftwareSimulationInfo(PnicSoftwareSimulationInfo& info) const override
    {
        check("GetPnicSoftwareSimulationInfo"), info = PnicSoftwareSimulationInfo{};
    }
    void GetPnicDriverInfo(PnicDriverInfo& info) const override
    {
        info = record(check("GetPnicDriverInfo").driver, "GetPnicDriverInfo");
    }
    void SetPnicInfo(const PnicInfo&) override { unavailable("SetPnicInfo"); }
    void SetPnicPauseInfo(const PnicPauseInfo&) override { unavailable("SetPnicPauseInfo"); }
    void SetPnicCoalesceInfo(const PnicCoalesceInfo&) override { unavailable("SetPnicCoalesceInfo"); }
    void SetPnicRingInfo(const PnicRingInfo&) override { unavailable("SetPnicRingInfo"); }
    void SetPnicOffloadInfo(const PnicOffloadInfo&) override { unavailable("SetPnicOffloadInfo"); }
    void SetPnicSoftwareSimulationInfo(const PnicSoftwareSimulationInfo&) override
    {
        unavailable("SetPnicSoftwareSimulationInfo");
    }
    void DumpRegister(std::string&) const override { unavailable("DumpRegister"); }
    void DumpEEPROM(std::vector<uint8_t>&) const override { unavailable("DumpEEPROM"); }
    void ChangeEEPROM(uint32_t, const std::vector<uint8_t>&) override { unavailable("ChangeEEPROM"); }
    void ChangeEEPROM(const std::string&) override { unavailable("ChangeEEPROM"); }
    void RestartNegotiation() override { unavailable("RestartNegotiation"); }
    void IdentifyNic(uint32_t) override { unavailable("IdentifyNic"); }
    bool RunSelfTest(bool, std::string&) override { return unavailable("RunSelfTest"), false; }

private:
    const NicModel& check(std::string_view call) const
    {
        checkFault(*host_, call, nic_.name);
        return nic_;
    }

    // A record the fixture may leave out: absent, the adapter does not serve it.
    template <typename Record>
    const Record& record(const std::optional<Record>& value, std::string_view call) const
    {
        if (!value) {
            throw NodeMgrException(nic_.name + ": " + std::string(call) + " is not supported by this adapter");
        }
        return *value;
    }

    // Changes and diagnostics: the simulated host is read-only.
    [[noreturn]] void unavailable(std::string_view call) const
    {
        check(call);
        throw NodeMgrException(nic_.name + ": " + std::string(call) + " is not available on the simulated host");
    }

    std::shared_ptr<const HostModel> host_;
    const NicModel& nic_;
    SimPciDevice pci_;
};

} // namespace

Pnic* makeSimPnic(std::shared_ptr<const HostModel> host, const NicModel& nic)
{
    return new SimPnic(std::move(host), nic);
}

} // namespace orv::platform::sim
