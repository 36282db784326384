// The exported factories of the two providers as a broker calls them: function
// table names and versions, one shared object per provider name, and the
// instance factories' trace line.
#include <dlfcn.h>

#include <orv/testsupport/StderrCapture.h>

#include "SwidFixture.h"

namespace swid {
namespace {

using InstanceFactory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
using AssociationFactory = CMPIAssociationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

class FactoryTest : public SwidTest {
protected:
    void SetUp() override {
        serve(hostWith(versionSection()));
        const std::filesystem::path file = orv::providertest::ProviderCore::providerDir() / "liborvprovider.so";
        library_ = ::dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(library_, nullptr) << ::dlerror();
    }
    void TearDown() override {
        if (library_ != nullptr) {
            ::dlclose(library_);
        }
    }

    template <class Factory>
    Factory factory(const char* name) {
        return reinterpret_cast<Factory>(::dlsym(library_, name));
    }

    const CMPIBroker* broker() { return provider().broker(); }

private:
    void* library_ = nullptr;
};

TEST_F(FactoryTest, BothFactoriesOfTheInstalledSoftwareProviderShareOneObject) {
    const auto createInstance = factory<InstanceFactory>("OrvaneInstalledSoftwareIdentity_Create_InstanceMI");
    const auto createAssociation = factory<AssociationFactory>("OrvaneInstalledSoftwareIdentity_Create_AssociationMI");
    ASSERT_NE(createInstance, nullptr);
    ASSERT_NE(createAssociation, nullptr);
    CMPIStatus status{CMPI_RC_OK, nullptr};
    orv::testsupport::StderrCapture capture;
    CMPIInstanceMI* instanceMI = createInstance(broker(), nullptr, &status);
    CMPIAssociationMI* associationMI = createAssociation(broker(), nullptr, &status);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
    ASSERT_NE(instanceMI, nullptr);
    ASSERT_NE(associationMI, nullptr);
    EXPECT_EQ(instanceMI->hdl, associationMI->hdl);
    EXPECT_STREQ(instanceMI->ft->miName, "instanceOrvaneInstalledSoftwareIdentity");
    EXPECT_STREQ(associationMI->ft->miName, "associationOrvaneInstalledSoftwareIdentity");
    EXPECT_EQ(instanceMI->ft->ftVersion, 200);
    EXPECT_EQ(associationMI->ft->miVersion, 200);
    EXPECT_EQ(associationMI->ft->cleanup(associationMI, nullptr, true).rc, CMPI_RC_OK);
    EXPECT_EQ(instanceMI->ft->cleanup(instanceMI, nullptr, true).rc, CMPI_RC_OK);
}

TEST_F(FactoryTest, SoftwareIdentityFactoryCalledTwiceGivesTheSameObjectAndTwoTraceLines) {
    const auto create = factory<InstanceFactory>("HypervisorSoftwareIdentity_Create_InstanceMI");
    ASSERT_NE(create, nullptr);
    CMPIStatus status{CMPI_RC_OK, nullptr};
    orv::testsupport::StderrCapture capture;
    CMPIInstanceMI* first = create(broker(), nullptr, &status);
    const void* firstHandle = first->hdl;
    CMPIInstanceMI* second = create(broker(), nullptr, &status);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n--- _Create_InstanceMI() P10CmpiBaseMI\n");
    EXPECT_EQ(second->hdl, firstHandle);
    EXPECT_STREQ(second->ft->miName, "instanceHypervisorSoftwareIdentity");
    EXPECT_EQ(second->ft->cleanup(second, nullptr, true).rc, CMPI_RC_OK);
    EXPECT_EQ(first->ft->cleanup(first, nullptr, true).rc, CMPI_RC_OK);
}

TEST_F(FactoryTest, CreateInstanceIsNotSupported) {
    const orv::host::Reply names = provider().enumerateInstanceNames(kSoftwareClass);
    ASSERT_EQ(names.objectPaths().size(), 1U);
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIInstance* instance = broker()->eft->newInstance(broker(), names.objectPaths()[0], &st);
    ASSERT_EQ(st.rc, CMPI_RC_OK);
    const orv::host::Reply reply =
        provider().core().createInstance(provider().path(kSoftwareClass), instance);
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
}

}  // namespace
}  // namespace swid
