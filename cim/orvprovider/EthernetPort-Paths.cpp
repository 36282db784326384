// Keys and object paths of the Ethernet port provider. Every path is built
// from names alone: no NIC is asked whether it exists.
#include <cstring>

#include "EthernetPort-Classes.h"
#include "EthernetPort-Provider.h"

namespace EthernetProvider {

CmpiString EthernetPortProvider::getKey(const CmpiObjectPath& op, const char* name) {
    try {
        const CmpiData key = op.getKey(name);
        if (key.isNullValue() || key.isNotFound()) {
            return CmpiString();
        }
        return key;
    } catch (const CmpiStatus&) {
        // Absent, or not a text key: the same as absent.
        return CmpiString();
    }
}

const char* EthernetPortProvider::getDeviceName(const CmpiString& id) {
    const char* text = id.charPtr();
    if (text == nullptr) {
        return nullptr;
    }
    const char* colon = std::strrchr(text, ':');
    return colon == nullptr ? nullptr : colon + 1;
}

CmpiObjectPath farEndPath(const CmpiString& ns, const char* className, const FarEndClass& row,
                          const std::string& deviceId) {
    CmpiObjectPath path(ns, className);
    path.setKey(kInstanceIdKey, CmpiData((row.instanceIdPrefix + deviceId).c_str()));
    return path;
}

CmpiObjectPath associationPath(const CmpiString& ns, const char* className, const FarEndClass& row,
                               const CmpiObjectPath& port, const CmpiObjectPath& farEnd) {
    CmpiObjectPath path(ns, className);
    path.setKey(row.portRole, CmpiData(port));
    path.setKey(row.farRole, CmpiData(farEnd));
    return path;
}

CmpiInstance associationInstance(const CmpiString& ns, const char* className, const FarEndClass& row,
                                 const CmpiObjectPath& port, const CmpiObjectPath& farEnd) {
    CmpiInstance instance(CmpiObjectPath(ns, className));
    instance.setProperty(row.portRole, CmpiData(port));
    instance.setProperty(row.farRole, CmpiData(farEnd));
    return instance;
}

}  // namespace EthernetProvider
