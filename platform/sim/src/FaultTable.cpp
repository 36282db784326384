#include "FaultTable.h"

#include <algorithm>
#include <iterator>

namespace orv::platform::sim {
namespace {

constexpr std::string_view kKnownCalls[] = {
    // kernel system information
    "KSI_CheckSig", "KSI_Get", "KSI_GetInstanceListAlloc", "KSI_ParamListCreate", "KSI_ParamListDestroy",
    "KSI_ParamListUsedCount", "KSI_ParamListAddString", "KSI_ParamListAddInt", "KSI_ParamListRemoveLastParam",
    "KSI_ParamListGetParam", "KSI_ParamListGetInt32", "KSI_ParamGetString",
    // hardware health elements
    "OrvHealth_Elements",
    // the machine's firmware identity
    "OrvHost_GetSystemIdentity",
    // NIC library entry points
    "GetPnics", "GetPnicByName",
    // pnic operations, base first
    "Refresh", "SaveConfig", "LoadConfig", "Print", "GetName", "GetChildren",
    "GetPciDevice", "GetConfiguredDuplex", "GetDuplex", "IsLinkUp", "IsOperationalLinkUp",
    "IsAdministrativeLinkUp", "IsEnabled", "GetConfiguredLinkSpeed", "GetLinkSpeed", "SetLinkSpeedAndDuplex",
    "GetHardwareCapabilities", "GetDriverName", "GetSupportedModes", "GetPort", "GetHint", "GetMacAddress",
    "GetVirtualMacAddress", "GetResPoolsSchedAllowed", "SetEnabled", "SetResPoolsSchedAllowed",
    "GetResPoolsSchedSupported", "GetWakeOnLANEnabled", "GetWakeOnLANSupported", "SetWakeOnLANEnabled",
    "GetDPStatus", "GetCdpInfo", "GetLldpInfo", "GetMTU", "IsPseudoDevice", "GetSourcePortStats",
    "GetPnicStats", "GetPnicPrivStats", "GetPnicInfo", "GetPnicPauseInfo", "GetPnicCoalesceInfo",
    "GetPnicRingInfo", "GetPnicOffloadInfo", "GetPnicSoftwareSimulationInfo", "GetPnicDriverInfo",
    "SetPnicInfo", "SetPnicPauseInfo", "SetPnicCoalesceInfo", "SetPnicRingInfo", "SetPnicOffloadInfo",
    "SetPnicSoftwareSimulationInfo", "DumpRegister", "DumpEEPROM", "ChangeEEPROM", "RestartNegotiation",
    "IdentifyNic", "RunSelfTest",
    // PCI device operations
    "GetSegment", "GetBus", "GetSlot", "GetFunction", "GetVendorId", "GetDeviceId",
    // version service, host type and host identity
    "TmkuserVersion_GetSystemVersion", "HostType_OSIsTMK", "OrvHost_GetFqdn", "OrvHost_GetHostName",
    "OrvHost_Sysinfo", "getifaddrs",
};

bool paramMatches(const FaultRule& rule, const std::vector<std::string>* params)
{
    if (!rule.param) {
        return true;
    }
    return params != nullptr && std::find(params->begin(), params->end(), *rule.param) != params->end();
}

bool matches(const FaultRule& rule, const CallSite& site)
{
    return rule.call == site.call && rule.addsEntry == site.entrySite && (!rule.node || *rule.node == site.node) && (!rule.nic || *rule.nic == site.nic) &&
           paramMatches(rule, site.params);
}

} // namespace

FaultTable::FaultTable(std::vector<FaultRule> rules)
    : rules_(std::move(rules)), hits_(std::make_unique<std::atomic<uint64_t>[]>(rules_.size()))
{
}

bool FaultTable::counts(std::size_t index, const CallSite& site) const
{
    const FaultRule& rule = rules_[index];
    if (!matches(rule, site)) {
        return false;
    }
    const uint64_t count = hits_[index].fetch_add(1, std::memory_order_relaxed) + 1;
    return !rule.nth || *rule.nth == count;
}

std::vector<const FaultRule*> FaultTable::fireEach(const CallSite& site) const
{
    std::vector<const FaultRule*> fired;
    for (size_t i = 0; i < rules_.size(); ++i) {
        if (counts(i, site)) {
            fired.push_back(&rules_[i]);
        }
    }
    return fired;
}

const FaultRule* FaultTable::firstFired(const CallSite& site) const
{
    const FaultRule* first = nullptr;
    for (size_t i = 0; i < rules_.size(); ++i) {
        if (counts(i, site) && first == nullptr) {
            first = &rules_[i];
        }
    }
    return first;
}

bool isKnownCall(std::string_view call)
{
    return !call.empty() && std::find(std::begin(kKnownCalls), std::end(kKnownCalls), call) != std::end(kKnownCalls);
}

bool callReadsNode(std::string_view call)
{
    return call == "KSI_Get" || call == "KSI_GetInstanceListAlloc";
}

} // namespace orv::platform::sim
