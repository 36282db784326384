// The path and the instance of one hardware element the platform reports:
// its keys (completed with the computer system's keys where its class is
// scoped by the system and the platform left them out), its HealthState and
// its other properties, typed as the platform gives them.
#pragma once

#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <orv/platform/HealthElements.h>

namespace hwhealth {

// The keys of the computer system, asked once per request.
struct SystemKeys {
    CmpiString creationClassName;
    CmpiString name;
};

// The element's keys: its own, then SystemCreationClassName and SystemName
// when `systemKeys` is given and the element lacks them.
std::vector<orv::platform::HealthKey> keysOf(const orv::platform::HealthElement& element,
                                             const SystemKeys* systemKeys);

CmpiObjectPath pathOf(const CmpiString& nameSpace, const orv::platform::HealthElement& element,
                      const std::vector<orv::platform::HealthKey>& keys);

// The instance on `path`, limited to `properties` when given (keys always kept).
CmpiInstance instanceOf(const CmpiObjectPath& path, const orv::platform::HealthElement& element,
                        const std::vector<orv::platform::HealthKey>& keys, const char** properties);

CmpiData valueOf(const orv::platform::HealthPropertyValue& value);

}  // namespace hwhealth
