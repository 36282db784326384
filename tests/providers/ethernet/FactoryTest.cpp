// The two exported factories of the Ethernet port provider as a broker calls
// them: one provider object behind both MI records, the function tables' names
// and versions, and the trace line of the instance factory alone.
#include <dlfcn.h>

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiProviderBase.h>
#include <orv/testsupport/StderrCapture.h>

#include <string>
#include <typeinfo>

#include "EthernetFixture.h"

namespace ethernet {
namespace {

using InstanceFactory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
using AssociationFactory = CMPIAssociationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

const std::string kTraceLine = "--- _Create_InstanceMI() P10CmpiBaseMI\n";

CmpiBaseMI* providerOf(const void* hdl) { return static_cast<CmpiBaseMI*>(const_cast<void*>(hdl)); }

int useCountOf(const void* hdl) { return providerOf(hdl)->getProviderBase()->getUseCount(); }

// Gives back one use of the shared object, as the broker does at unload.
template <class MIRecord>
void release(MIRecord* mi) {
    EXPECT_EQ(mi->ft->cleanup(mi, nullptr, true).rc, CMPI_RC_OK);
}

class FactoryTest : public EthernetTest {
protected:
    void SetUp() override {
        serve(hostWith({nic("vmnic0")}));
        const std::filesystem::path file = orv::providertest::ProviderCore::providerDir() / "liborvprovider.so";
        library_ = ::dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(library_, nullptr) << ::dlerror();
        createInstance_ = reinterpret_cast<InstanceFactory>(::dlsym(library_, "EthernetPortProvider_Create_InstanceMI"));
        createAssociation_ =
            reinterpret_cast<AssociationFactory>(::dlsym(library_, "EthernetPortProvider_Create_AssociationMI"));
        ASSERT_NE(createInstance_, nullptr);
        ASSERT_NE(createAssociation_, nullptr);
    }
    void TearDown() override {
        if (library_ != nullptr) {
            ::dlclose(library_);
        }
    }

    CMPIInstanceMI* instanceMI() {
        CMPIStatus status{CMPI_RC_OK, nullptr};
        CMPIInstanceMI* mi = createInstance_(provider().broker(), nullptr, &status);
        EXPECT_EQ(status.rc, CMPI_RC_OK);
        return mi;
    }
    CMPIAssociationMI* associationMI() {
        CMPIStatus status{CMPI_RC_OK, nullptr};
        CMPIAssociationMI* mi = createAssociation_(provider().broker(), nullptr, &status);
        EXPECT_EQ(status.rc, CMPI_RC_OK);
        return mi;
    }

private:
    void* library_ = nullptr;
    InstanceFactory createInstance_ = nullptr;
    AssociationFactory createAssociation_ = nullptr;
};

TEST_F(FactoryTest, BothEntryPointsYieldTwoRecordsWithTheSameHandle) {
    CMPIInstanceMI* instance = instanceMI();
    CMPIAssociationMI* association = associationMI();
    ASSERT_NE(instance, nullptr);
    ASSERT_NE(association, nullptr);
    EXPECT_NE(static_cast<void*>(instance), static_cast<void*>(association));
    EXPECT_EQ(instance->hdl, association->hdl);
    EXPECT_STREQ(typeid(*providerOf(instance->hdl)).name(), "N16EthernetProvider20EthernetPortProviderE");
    release(association);
    release(instance);
}

TEST_F(FactoryTest, EachEntryPointCallRaisesTheUseCountOfTheSharedObject) {
    CMPIInstanceMI* instance = instanceMI();
    const int afterInstance = useCountOf(instance->hdl);
    CMPIAssociationMI* association = associationMI();
    EXPECT_EQ(useCountOf(instance->hdl), afterInstance + 1);
    CMPIInstanceMI* again = instanceMI();
    EXPECT_EQ(again->hdl, instance->hdl);
    EXPECT_EQ(useCountOf(instance->hdl), afterInstance + 2);
    release(association);
    release(again);
    EXPECT_EQ(useCountOf(instance->hdl), afterInstance);
    release(instance);
}

TEST_F(FactoryTest, FunctionTablesCarryVersion200AndTheKindWordBeforeTheProviderName) {
    CMPIInstanceMI* instance = instanceMI();
    CMPIAssociationMI* association = associationMI();
    EXPECT_EQ(instance->ft->ftVersion, 200);
    EXPECT_EQ(instance->ft->miVersion, 200);
    EXPECT_STREQ(instance->ft->miName, "instanceEthernetPortProvider");
    EXPECT_EQ(association->ft->ftVersion, 200);
    EXPECT_EQ(association->ft->miVersion, 200);
    EXPECT_STREQ(association->ft->miName, "associationEthernetPortProvider");
    release(association);
    release(instance);
}

TEST_F(FactoryTest, InstanceEntryPointWritesTheTraceLineOnEveryCall) {
    orv::testsupport::StderrCapture capture;
    CMPIInstanceMI* first = instanceMI();
    CMPIInstanceMI* second = instanceMI();
    EXPECT_EQ(capture.finish(), kTraceLine + kTraceLine);
    release(second);
    release(first);
}

TEST_F(FactoryTest, AssociationEntryPointWritesNothing) {
    orv::testsupport::StderrCapture capture;
    CMPIAssociationMI* first = associationMI();
    CMPIAssociationMI* second = associationMI();
    EXPECT_EQ(capture.finish(), "");
    release(second);
    release(first);
}

TEST_F(FactoryTest, BothEntryPointsTogetherWriteOneTraceLine) {
    orv::testsupport::StderrCapture capture;
    CMPIAssociationMI* association = associationMI();
    CMPIInstanceMI* instance = instanceMI();
    EXPECT_EQ(capture.finish(), kTraceLine);
    release(instance);
    release(association);
}

}  // namespace
}  // namespace ethernet
