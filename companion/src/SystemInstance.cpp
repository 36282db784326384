#include "SystemInstance.h"

#include <strings.h>

#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiStatus.h>
#include <omc/ComputerSystem.h>
#include <orv/platform/HostInfo.h>
#include <orv/platform/SystemIdentity.h>

#include "SystemHealth.h"

namespace hwhealth {

namespace {

constexpr const char* kClassKey = "CreationClassName";
constexpr const char* kNameKey = "Name";
const char* kKeyNames[] = {kClassKey, kNameKey, nullptr};

// CIM_System.NameFormat for a name given by the host's DNS name.
constexpr const char* kNameFormat = "IP";
// CIM_ComputerSystem.Dedicated: a general-purpose system.
constexpr CMPIUint16 kNotDedicated = 0;
constexpr std::size_t kHostNameSize = 256;

using Identification = std::vector<std::pair<std::string, std::string>>;  // description, value

std::string keyText(const CmpiObjectPath& path, const char* key) {
    try {
        const CmpiData value = path.getKey(key);
        const char* text = value;
        return text != nullptr ? text : "";
    } catch (const CmpiStatus&) {
        return "";
    }
}

std::string shortHostName() {
    char name[kHostNameSize] = {0};
    return OrvHost_GetHostName(name, sizeof name) == 0 ? name : "";
}

orv::platform::SystemIdentity identityOrNone() {
    try {
        return orv::platform::systemIdentity();
    } catch (const std::runtime_error&) {
        return {};
    }
}

// What identifies the machine besides its Name, with the description of each.
Identification identificationOf(const std::string& hostName, const orv::platform::SystemIdentity& identity) {
    Identification out;
    auto add = [&out](const char* description, const std::optional<std::string>& value) {
        if (value && !value->empty()) {
            out.emplace_back(description, *value);
        }
    };
    add("Host name", hostName);
    add("Vendor", identity.vendor);
    add("Product name", identity.product);
    add("Serial number", identity.serialNumber);
    add("UUID", identity.uuid);
    return out;
}

std::string descriptionOf(const orv::platform::SystemIdentity& identity) {
    std::string make = identity.vendor.value_or("");
    if (identity.product) {
        make += (make.empty() ? "" : " ") + *identity.product;
    }
    return make.empty() ? "Computer system" : "Computer system: " + make;
}

CmpiData stringArray(const std::vector<std::string>& items) {
    CmpiArray array(static_cast<CMPICount>(items.size()), CMPI_string);
    for (std::size_t i = 0; i < items.size(); ++i) {
        array[static_cast<int>(i)] = CmpiData(CmpiString(items[i].c_str()));
    }
    return CmpiData(array);
}

CmpiData uint16Array(CMPIUint16 value) {
    CmpiArray array(1, CMPI_uint16);
    array[0] = CmpiData(value);
    return CmpiData(array);
}

void setIdentification(CmpiInstance& instance, const Identification& identification) {
    std::vector<std::string> values;
    std::vector<std::string> descriptions;
    for (const auto& [description, value] : identification) {
        descriptions.push_back(description);
        values.push_back(value);
    }
    instance.setProperty("OtherIdentifyingInfo", stringArray(values));
    instance.setProperty("IdentifyingDescriptions", stringArray(descriptions));
}

}  // namespace

CmpiObjectPath systemPath(const CmpiContext& ctx, const CmpiBroker& broker, const CmpiString& nameSpace) {
    CmpiObjectPath path(nameSpace, OMC::getComputerSystemClassName());
    path.setKey(kClassKey, CmpiData(OMC::getComputerSystemClassName()));
    path.setKey(kNameKey, CmpiData(OMC::getComputerSystemName(ctx, broker)));
    return path;
}

bool requestReachesSystem(const CmpiObjectPath& request) {
    const CmpiString requested = request.getClassName();
    return ::strcasecmp(requested.charPtr(), OMC::getComputerSystemClassName()) == 0 ||
           CmpiObjectPath(request.getNameSpace(), OMC::getComputerSystemClassName()).classPathIsA(requested.charPtr());
}

bool isSystemPath(const CmpiObjectPath& request, const CmpiObjectPath& system) {
    return ::strcasecmp(keyText(request, kClassKey).c_str(), keyText(system, kClassKey).c_str()) == 0 &&
           ::strcasecmp(keyText(request, kNameKey).c_str(), keyText(system, kNameKey).c_str()) == 0;
}

CmpiInstance systemInstance(const CmpiObjectPath& path, const char** properties) {
    const std::string name = keyText(path, kNameKey);
    const std::string hostName = shortHostName();
    const orv::platform::SystemIdentity identity = identityOrNone();
    const CMPIUint16 health = rolledUpHealthState();

    CmpiInstance instance(path);
    instance.setPropertyFilter(properties, kKeyNames);
    instance.setProperty(kClassKey, CmpiData(keyText(path, kClassKey).c_str()));
    instance.setProperty(kNameKey, CmpiData(name.c_str()));
    instance.setProperty("NameFormat", CmpiData(kNameFormat));
    instance.setProperty("ElementName", CmpiData(hostName.empty() ? name.c_str() : hostName.c_str()));
    instance.setProperty("Caption", CmpiData(("Computer system " + (hostName.empty() ? name : hostName)).c_str()));
    instance.setProperty("Description", CmpiData(descriptionOf(identity).c_str()));
    setIdentification(instance, identificationOf(hostName, identity));
    instance.setProperty("Dedicated", uint16Array(kNotDedicated));
    instance.setProperty("HealthState", CmpiData(health));
    instance.setProperty("OperationalStatus", uint16Array(operationalStatusFor(health)));
    return instance;
}

}  // namespace hwhealth
