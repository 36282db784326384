// The keys of the computer system that every host-scoped path carries.
#ifndef ORV_OMC_COMPUTERSYSTEM_H
#define ORV_OMC_COMPUTERSYSTEM_H

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>

#include <cmpi/CmpiString.h>

namespace OMC {

// "OMC_UnitaryComputerSystem": the value of SystemCreationClassName.
const char* getComputerSystemClassName();

// The host's fully qualified name, asked afresh from the platform on every
// call: the value of SystemName, as a string of the given broker. Empty
// when the platform cannot tell.
CmpiString getComputerSystemName(const CmpiContext& context, const CmpiBroker& broker);

}  // namespace OMC

#endif
