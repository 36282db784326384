// "ComputerSystemProvider": the host's computer system, the one instance of
// "OMC_UnitaryComputerSystem" whose keys every host-scoped path of the
// project's libraries carries, so that associations that lead to it (the
// installed hypervisor image's) find it.
#include <cmpi/CmpiInstanceMI.h>

#include "SystemInstance.h"

namespace {

class ComputerSystemProvider : public CmpiInstanceMI {
public:
    ComputerSystemProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        if (hwhealth::requestReachesSystem(cop)) {
            rslt.returnData(hwhealth::systemPath(ctx, *broker, cop.getNameSpace()));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        if (hwhealth::requestReachesSystem(cop)) {
            rslt.returnData(hwhealth::systemInstance(hwhealth::systemPath(ctx, *broker, cop.getNameSpace()), properties));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        const CmpiObjectPath system = hwhealth::systemPath(ctx, *broker, cop.getNameSpace());
        if (!hwhealth::requestReachesSystem(cop) || !hwhealth::isSystemPath(cop, system)) {
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        rslt.returnData(hwhealth::systemInstance(system, properties));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
};

}  // namespace

CMProviderBase(ComputerSystemProvider);

CMInstanceMIFactory(ComputerSystemProvider, ComputerSystemProvider)
