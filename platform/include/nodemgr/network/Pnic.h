// A physical network adapter of the host, as the host-management library
// models it. Objects come from TmkCtl::Network::NetworkInfoImpl and belong to
// the caller. Every operation may throw NodeMgr::Lib::NodeMgrException.
//
// The virtual table layout is part of the interface: after the seven slots of
// NodeMgr::Lib::NodeMgrObject come the operations below, in declaration order.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "nodemgr/lib/NodeMgrObject.h"
#include "nodemgr/network/MacAddress.h"
#include "nodemgr/network/PciDevice.h"
#include "nodemgr/network/PnicRecords.h"
#include "nodemgr/network/PnicTypes.h"

namespace NodeMgr {
namespace Network {

class Pnic : public NodeMgr::Lib::NodeMgrObject {
public:
    // The adapter's PCI function, or null when it has none; owned by the pnic.
    virtual PciDevice* GetPciDevice() const = 0;
    virtual Duplex GetConfiguredDuplex() const = 0;
    virtual Duplex GetDuplex() const = 0;
    virtual bool IsLinkUp() const = 0;
    virtual bool IsOperationalLinkUp() const = 0;
    virtual bool IsAdministrativeLinkUp() const = 0;
    virtual bool IsEnabled() const = 0;
    virtual LinkSpeed GetConfiguredLinkSpeed() const = 0;
    virtual LinkSpeed GetLinkSpeed() const = 0;
    virtual void SetLinkSpeedAndDuplex(LinkSpeed speed, Duplex duplex) = 0;
    virtual uint32_t GetHardwareCapabilities() const = 0;
    virtual std::string GetDriverName() const = 0;
    virtual std::vector<LinkMode> GetSupportedModes() const = 0;
    virtual PnicPortMode GetPort() const = 0;
    virtual std::string GetHint() const = 0;
    virtual MacAddress GetMacAddress() const = 0;
    virtual MacAddress GetVirtualMacAddress() const = 0;
    virtual bool GetResPoolsSchedAllowed() const = 0;
    virtual void SetEnabled(bool enabled) = 0;
    virtual void SetResPoolsSchedAllowed(bool allowed) = 0;
    virtual bool GetResPoolsSchedSupported() const = 0;
    virtual bool GetWakeOnLANEnabled() const = 0;
    virtual bool GetWakeOnLANSupported() const = 0;
    virtual void SetWakeOnLANEnabled(bool enabled) = 0;
    virtual std::string GetDPStatus() const = 0;
    virtual void GetCdpInfo(PnicDiscoveryInfo& info) const = 0;
    virtual void GetLldpInfo(PnicDiscoveryInfo& info) const = 0;
    virtual uint32_t GetMTU() const = 0;
    virtual bool IsPseudoDevice() const = 0;
    virtual void GetSourcePortStats(PnicSourcePortStats& stats) const = 0;
    virtual void GetPnicStats(PnicStats& stats) const = 0;
    virtual void GetPnicPrivStats(std::string& text) const = 0;
    virtual void GetPnicInfo(PnicInfo& info) const = 0;
    virtual void GetPnicPauseInfo(PnicPauseInfo& info) const = 0;
    virtual void GetPnicCoalesceInfo(PnicCoalesceInfo& info) const = 0;
    // preset receives the maximum ring sizes, current the ones in use.
    virtual void GetPnicRingInfo(PnicRingInfo& preset, PnicRingInfo& current) const = 0;
    virtual void GetPnicOffloadInfo(PnicOffloadInfo& info) const = 0;
    virtual void GetPnicSoftwareSimulationInfo(PnicSoftwareSimulationInfo& info) const = 0;
    virtual void GetPnicDriverInfo(PnicDriverInfo& info) const = 0;
    virtual void SetPnicInfo(const PnicInfo& info) = 0;
    virtual void SetPnicPauseInfo(const PnicPauseInfo& info) = 0;
    virtual void SetPnicCoalesceInfo(const PnicCoalesceInfo& info) = 0;
    virtual void SetPnicRingInfo(const PnicRingInfo& info) = 0;
    virtual void SetPnicOffloadInfo(const PnicOffloadInfo& info) = 0;
    virtual void SetPnicSoftwareSimulationInfo(const PnicSoftwareSimulationInfo& info) = 0;
    virtual void DumpRegister(std::string& text) const = 0;
    virtual void DumpEEPROM(std::vector<uint8_t>& bytes) const = 0;
    virtual void ChangeEEPROM(uint32_t offset, const std::vector<uint8_t>& bytes) = 0;
    virtual void ChangeEEPROM(const std::string& imagePath) = 0;
    virtual void RestartNegotiation() = 0;
    virtual void IdentifyNic(uint32_t seconds) = 0;
    virtual bool RunSelfTest(bool offline, std::string& report) = 0;
};

} // namespace Network
} // namespace NodeMgr
