// The latched-health family's process-wide state and its three factories.
//
// The state is built by this file's static initialisation, before the three
// provider bases, so that it outlives every provider object, and lasts until
// the process ends.
#include "VmLatchedHealth.h"

#include <cstdlib>

#include <cmpi/CmpiFactory.h>

namespace VmLatchedHealth {

const MonitoredClass monitoredClasses[numMonitoredClasses] = {
    {"CIM_Sensor", "root/cimv2"},
    {"CIM_PhysicalMemory", "root/cimv2"},
    {"CIM_Processor", "root/cimv2"},
    {"CIM_PowerSupply", "root/cimv2"},
    {"Orvane_PortController", "root/cimv2"},
    {"Orvane_Controller", "root/cimv2"},
    {"Orvane_Battery", "root/cimv2"},
    {"Orvane_StorageVolume", "root/cimv2"},
    {"Orvane_StorageExtent", "root/cimv2"},
    {"Orvane_DiskDrive", "root/cimv2"},
    {"Orvane_SASSATAPort", "root/cimv2"},
    {"Orvane_StoragePool", "root/cimv2"},
};

namespace {
// Mutex, condition, list and IP-change detector, in that order (members).
LatchedState g_state;
}  // namespace

LatchedState::~LatchedState() {
    for (HealthInfo* record : healthInfo) {
        FreeCopKeys(record->copKeys, record->copKeyCount);
        std::free(record);
    }
}

LatchedState& state() { return g_state; }

}  // namespace VmLatchedHealth

using VmLatchedHealth::VmLatchedHealthAssociation;
using VmLatchedHealth::VmLatchedHealthState;

CMProviderBase(Orvane_LatchedHealthState);
CMProviderBase(Orvane_LatchedHealthAssociation);
CMProviderBase(Orvane_KernelIPChangedIndication);

CMInstanceMIFactory(VmLatchedHealthState, Orvane_LatchedHealthState)

CMAssociationMIFactory(VmLatchedHealthAssociation, Orvane_LatchedHealthAssociation)

CMIndicationMIFactory(VmLatchedHealthState, Orvane_KernelIPChangedIndication)
