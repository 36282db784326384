// The family's three factories: their function tables, trace lines and the
// objects they build.
#include <dlfcn.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>

#include <orv/testsupport/StderrCapture.h>

#include "LatchedHealthFixture.h"
#include "context.hpp"

namespace latched {
namespace {

using orv::testsupport::StderrCapture;

template <class MI>
using Factory = MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

// What one factory call gave: the function table's name and the handle.
struct Created {
    std::string miName;
    const void* hdl;
};

// The factories of a copy of the family's test build that the broker core
// never loaded, called with the core's broker; every use they hand out is
// given back with a terminating cleanup at the end, which stops the copy's
// threads.
class FactoryTest : public LatchedHealthTest {
protected:
    FactoryTest() {
        start();
        copyDir_ = freshLibraryDir();
        copy_ = dlopen((copyDir_ / (std::string("lib") + kUnderTestLocation + ".so")).c_str(), RTLD_NOW | RTLD_LOCAL);
    }

    ~FactoryTest() override {
        CMPIContext* context = orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        for (const std::function<void(const CMPIContext*)>& release : releases_) {
            release(context);
        }
        context->ft->release(context);
        std::error_code ignored;
        std::filesystem::remove_all(copyDir_, ignored);
    }

    template <class MI>
    Created create(const char* name) {
        EXPECT_NE(copy_, nullptr) << dlerror();
        auto factory = reinterpret_cast<Factory<MI>>(dlsym(copy_, name));
        EXPECT_NE(factory, nullptr) << name;
        CMPIContext* context = orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        CMPIStatus status{CMPI_RC_OK, nullptr};
        MI* mi = factory(broker(), context, &status);
        context->ft->release(context);
        releases_.push_back([mi](const CMPIContext* ctx) { (void)mi->ft->cleanup(mi, ctx, true); });
        return Created{mi->ft->miName, mi->hdl};
    }

    unsigned copyThreadsRunning() {
        auto running = reinterpret_cast<unsigned (*)()>(dlsym(copy_, "VmLatchedHealthTest_ThreadsRunning"));
        for (int i = 0; i < 5000 && running() < 2; ++i) {
            usleep(1000);
        }
        return running();
    }

private:
    std::filesystem::path copyDir_;
    void* copy_ = nullptr;
    std::vector<std::function<void(const CMPIContext*)>> releases_;
};

TEST_F(FactoryTest, FunctionTablesAreNamedAfterTheirProviders) {
    EXPECT_EQ(create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI").miName,
              "instanceOrvane_LatchedHealthState");
    EXPECT_EQ(create<CMPIAssociationMI>("Orvane_LatchedHealthAssociation_Create_AssociationMI").miName,
              "associationOrvane_LatchedHealthAssociation");
    EXPECT_EQ(create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI").miName,
              "indicationOrvane_KernelIPChangedIndication");
}

TEST_F(FactoryTest, OnlyTheInstanceFactoryWritesItsTraceLine) {
    StderrCapture capture;
    (void)create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI");
    (void)create<CMPIAssociationMI>("Orvane_LatchedHealthAssociation_Create_AssociationMI");
    (void)create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI");
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
}

TEST_F(FactoryTest, IpChangedIndicationAndLatchedStateEntryPointsBuildTwoObjects) {
    const Created instance = create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI");
    ASSERT_EQ(copyThreadsRunning(), 2U);  // before the second object, or both would start a pair
    const Created indication = create<CMPIIndicationMI>("Orvane_KernelIPChangedIndication_Create_IndicationMI");
    EXPECT_NE(instance.hdl, indication.hdl);
    EXPECT_EQ(create<CMPIInstanceMI>("Orvane_LatchedHealthState_Create_InstanceMI").hdl, instance.hdl);
    // The second object was built after the threads ran: no second pair.
    usleep(50000);
    EXPECT_EQ(copyThreadsRunning(), 2U);
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
