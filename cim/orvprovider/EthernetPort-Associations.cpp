// The Ethernet port provider's association side: references from a port to
// its seven far ends, from a far end back to its port, and the enumeration of
// the setting-data associations. The other end's path is always made from
// names: no NIC is asked whether it exists.
#include <cmpi/CmpiResult.h>

#include "EthernetPort-Classes.h"
#include "EthernetPort-Provider.h"
#include "EthernetPort-Request.h"

namespace EthernetProvider {

using NodeMgr::Network::Pnic;

namespace {

bool isEmpty(const char* text) { return text == nullptr || *text == '\0'; }

bool sameName(const char* a, const char* b) { return CmpiString(a).equalsIgnoreCase(b); }

// Whether some row's role (as read by roleOf) is name.
template <typename RoleOf>
bool isKnownRole(const char* name, RoleOf roleOf) {
    for (const FarEndClass& row : farEndClasses()) {
        if (sameName(roleOf(row), name)) {
            return true;
        }
    }
    return false;
}

bool roleAllows(const char* requested, const char* actual) { return isEmpty(requested) || sameName(actual, requested); }

// Whether the class named className in ns is requested or one of its subclasses.
bool classAllows(const CmpiString& ns, const char* className, const char* requested) {
    return isEmpty(requested) || CmpiObjectPath(ns, className).classPathIsA(requested);
}

const char* portRoleOf(const FarEndClass& row) { return row.portRole; }
const char* farRoleOf(const FarEndClass& row) { return row.farRole; }

}  // namespace

CmpiStatus EthernetPortProvider::doReferences(const CmpiContext& ctx, CmpiResult& result,
                                              const CmpiObjectPath& objectPath, const char* assocClass,
                                              const char* resultClass, const char* role, const char* resultRole) {
    const CmpiString className = objectPath.getClassName();
    const CmpiString ns = objectPath.getNameSpace();
    if (className.equalsIgnoreCase(kPortClass)) {
        return doReferencesFromPort(result, objectPath, ns, assocClass, resultClass, role, resultRole);
    }
    if (const FarEndClass* row = findFarEnd(className)) {
        return doReferencesSettingData(ctx, result, objectPath, resultClass, role, resultRole, *row, ns);
    }
    return CmpiStatus(CMPI_RC_OK);
}

// The role names the port's side of the associations (Dependent, Element,
// ManagedElement), the result role the far end's (Antecedent, Stats,
// SettingData). A name no association has answers OK with nothing, without
// returnDone; names that fit but select nothing together still end with
// returnDone.
CmpiStatus EthernetPortProvider::doReferencesFromPort(CmpiResult& result,
                                                      const CmpiObjectPath& objectPath, const CmpiString& ns,
                                                      const char* assocClass, const char* resultClass,
                                                      const char* role, const char* resultRole) {
    if ((!isEmpty(role) && !isKnownRole(role, portRoleOf)) ||
        (!isEmpty(resultRole) && !isKnownRole(resultRole, farRoleOf))) {
        return CmpiStatus(CMPI_RC_OK);
    }
    std::vector<const FarEndClass*> kept;
    for (const FarEndClass& row : farEndClasses()) {
        if (roleAllows(role, row.portRole) && roleAllows(resultRole, row.farRole) &&
            classAllows(ns, row.className, resultClass) && classAllows(ns, row.assocClass, assocClass)) {
            kept.push_back(&row);
        }
    }
    const CmpiString deviceId = getKey(objectPath, kDeviceIdKey);
    if (deviceId.charPtr() == nullptr) {
        return CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "DeviceID specified is not valid");
    }
    for (const FarEndClass* row : kept) {
        doReferencesClassEPSettingData(*row, ns, deviceId.charPtr(), objectPath, result);
    }
    result.returnDone();
    return CmpiStatus(CMPI_RC_OK);
}

// The port reference is the request's own path, not one rebuilt.
void EthernetPortProvider::doReferencesClassEPSettingData(const FarEndClass& row, const CmpiString& ns,
                                                          const char* deviceId,
                                                          const CmpiObjectPath& portPathOfRequest,
                                                          CmpiResult& result) {
    const CmpiObjectPath farEnd = farEndPath(ns, row.className, row, deviceId);
    result.returnData(associationInstance(ns, row.assocClass, row, portPathOfRequest, farEnd));
}

// From a far end, the role must name the far end's side and the result role
// the port's; the association class filter is not looked at. The port is the
// one named after the last ':' of the InstanceID, whatever comes before it.
CmpiStatus EthernetPortProvider::doReferencesSettingData(const CmpiContext& ctx, CmpiResult& result,
                                                         const CmpiObjectPath& objectPath, const char* resultClass,
                                                         const char* role, const char* resultRole,
                                                         const FarEndClass& assocClass, const CmpiString& ns) {
    if (!roleAllows(role, assocClass.farRole) || !roleAllows(resultRole, assocClass.portRole) ||
        !classAllows(ns, kPortClass, resultClass)) {
        return CmpiStatus(CMPI_RC_OK);
    }
    const CmpiString instanceId = getKey(objectPath, kInstanceIdKey);
    const char* deviceName = getDeviceName(instanceId);
    if (deviceName == nullptr) {
        return CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "DeviceID specified is not valid");
    }
    PortRequest request(ctx, *broker, ns);
    const CmpiObjectPath port = request.portPath(deviceName);
    result.returnData(associationInstance(ns, assocClass.assocClass, assocClass, port, objectPath));
    result.returnDone();
    return CmpiStatus(CMPI_RC_OK);
}

void EthernetPortProvider::enumInstSettingAssoc(const FarEndClass& row, const CmpiString& assocClass,
                                                const std::vector<Pnic*>& nics, std::size_t start,
                                                PortRequest& request, CmpiResult& result, bool instances) {
    const CmpiString& ns = request.nameSpace();
    for (std::size_t i = start; i < nics.size(); ++i) {
        const std::string name = nics[i]->GetName();
        const CmpiObjectPath port = request.portPath(name.c_str());
        const CmpiObjectPath settingData = farEndPath(ns, row.className, row, name);
        if (instances) {
            result.returnData(associationInstance(ns, assocClass.charPtr(), row, port, settingData));
        } else {
            result.returnData(associationPath(ns, assocClass.charPtr(), row, port, settingData));
        }
    }
}

}  // namespace EthernetProvider
