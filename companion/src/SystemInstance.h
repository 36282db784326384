// The one instance of the host's computer system: the keys every path of the
// project's libraries carries, its names, the firmware's identification of the
// machine and the health rolled up from the watched hardware classes.
#pragma once

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>

namespace hwhealth {

// The system's path in the namespace: CreationClassName and Name.
CmpiObjectPath systemPath(const CmpiContext& ctx, const CmpiBroker& broker, const CmpiString& nameSpace);

// True when `request` names the system's own class or one of its superclasses.
bool requestReachesSystem(const CmpiObjectPath& request);

// True when the keys of `request` are the system's (the class name and the
// host name compared ignoring case).
bool isSystemPath(const CmpiObjectPath& request, const CmpiObjectPath& system);

// The instance on `path`, limited to `properties` when given.
CmpiInstance systemInstance(const CmpiObjectPath& path, const char** properties);

}  // namespace hwhealth
