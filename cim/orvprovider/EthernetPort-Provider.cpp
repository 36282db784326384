// The Ethernet port provider's instance side: enumeration, names and lookup by
// key of the fifteen classes, the refused changes, and the two factories that
// share one provider object.
#include <algorithm>
#include <cstring>
#include <memory>

#include <omc/ComputerSystem.h>
#include <tmkctl/network/NetworkInfoImpl.h>
#include <tmkctl/util/AutoVector.h>

#include "EthernetPort-Classes.h"
#include "EthernetPort-Fill.h"
#include "EthernetPort-Provider.h"
#include "EthernetPort-Request.h"

namespace EthernetProvider {

using NodeMgr::Network::Pnic;

namespace {

constexpr CMPIUint16 kSoftwareStatusCurrent = 2;
// getInstance keeps at most this many characters of an InstanceID's device name.
constexpr std::size_t kDeviceNameLength = 127;

const char* const kDeviceIdNotValid = "DeviceID specified is not valid";

// The reference key name of op, or a null path when it is absent or no reference.
CmpiObjectPath referenceKey(const CmpiObjectPath& op, const char* name) {
    try {
        const CmpiData key = op.getKey(name);
        if (key.getType() != CMPI_ref || key.isNullValue()) {
            return CmpiObjectPath();
        }
        return key;
    } catch (const CmpiStatus&) {
        return CmpiObjectPath();
    }
}

// The NICs a request covers: all of them, or the one named deviceName.
std::vector<Pnic*> fetchPnics(TmkCtl::Network::NetworkInfoImpl& network, const char* deviceName) {
    if (deviceName == nullptr) {
        return network.GetPnics();
    }
    std::vector<Pnic*> pnics;
    std::unique_ptr<Pnic> pnic(network.GetPnicByName(deviceName));
    if (pnic) {
        pnics.push_back(pnic.get());
        pnic.release();
    }
    return pnics;
}

}  // namespace

EthernetPortProvider::EthernetPortProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
    : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx), OMC::SimpleAssociationMI(mbp, ctx) {}

EthernetPortProvider::~EthernetPortProvider() = default;

CmpiStatus EthernetPortProvider::createInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                                const CmpiInstance&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus EthernetPortProvider::setInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                             const CmpiInstance&, const char**) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus EthernetPortProvider::deleteInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&) {
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus EthernetPortProvider::enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                                   const CmpiObjectPath& cop) {
    return enumerate(ctx, rslt, cop, nullptr, nullptr, Delivery::Paths);
}

CmpiStatus EthernetPortProvider::enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                                               const char** properties) {
    return enumInstancesInt(ctx, rslt, cop, properties, nullptr);
}

CmpiStatus EthernetPortProvider::getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                                             const char** properties) {
    std::string deviceName;
    const CmpiStatus found = deviceNameOf(cop, findServedClass(cop.getClassName()), deviceName);
    if (found.rc() != CMPI_RC_OK) {
        return found;
    }
    return enumInstancesInt(ctx, rslt, cop, properties, deviceName.c_str());
}

// Only the identifying key counts: the system keys and the association's
// other reference are not compared.
CmpiStatus EthernetPortProvider::deviceNameOf(const CmpiObjectPath& cop, const ServedClass& served,
                                              std::string& deviceName) const {
    switch (served.kind) {
        case ServedClass::Kind::Port: {
            const CmpiString id = getKey(cop, kDeviceIdKey);
            if (id.charPtr() == nullptr) {
                return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, "Specified DeviceID is not found");
            }
            deviceName = id.charPtr();
            return CmpiStatus(CMPI_RC_OK);
        }
        case ServedClass::Kind::FarEnd: {
            const CmpiString id = getKey(cop, kInstanceIdKey);
            if (id.charPtr() == nullptr) {
                return CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, kDeviceIdNotValid);
            }
            const char* name = getDeviceName(id);
            if (name == nullptr) {
                // An InstanceID without a colon names nothing this provider serves.
                return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, kDeviceIdNotValid);
            }
            deviceName.assign(name, std::min(std::strlen(name), kDeviceNameLength));
            return CmpiStatus(CMPI_RC_OK);
        }
        case ServedClass::Kind::Association: {
            const CmpiObjectPath port = referenceKey(cop, served.row->portRole);
            const CmpiString id = port.isNull() ? CmpiString() : getKey(port, kDeviceIdKey);
            if (id.charPtr() == nullptr) {
                return CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, kDeviceIdNotValid);
            }
            deviceName = id.charPtr();
            return CmpiStatus(CMPI_RC_OK);
        }
        case ServedClass::Kind::None:
            break;
    }
    return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, kDeviceIdNotValid);
}

CmpiStatus EthernetPortProvider::enumInstancesInt(const CmpiContext& ctx, CmpiResult& result,
                                                  const CmpiObjectPath& op, const char** properties,
                                                  const char* deviceName) {
    return enumerate(ctx, result, op, properties, deviceName, Delivery::Instances);
}

