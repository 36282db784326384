// A test provider of the twelve watched hardware classes: it publishes the
// hardware elements that the platform reports for the requested class (on the
// simulated host, the fixture's "health" section), each with its keys and,
// when the host gives one, its HealthState.
#include <dlfcn.h>

#include <stdexcept>
#include <vector>

#include <cmpi/CmpiInstanceMI.h>
#include <orv/platform/HealthElements.h>

namespace {

using orv::platform::HealthElement;

// A test process may hold requests at a gate of its own (HealthElementsTest_Gate).
void passGate() {
    using Gate = void (*)();
    static const Gate gate = reinterpret_cast<Gate>(dlsym(RTLD_DEFAULT, "HealthElementsTest_Gate"));
    if (gate != nullptr) {
        gate();
    }
}

std::vector<HealthElement> elementsOf(const CmpiObjectPath& cop) {
    passGate();
    try {
        return orv::platform::healthElementsOf(cop.getClassName().charPtr());
    } catch (const std::runtime_error& error) {
        throw CmpiStatus(CMPI_RC_ERR_FAILED, error.what());
    }
}

CmpiObjectPath pathOf(const CmpiString& nameSpace, const HealthElement& element) {
    CmpiObjectPath path(nameSpace, element.className.c_str());
    if (element.hostName) {
        path.setHostname(element.hostName->c_str());
    }
    for (const orv::platform::HealthKey& key : element.keys) {
        path.setKey(key.name.c_str(), key.text ? CmpiData(key.text->c_str()) : CmpiData(CMPIUint32(key.number)));
    }
    return path;
}

CmpiInstance instanceOf(const CmpiObjectPath& path, const HealthElement& element) {
    CmpiInstance instance(path);
    for (const orv::platform::HealthKey& key : element.keys) {
        instance.setProperty(key.name.c_str(),
                             key.text ? CmpiData(key.text->c_str()) : CmpiData(CMPIUint32(key.number)));
    }
    if (element.healthState) {
        if (*element.healthState) {
            instance.setProperty("HealthState", CmpiData(CMPIUint16(**element.healthState)));
        } else {
            instance.setProperty("HealthState", CmpiData());
        }
    }
    return instance;
}

class HealthElementsProvider : public CmpiInstanceMI {
public:
    HealthElementsProvider(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        for (const HealthElement& element : elementsOf(cop)) {
            rslt.returnData(pathOf(cop.getNameSpace(), element));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop, const char**) override {
        for (const HealthElement& element : elementsOf(cop)) {
            rslt.returnData(instanceOf(pathOf(cop.getNameSpace(), element), element));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus getInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop, const char**) override {
        for (const HealthElement& element : elementsOf(cop)) {
            const CmpiObjectPath path = pathOf(cop.getNameSpace(), element);
            if (path == cop) {
                rslt.returnData(instanceOf(path, element));
                rslt.returnDone();
                return CmpiStatus(CMPI_RC_OK);
            }
        }
        return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
    }
};

}  // namespace

CMProviderBase(HealthElementsProvider);

CMInstanceMIFactory(HealthElementsProvider, HealthElementsProvider)
