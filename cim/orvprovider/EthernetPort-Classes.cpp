// The table of classes served by the Ethernet port provider.
#include "EthernetPort-Classes.h"

#include "EthernetPort-Provider.h"

namespace EthernetProvider {
namespace {

using NodeMgr::Network::Pnic;

const FarEndClass kFarEnds[kFarEndCount] = {
    {"Orvane_EPDriverSoftwareIdentity", "Orvane:Orvane_EPDriverSoftwareIdentity:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPDriverInstance(i, n); },
     "Orvane_EPDriverElementSoftwareIdentity", "Dependent", "Antecedent", AssociationGroup::SoftwareIdentity},
    {"Orvane_EPFirmwareSoftwareIdentity", "Orvane:Orvane_EPFirmwareSoftwareIdentity:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPFirmwareInstance(i, n); },
     "Orvane_EPFirmwareElementSoftwareIdentity", "Dependent", "Antecedent", AssociationGroup::SoftwareIdentity},
    {"Orvane_EPStatisticalInformation", "Orvane:Orvane_EPStatisticalInformation:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPStatsInstance(i, n); },
     "Orvane_EPStatistics", "Element", "Stats", AssociationGroup::Statistics},
    {"Orvane_EPCoalesceSettingData", "Orvane:Orvane_EPCoalesceSettingData:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPCoalesceInstance(i, n); },
     "Orvane_EPCoalesceElementSettingData", "ManagedElement", "SettingData", AssociationGroup::SettingData},
    {"Orvane_EPPauseParamsSettingData", "Orvane:Orvane_EPPauseParamsSettingData:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPPauseParamsInstance(i, n); },
     "Orvane_EPPauseParamsElementSettingData", "ManagedElement", "SettingData", AssociationGroup::SettingData},
    {"Orvane_EPRingCurrentSettingData", "Orvane:Orvane_EPRingCurrentSettingData:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPRingInstance(i, n, true); },
     "Orvane_EPRingCurrentElementSettingData", "ManagedElement", "SettingData", AssociationGroup::SettingData},
    {"Orvane_EPRingPresetSettingData", "Orvane:Orvane_EPRingPresetSettingData:",
     [](EthernetPortProvider& p, CmpiInstance& i, Pnic* n) { p.fillEPRingInstance(i, n, false); },
     "Orvane_EPRingPresetElementSettingData", "ManagedElement", "SettingData", AssociationGroup::SettingData},
};

}  // namespace

const FarEndClass (&farEndClasses())[kFarEndCount] { return kFarEnds; }

const FarEndClass* findFarEnd(const CmpiString& className) {
    for (const FarEndClass& row : kFarEnds) {
        if (className.equalsIgnoreCase(row.className)) {
            return &row;
        }
    }
    return nullptr;
}

ServedClass findServedClass(const CmpiString& className) {
    if (className.equalsIgnoreCase(kPortClass)) {
        return {ServedClass::Kind::Port, nullptr};
    }
    if (const FarEndClass* row = findFarEnd(className)) {
        return {ServedClass::Kind::FarEnd, row};
    }
    for (const FarEndClass& row : kFarEnds) {
        if (className.equalsIgnoreCase(row.assocClass)) {
            return {ServedClass::Kind::Association, &row};
        }
    }
    return {};
}

}  // namespace EthernetProvider
