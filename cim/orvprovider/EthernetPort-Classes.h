// The classes the Ethernet port provider serves, as one table: the port, and
// per object that hangs off a port (driver, firmware, statistics, coalesce,
// pause, current ring, preset ring) its class, InstanceID prefix, fill
// operation, and the association that links it to the port with both roles.
// Every operation of the provider walks this table in its order.
#ifndef ORV_ETHERNETPORT_CLASSES_H
#define ORV_ETHERNETPORT_CLASSES_H

#include <cstddef>
#include <string>

#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiString.h>

namespace NodeMgr::Network {
class Pnic;
}

namespace EthernetProvider {

class EthernetPortProvider;

constexpr const char* kPortClass = "Orvane_EthernetPort";
constexpr const char* kDeviceIdKey = "DeviceID";
constexpr const char* kInstanceIdKey = "InstanceID";

// Which association family links a far end to its port.
enum class AssociationGroup { SoftwareIdentity, Statistics, SettingData };

using FillOperation = void (*)(EthernetPortProvider& provider, CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);

struct FarEndClass {
    const char* className;         // the far end's class
    const char* instanceIdPrefix;  // its InstanceID is this followed by the NIC name
    FillOperation fill;
    const char* assocClass;        // the association linking it to the port
    const char* portRole;          // the association's reference to the port
    const char* farRole;           // the association's reference to this far end
    AssociationGroup group;
};

constexpr std::size_t kFarEndCount = 7;

// The seven far-end classes: driver, firmware, statistics, coalesce, pause,
// ring current, ring preset.
const FarEndClass (&farEndClasses())[kFarEndCount];

// What a class name (compared ignoring case) stands for.
struct ServedClass {
    enum class Kind { None, Port, FarEnd, Association };
    Kind kind = Kind::None;
    const FarEndClass* row = nullptr;  // the far end, or the association's far end
};

// Looks the name up in the serving order: the port, the seven far-end
// classes, then their seven associations.
ServedClass findServedClass(const CmpiString& className);

// The far-end row whose class is className (ignoring case), or null.
const FarEndClass* findFarEnd(const CmpiString& className);

// The far end's path in ns, of class className, with the one key InstanceID:
// the row's prefix followed by deviceId.
CmpiObjectPath farEndPath(const CmpiString& ns, const char* className, const FarEndClass& row,
                          const std::string& deviceId);

// An association of row's kind, of class className in ns: as a path whose
// keys, or as an instance whose only properties, are the port's reference
// then the far end's.
CmpiObjectPath associationPath(const CmpiString& ns, const char* className, const FarEndClass& row,
                               const CmpiObjectPath& port, const CmpiObjectPath& farEnd);
CmpiInstance associationInstance(const CmpiString& ns, const char* className, const FarEndClass& row,
                                 const CmpiObjectPath& port, const CmpiObjectPath& farEnd);

}  // namespace EthernetProvider

#endif