// The NICs are fetched before the class is checked, and deleted on every way
// out. A failing NIC call outside the fill operations fails the request
// without returnDone; what was delivered before stays delivered.
CmpiStatus EthernetPortProvider::enumerate(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& op,
                                           const char** properties, const char* deviceName, Delivery delivery) {
    try {
        TmkCtl::Network::NetworkInfoImpl network;
        const TmkCtl::Util::AutoVector<Pnic> pnics(fetchPnics(network, deviceName));
        if (!pnics.empty()) {
            const ServedClass served = findServedClass(op.getClassName());
            if (served.kind == ServedClass::Kind::None) {
                return CmpiStatus(CMPI_RC_ERR_INVALID_CLASS);
            }
            deliverClass(ctx, result, op, served, pnics, properties, delivery);
        }
        result.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    } catch (const NodeMgr::Lib::NodeMgrException&) {
        return CmpiStatus(CMPI_RC_ERR_FAILED, "Failed to get pnics information");
    }
}

void EthernetPortProvider::deliverClass(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& op,
                                        const ServedClass& served, const std::vector<Pnic*>& pnics,
                                        const char** properties, Delivery delivery) {
    const CmpiString className = op.getClassName();
    PortRequest request(ctx, *broker, op.getNameSpace());
    const CmpiString& ns = request.nameSpace();
    if (served.kind == ServedClass::Kind::Association && served.row->group == AssociationGroup::SettingData) {
        // Paths, also for an instance enumeration.
        enumInstSettingAssoc(*served.row, className, pnics, 0, request, result, false);
        return;
    }
    for (Pnic* pnic : pnics) {
        switch (served.kind) {
            case ServedClass::Kind::Port:
                deliverPort(result, request, pnic, properties, delivery);
                break;
            case ServedClass::Kind::FarEnd:
                deliverFarEnd(result, ns, className, *served.row, pnic, delivery);
                break;
            case ServedClass::Kind::Association:
                deliverAssociation(result, request, className, *served.row, pnic, delivery);
                break;
            case ServedClass::Kind::None:
                break;
        }
    }
}

// The only class whose instances honour the request's property list, applied
// without a key list of its own.
void EthernetPortProvider::deliverPort(CmpiResult& result, PortRequest& request, Pnic* pnic,
                                       const char** properties, Delivery delivery) {
    const std::string name = pnic->GetName();
    if (delivery == Delivery::Paths) {
        result.returnData(request.portPath(name.c_str()));
        return;
    }
    CmpiObjectPath path(request.nameSpace(), kPortClass);
    path.setKey(kDeviceIdKey, CmpiData(name.c_str()));
    CmpiInstance instance(path);
    instance.setPropertyFilter(properties, nullptr);
    instance.setProperty("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
    instance.setProperty("SystemName", CmpiData(request.systemName()));
    instance.setProperty("CreationClassName", CmpiData(kPortClass));
    instance.setProperty(kDeviceIdKey, CmpiData(name.c_str()));
    fillEPInstance(instance, pnic, request);
    result.returnData(instance);
}

void EthernetPortProvider::deliverFarEnd(CmpiResult& result, const CmpiString& ns, const CmpiString& className,
                                         const FarEndClass& row, Pnic* pnic, Delivery delivery) {
    const CmpiObjectPath path = farEndPath(ns, className.charPtr(), row, pnic->GetName());
    if (delivery == Delivery::Paths) {
        result.returnData(path);
        return;
    }
    CmpiInstance instance(path);
    instance.setProperty(kInstanceIdKey, path.getKey(kInstanceIdKey));
    row.fill(*this, instance, pnic);
    result.returnData(instance);
}

void EthernetPortProvider::deliverAssociation(CmpiResult& result, PortRequest& request, const CmpiString& className,
                                              const FarEndClass& row, Pnic* pnic, Delivery delivery) {
    const CmpiString& ns = request.nameSpace();
    const std::string name = pnic->GetName();
    const CmpiObjectPath port = request.portPath(name.c_str());
    const CmpiObjectPath farEnd = farEndPath(ns, row.className, row, name);
    if (delivery == Delivery::Paths) {
        result.returnData(associationPath(ns, className.charPtr(), row, port, farEnd));
        return;
    }
    CmpiInstance instance = associationInstance(ns, className.charPtr(), row, port, farEnd);
    if (row.group == AssociationGroup::SoftwareIdentity) {
        instance.setProperty("ElementSoftwareStatus", CmpiData(singleUint16(kSoftwareStatusCurrent)));
    }
    result.returnData(instance);
}

}  // namespace EthernetProvider

CMProviderBase(EthernetPortProvider);

CMInstanceMIFactory(EthernetProvider::EthernetPortProvider, EthernetPortProvider)
CMAssociationMIFactory(EthernetProvider::EthernetPortProvider, EthernetPortProvider)
