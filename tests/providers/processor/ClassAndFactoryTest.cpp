// The class definition and registration of "Orvane_Processor", the provider's
// factory, the operations it refuses and requests for other classes.
#include "ProcessorFixture.h"
#include "orv/repository/class_repository.hpp"
#include "orv/repository/registration.hpp"
#include "orv/testsupport/StderrCapture.h"

namespace processortest {
namespace {

using orv::providertest::ProviderCore;
using orv::repository::CimType;

TEST(ProcessorClassTest, DerivesFromTheCimProcessorWithElementNameAsFifthKey) {
    orv::repository::ClassRepository repository;
    repository.loadFile(ProviderCore::mofFile());
    const std::string ns(orv::providertest::kNamespace);
    EXPECT_EQ(repository.superclassChain(ns, kProcessorClass).at(0), "CIM_Processor");
    std::vector<std::string> keys = repository.keyNames(ns, kProcessorClass);
    std::sort(keys.begin(), keys.end());
    EXPECT_EQ(keys, (std::vector<std::string>{"CreationClassName", "DeviceID", "ElementName",
                                              "SystemCreationClassName", "SystemName"}));
}

TEST(ProcessorClassTest, EveryPropertySetIsDeclaredWithItsType) {
    orv::repository::ClassRepository repository;
    repository.loadFile(ProviderCore::mofFile());
    const auto* cls = repository.getClass(orv::providertest::kNamespace, kProcessorClass);
    ASSERT_NE(cls, nullptr);
    const std::vector<std::tuple<const char*, CimType, bool>> expected = {
        {"SystemCreationClassName", CimType::String, false},
        {"SystemName", CimType::String, false},
        {"CreationClassName", CimType::String, false},
        {"DeviceID", CimType::String, false},
        {"ElementName", CimType::String, false},
        {"OperationalStatus", CimType::Uint16, true},
        {"Vendor", CimType::Uint16, false},
        {"NumberOfEnabledCores", CimType::Uint16, false},
        {"Stepping", CimType::String, false},
        {"ModelName", CimType::String, false},
        {"OtherIdentifyingInfo", CimType::String, true},
        {"IdentifyingDescriptions", CimType::String, true},
        {"CPUStatus", CimType::Uint16, false},
        {"Characteristics", CimType::Uint16, true},
        {"EnabledProcessorCharacteristics", CimType::Uint16, true},
    };
    for (const auto& [name, type, isArray] : expected) {
        const auto* property = cls->findProperty(name);
        ASSERT_NE(property, nullptr) << name;
        EXPECT_EQ(property->type.type, type) << name;
        EXPECT_EQ(property->type.isArray, isArray) << name;
    }
}

TEST(ProcessorClassTest, ProviderIsRegisteredForInstancesInRootCimv2) {
    const auto registrations = orv::repository::RegistrationSet::parseFile(ProviderCore::registrationFile());
    const auto found = registrations.forClass(kProcessorClass);
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0]->provider, "OrvaneProcessorProvider");
    EXPECT_EQ(found[0]->location, "orvprovider");
    EXPECT_EQ(found[0]->kinds, static_cast<std::uint8_t>(orv::repository::ProviderKind::Instance));
    EXPECT_EQ(found[0]->namespaces, (std::vector<std::string>{"root/cimv2"}));
}

class ProcessorFactoryTest : public ProcessorTest {};

TEST_F(ProcessorFactoryTest, FirstRequestWritesTheFactoryTraceLine) {
    serve(uniformHost(1, 1));
    orv::testsupport::StderrCapture capture;
    const orv::host::Reply reply = provider().enumerateInstances(kProcessorClass);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
}

TEST_F(ProcessorFactoryTest, CreateInstanceIsNotSupported) {
    serve(uniformHost(1, 1));
    const orv::host::Reply names = provider().enumerateInstanceNames(kProcessorClass);
    ASSERT_EQ(names.objectPaths().size(), 1U);
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIInstance* instance = provider().broker()->eft->newInstance(provider().broker(), names.objectPaths()[0], &st);
    ASSERT_EQ(st.rc, CMPI_RC_OK);
    const orv::host::Reply reply = provider().core().createInstance(provider().path(kProcessorClass), instance);
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_TRUE(reply.items().empty());
}

TEST_F(ProcessorFactoryTest, DeleteAndModifyAreNotSupported) {
    serve(uniformHost(1, 1));
    const CMPIObjectPath* path = provider().path(kProcessorClass, processorKeys("cpu-0"));
    EXPECT_EQ(provider().core().deleteInstance(path).rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    const orv::host::Reply found = provider().getInstance(kProcessorClass, processorKeys("cpu-0"));
    ASSERT_EQ(found.instances().size(), 1U);
    EXPECT_EQ(provider().core().modifyInstance(path, found.instances()[0]).rc(), CMPI_RC_ERR_NOT_SUPPORTED);
}

}  // namespace
}  // namespace processortest
