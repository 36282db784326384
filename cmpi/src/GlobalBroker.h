// The broker that the binding's object constructors use (new strings, paths,
// instances, arrays, date-times, arguments) and that classPathIsA, toString
// and isA ask. Set from the provider's broker when a factory builds a provider.
#ifndef ORV_CMPI_SRC_GLOBALBROKER_H
#define ORV_CMPI_SRC_GLOBALBROKER_H

#include <cmpidt.h>
#include <cmpift.h>

namespace cmpibinding {

void setGlobalBroker(const CMPIBroker* broker);
// The broker, or null before any provider was built.
const CMPIBroker* globalBroker();
// The broker; throws CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE) before any provider was built.
const CMPIBroker* requireBroker();

}  // namespace cmpibinding

#endif
