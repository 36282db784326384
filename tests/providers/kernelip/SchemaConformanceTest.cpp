// What the provider returns is what the class definitions declare: every
// property of both instance kinds exists in its class with the CIM type it is
// returned with, both in the project's own class definitions and on top of
// the DMTF 2.28 schema (the reference copy kept beside the repository).
#include <map>
#include <string>

#include "KernelIPFixture.h"
#include "orv/repository/class_repository.hpp"

namespace kernelip {
namespace {

using orv::repository::CimType;

CMPIType cmpiType(CimType type) {
    static const std::map<CimType, CMPIType> types = {
        {CimType::String, CMPI_string}, {CimType::Uint8, CMPI_uint8}, {CimType::Uint16, CMPI_uint16},
        {CimType::Uint32, CMPI_uint32}, {CimType::Boolean, CMPI_boolean}};
    const auto found = types.find(type);
    return found == types.end() ? CMPI_null : found->second;
}

std::filesystem::path dmtfSchema() {
    return orv::providertest::ProviderCore::sourceDir() / "../shared/reference/cim-schema-2.28/cim_schema_2.28.0.mof";
}

class SchemaConformanceTest : public KernelIPTest {
protected:
    // One instance of each family, the IPv4 one with EnabledState set.
    std::vector<std::pair<std::string, std::vector<NamedValue>>> returnedInstances() {
        serve(hostWith({Vnic{"vif0", {{"0.0.0.0", "255.0.0.0"}}, {{"fe80::1", 64}}}}));
        const orv::host::Reply reply = provider().enumerateInstances(kKernelParent);
        std::vector<std::pair<std::string, std::vector<NamedValue>>> instances;
        for (const CMPIInstance* instance : reply.instances()) {
            instances.emplace_back(orv::providertest::classNameOf(instance), orv::providertest::propertiesOf(instance));
        }
        return instances;
    }

    void expectDeclared(const orv::repository::ClassRepository& repository) {
        const auto instances = returnedInstances();
        ASSERT_EQ(instances.size(), 2U);
        for (const auto& [className, properties] : instances) {
            const auto* decl = repository.getClass(orv::providertest::kNamespace, className);
            ASSERT_NE(decl, nullptr) << className;
            for (const NamedValue& property : properties) {
                const auto* declared = decl->findProperty(property.name);
                ASSERT_NE(declared, nullptr) << className << "." << property.name;
                EXPECT_FALSE(declared->type.isArray) << property.name;
                EXPECT_EQ(cmpiType(declared->type.type), property.type) << className << "." << property.name;
            }
        }
    }
};

TEST_F(SchemaConformanceTest, ReturnedPropertiesAreDeclaredWithTheirTypesInTheProjectClasses) {
    orv::repository::ClassRepository repository;
    repository.loadFile(orv::providertest::ProviderCore::mofFile());
    expectDeclared(repository);
}

TEST_F(SchemaConformanceTest, EndpointClassesLoadOnTheDmtfSchemaAndDeclareTheReturnedProperties) {
    // The published schema is reference data kept beside the checkout, not in it.
    if (!std::filesystem::exists(dmtfSchema())) {
        GTEST_SKIP() << "reference schema not present at " << dmtfSchema();
    }
    orv::repository::ClassRepository repository;
    repository.loadFile(dmtfSchema());
    repository.loadFile(orv::providertest::ProviderCore::sourceDir() / "cim/mof/KernelIPProtocolEndpoint.mof");
    EXPECT_TRUE(repository.isA(orv::providertest::kNamespace, kIPv4Class, kCimParent));
    expectDeclared(repository);
}

}  // namespace
}  // namespace kernelip
