#include <omc/ComputerSystem.h>

#include <cmpi/CmpiStatus.h>
#include <orv/platform/HostInfo.h>

namespace OMC {

namespace {

// Host names are at most 253 characters.
constexpr size_t kNameSize = 256;

}  // namespace

const char* getComputerSystemClassName() { return "OMC_UnitaryComputerSystem"; }

CmpiString getComputerSystemName(const CmpiContext&, const CmpiBroker& broker) {
    char name[kNameSize] = {0};
    if (OrvHost_GetFqdn(name, sizeof name) != 0) {
        name[0] = '\0';
    }
    const CMPIBroker* b = broker.getEnc();
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIString* s = b->eft->newString(b, name, &st);
    if (st.rc != CMPI_RC_OK) {
        throw CmpiStatus(st);
    }
    return CmpiString(s);
}

}  // namespace OMC
