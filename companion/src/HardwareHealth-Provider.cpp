// "HardwareHealthProvider": the host's hardware elements of the twelve watched
// classes (sensors, memory, processors, power supplies, controllers,
// batteries, storage and SAS/SATA ports) as the platform reports them, each
// with its keys, its HealthState when the host gives one and its other
// properties. The latched health state reads these classes through the broker.
#include <dlfcn.h>

#include <optional>
#include <stdexcept>

#include <cmpi/CmpiInstanceMI.h>
#include <omc/ComputerSystem.h>

#include "ElementInstance.h"
#include "WatchedClasses.h"

namespace {

using hwhealth::Selection;
using orv::platform::HealthElement;
using orv::platform::HealthKey;

// A test process may hold requests at a gate of its own
// (HealthElementsTest_Gate), to overlap them with other work.
void passGate() {
    using Gate = void (*)();
    static const Gate gate = reinterpret_cast<Gate>(dlsym(RTLD_DEFAULT, "HealthElementsTest_Gate"));
    if (gate != nullptr) {
        gate();
    }
}

class HardwareHealthProvider : public CmpiInstanceMI {
public:
    HardwareHealthProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        forEachElement(ctx, cop, [&](const HealthElement&, const std::vector<HealthKey>&, const CmpiObjectPath& path) {
            rslt.returnData(path);
            return true;
        });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        forEachElement(ctx, cop, [&](const HealthElement& element, const std::vector<HealthKey>& keys,
                                     const CmpiObjectPath& path) {
            rslt.returnData(hwhealth::instanceOf(path, element, keys, properties));
            return true;
        });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        bool found = false;
        forEachElement(ctx, cop, [&](const HealthElement& element, const std::vector<HealthKey>& keys,
                                     const CmpiObjectPath& path) {
            if (!(path == cop)) {
                return true;
            }
            rslt.returnData(hwhealth::instanceOf(path, element, keys, properties));
            found = true;
            return false;
        });
        if (!found) {
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // Calls visit(element, its keys, its path) for each element the request
    // reaches, until visit answers false.
    template <class Visit>
    void forEachElement(const CmpiContext& ctx, const CmpiObjectPath& cop, Visit visit) {
        passGate();
        Selection selection;
        try {
            selection = hwhealth::elementsFor(cop);
        } catch (const std::runtime_error& error) {
            throw CmpiStatus(CMPI_RC_ERR_FAILED, error.what());
        }
        if (selection.elements.empty()) {
            return;
        }
        std::optional<hwhealth::SystemKeys> system;
        if (selection.watched->systemScoped) {
            system = hwhealth::SystemKeys{CmpiString(OMC::getComputerSystemClassName()),
                                          OMC::getComputerSystemName(ctx, *broker)};
        }
        const CmpiString nameSpace = cop.getNameSpace();
        for (const HealthElement& element : selection.elements) {
            const std::vector<HealthKey> keys = hwhealth::keysOf(element, system ? &*system : nullptr);
            if (!visit(element, keys, hwhealth::pathOf(nameSpace, element, keys))) {
                return;
            }
        }
    }
};

}  // namespace

CMProviderBase(HardwareHealthProvider);

CMInstanceMIFactory(HardwareHealthProvider, HardwareHealthProvider)
