// The IP-changed indication: one "Orvane_KernelIPChangedIndication" per
// replaced address, delivered through the broker.
#include <syslog.h>

#include <ctime>
#include <string>

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiStatus.h>
#include <omc/ComputerSystem.h>

#include "KernelIpIndication.h"

namespace ORV {

namespace {

constexpr const char* kNamespace = "root/cimv2";
constexpr const char* kIndicationClass = "Orvane_KernelIPChangedIndication";
constexpr CMPIUint16 kPerceivedSeverity = 3;
constexpr CMPIUint64 kMicrosecondsPerSecond = 1000000;

std::string quoted(const std::string& value) { return "\"" + value + "\""; }

// The source instance's model path. The key values are quoted as they are,
// without escaping.
std::string sourceModelPath(const CmpiContext& context, CmpiBroker* broker, const std::string& className,
                            const std::string& ifname) {
    const CmpiString systemName = OMC::getComputerSystemName(context, *broker);
    return std::string(kNamespace) + ":" + className + ".SystemCreationClassName=" +
           quoted(OMC::getComputerSystemClassName()) + ",SystemName=" +
           quoted(systemName.charPtr() == nullptr ? "" : systemName.charPtr()) +
           ",CreationClassName=" + quoted(className) + ",Name=" + quoted(ifname);
}

}  // namespace

void KernelIpIndication::send(CmpiContext const& context, CmpiBroker* broker, std::string const& ifname,
                              AddressPtr const& previous, AddressPtr const& current) {
    CmpiInstance instance(CmpiObjectPath(kNamespace, kIndicationClass));
    formatIndication(context, instance, broker, ifname, previous, current);
    try {
        broker->deliverIndication(context, kNamespace, instance);
    } catch (const CmpiStatus& status) {
        syslog(LOG_ERR, "Failed to deliver indication %d\n", static_cast<int>(status.rc()));
    }
}

void KernelIpIndication::formatIndication(CmpiContext const& context, CmpiInstance& instance, CmpiBroker* broker,
                                          std::string const& ifname, AddressPtr const& previous,
                                          AddressPtr const& current) {
    const CMPIUint64 now = static_cast<CMPIUint64>(std::time(nullptr)) * kMicrosecondsPerSecond;
    instance.setProperty("IndicationIdentifier", CmpiData(("Orvane:" + ifname).c_str()));
    instance.setProperty("IndicationTime", CmpiData(CmpiDateTime(now, false)));
    instance.setProperty("PerceivedSeverity", CmpiData(kPerceivedSeverity));
    instance.setProperty("SourceInstance", CmpiData(current->buildInterfaceObject(context, broker, ifname)));
    instance.setProperty("PreviousInstance", CmpiData(previous->buildInterfaceObject(context, broker, ifname)));
    instance.setProperty("SourceInstanceModelPath",
                         CmpiData(sourceModelPath(context, broker, current->getCreationClassName(), ifname).c_str()));
    instance.setProperty("SourceInstanceHost", CmpiData(current->getAddress().c_str()));
}

}  // namespace ORV
