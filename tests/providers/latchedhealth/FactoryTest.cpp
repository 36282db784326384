// The family's three factories: their function tables, trace lines and the
// objects they build.
#include <dlfcn.h>

#include <cstdio>
#include <fstream>
#include <sstream>

#include <orv/testsupport/StderrCapture.h>

#include "LatchedHealthFixture.h"
#include "context.hpp"

namespace latched {
namespace {

using orv::testsupport::StderrCapture;

template <class MI>
using Factory = MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

class FactoryTest : public LatchedHealthTest {
protected:
    template <class MI>
    MI* create(const char* name) {
        void* library = dlopen(libraryFile().c_str(), RTLD_NOW | RTLD_NOLOAD);
        EXPECT_NE(library, nullptr);
        auto factory = reinterpret_cast<Factory<MI>>(dlsym(library, name));
        EXPECT_NE(factory, nullptr) << name;
        CMPIContext* context = orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        CMPIStatus status{CMPI_RC_OK, nullptr};
        MI* mi = factory(broker(), context, &status);
        context->ft->release(context);
        dlclose(library);
        return mi;
    }
};

TEST_F(FactoryTest, FunctionTablesAreNamedAfterTheirProviders) {
    start();
    EXPECT_STREQ(create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI")->ft->miName,
                 "instanceOrvane_LatchedHealthState");
    EXPECT_STREQ(create<CMPIAssociationMI>("Orvane_LatchedHealthAssociation_Create_AssociationMI")->ft->miName,
                 "associationOrvane_LatchedHealthAssociation");
    EXPECT_STREQ(create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI")->ft->miName,
                 "indicationOrvane_KernelIPChangedIndication");
}

TEST_F(FactoryTest, OnlyTheInstanceFactoryWritesItsTraceLine) {
    start();
    StderrCapture capture;
    (void)create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI");
    (void)create<CMPIAssociationMI>("Orvane_LatchedHealthAssociation_Create_AssociationMI");
    (void)create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI");
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
}

TEST_F(FactoryTest, IpChangedIndicationAndLatchedStateEntryPointsBuildTwoObjects) {
    start();
    const CMPIInstanceMI* instance = create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI");
    const CMPIIndicationMI* indication = create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI");
    EXPECT_NE(instance->hdl, indication->hdl);
    EXPECT_EQ(create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI")->hdl, instance->hdl);
    // Built after the threads run: no second pair.
    EXPECT_EQ(threadsRunning(), 2U);
}

TEST_F(FactoryTest, ProductLibraryExportsTheThreeFactories) {
    const std::filesystem::path library = orv::providertest::ProviderCore::providerDir() / "liborvprovider.so";
    void* handle = dlopen(library.c_str(), RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(handle, nullptr) << dlerror();
    EXPECT_NE(dlsym(handle, "Orvane_LatchedHealthState_Create_InstanceMI"), nullptr);
    EXPECT_NE(dlsym(handle, "Orvane_LatchedHealthAssociation_Create_AssociationMI"), nullptr);
    EXPECT_NE(dlsym(handle, "Orvane_KernelIPChangedIndication_Create_IndicationMI"), nullptr);
    EXPECT_EQ(dlsym(handle, "VmLatchedHealthTest_RunPass"), nullptr);
    dlclose(handle);
}

}  // namespace
}  // namespace latched
