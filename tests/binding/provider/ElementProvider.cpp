// Test provider of Test_Element and its subclasses: fixed elements, and
// getInstance keys that make the provider answer in each way a provider can
// (returned or thrown statuses, foreign exceptions, its own lifecycle counts).
#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiProviderBase.h>
#include <cmpi/CmpiResultInstanceToPathFilter.h>

#include <cstring>
#include <stdexcept>
#include <string>

namespace {

unsigned int nextSerial = 0;
unsigned int totalInitializeCalls = 0;

class ElementProvider : public CmpiInstanceMI {
public:
    ElementProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx), serial_(++nextSerial) {}

    CmpiStatus initialize(const CmpiContext&) override {
        ++initializeCalls_;
        ++totalInitializeCalls;
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        if (cop.getClassName().equalsIgnoreCase("Test_Element")) {
            for (const char* name : {"alpha", "beta"}) {
                rslt.returnData(element(cop.getNameSpace().charPtr(), "Test_Element", name, properties));
            }
        }
        if (cop.getClassName().equalsIgnoreCase("Test_PathElement")) {
            // One path as an object path, one as a reference value.
            rslt.returnData(pathElement(cop.getNameSpace().charPtr(), "first"));
            rslt.returnData(CmpiData(pathElement(cop.getNameSpace().charPtr(), "second")));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        CmpiResultInstanceToPathFilter paths(rslt);
        return enumInstances(ctx, paths, cop, nullptr);
    }

    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        const std::string name = static_cast<const char*>(cop.getKey("Name"));
        if (name == "throw-status") throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, "no such element");
        if (name == "throw-status-bare") throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER);
        if (name == "return-status") return CmpiStatus(CMPI_RC_ERR_INVALID_CLASS, "returned failure");
        if (name == "return-status-bare") return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        if (name == "std-exception") throw std::runtime_error("element lookup exploded");
        if (name == "foreign-exception") throw 42;
        if (cop.getClassName().equalsIgnoreCase("Test_PathElement")) {
            rslt.returnData(pathElement(cop.getNameSpace().charPtr(), name.c_str()));
            rslt.returnDone();
            return CmpiStatus(CMPI_RC_OK);
        }
        CmpiInstance inst = element(cop.getNameSpace().charPtr(), cop.getClassName().charPtr(), name.c_str(),
                                    properties);
        if (name == "self") {
            inst.setProperty("InitializeCalls", CMPIUint32(initializeCalls_));
            inst.setProperty("Serial", CMPIUint32(serial_));
            inst.setProperty("UseCount", CMPISint32(getProviderBase()->getUseCount()));
            inst.setProperty("HostExtensions", CmpiBooleanData(ctx.hasThreadMemoryRelease()));
        }
        rslt.returnData(inst);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    static CmpiObjectPath pathElement(const char* ns, const char* name) {
        CmpiObjectPath path(ns, "Test_PathElement");
        path.setKey("Name", CmpiString(name));
        return path;
    }

    static CmpiInstance element(const char* ns, const char* cls, const char* name, const char** properties) {
        CmpiObjectPath path(ns, cls);
        path.setKey("Name", CmpiString(name));
        CmpiInstance inst(path);
        static const char* keys[] = {"Name", nullptr};
        if (properties != nullptr) inst.setPropertyFilter(properties, keys);
        inst.setProperty("Name", CmpiString(name));
        inst.setProperty("Label", CmpiString((std::string("Label of ") + name).c_str()));
        inst.setProperty("Count", CMPIUint32(std::strlen(name)));
        return inst;
    }

    unsigned int serial_;
    unsigned int initializeCalls_ = 0;
};

// A provider whose construction always fails.
class FragileProvider : public CmpiInstanceMI {
public:
    FragileProvider(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {
        throw std::runtime_error("constructor refused");
    }
};

}  // namespace

CMProviderBase(TestElementProvider);
CMInstanceMIFactory(ElementProvider, TestElementProvider)

CMProviderBase(TestTwinProvider);
CMInstanceMIFactory(ElementProvider, TestTwinProvider)

CMProviderBase(TestFragileProvider);
CMInstanceMIFactory(FragileProvider, TestFragileProvider)

// Lifecycle counts of ElementProvider objects, for the factory tests.
CMPI_EXTERN_C unsigned bindingTestConstructions() { return nextSerial; }
CMPI_EXTERN_C unsigned bindingTestInitializations() { return totalInitializeCalls; }
