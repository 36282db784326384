// The installed-software association: enumeration through the broker's
// software identities, lookup by key, and reference walks from either end
// with their role, result role and result class filters.
#include "SwidFixture.h"
#include "orv/providertest/RegistrationFile.h"

namespace swid {
namespace {

using orv::providertest::classNameOf;
using orv::providertest::keysOf;
using orv::providertest::nameSpaceOf;
using orv::providertest::propertiesOf;

// The system reference as the association names it in names and instances.
const std::string kSystemRef = std::string("/root/cimv2:OMC_UnitaryComputerSystem.Name=") +
                               orv::providertest::SimHost::kFqdn + ",CreationClassName=OMC_UnitaryComputerSystem";
// The same path in the request's namespace, as the reference walks build it.
const std::string kSystemRefInRequestNamespace =
    std::string("root/cimv2:OMC_UnitaryComputerSystem.Name=") + orv::providertest::SimHost::kFqdn +
    ",CreationClassName=OMC_UnitaryComputerSystem";
const std::string kPrimaryRef = std::string("root/cimv2:Orvane_HypervisorSoftwareIdentity.InstanceID=") + kPrimaryId;
const std::string kAlternateRef =
    std::string("root/cimv2:Orvane_HypervisorSoftwareIdentity.InstanceID=") + kAlternateId;

class InstalledSoftwareTest : public SwidTest {
protected:
    void serveWithAlternate() {
        serve(hostWith(versionSection()));
        writeBootCfg("build=6.0.0-3.58.4192238\n");
    }

    orv::host::Reply referenceNames(CMPIObjectPath* path, const char* role = nullptr) {
        return provider().core().referenceNames(path, kAssociationClass, role);
    }

    orv::host::Reply associatorNames(CMPIObjectPath* path, const char* resultClass, const char* role,
                                     const char* resultRole) {
        return provider().core().associatorNames(path, kAssociationClass, resultClass, role, resultRole);
    }

    orv::host::Reply getAssociation(const std::string& softwareId) {
        CMPIObjectPath* name = provider().path(kAssociationClass);
        CMPIValue system{};
        system.ref = systemPath();
        CMPIValue software{};
        software.ref = softwarePath(softwareId);
        name->ft->addKey(name, "System", &system, CMPI_ref);
        name->ft->addKey(name, "InstalledSoftware", &software, CMPI_ref);
        return provider().core().getInstance(name);
    }
};

// "System -> software" pairs of the returned association names or instances.
std::vector<std::string> pairsOf(const orv::host::Reply& reply) {
    std::vector<std::string> pairs;
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        const std::vector<NamedValue> keys = keysOf(path);
        pairs.push_back(textOf(keys, "System") + " -> " + textOf(keys, "InstalledSoftware"));
    }
    for (const CMPIInstance* instance : reply.instances()) {
        const std::vector<NamedValue> properties = propertiesOf(instance);
        pairs.push_back(textOf(properties, "System") + " -> " + textOf(properties, "InstalledSoftware"));
    }
    return pairs;
}

std::vector<std::string> pathsOf(const orv::host::Reply& reply) {
    std::vector<std::string> paths;
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        std::string text = nameSpaceOf(path) + ":" + classNameOf(path);
        const char* separator = ".";
        for (const NamedValue& key : keysOf(path)) {
            text += separator + key.name + "=" + key.text;
            separator = ",";
        }
        paths.push_back(text);
    }
    return paths;
}

TEST_F(InstalledSoftwareTest, WithAnAlternateBankEnumerationYieldsOnlyTheRunningImage) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().enumerateInstanceNames(kAssociationClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRef + " -> " + kPrimaryRef});
    ASSERT_EQ(reply.objectPaths().size(), 1U);
    EXPECT_EQ(classNameOf(reply.objectPaths()[0]), kAssociationClass);
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(InstalledSoftwareTest, WithoutAnAlternateBankEnumerationYieldsTheRunningImage) {
    serve(hostWith(versionSection()));
    const orv::host::Reply reply = provider().enumerateInstanceNames(kAssociationClass);
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRef + " -> " + kPrimaryRef});
}

TEST_F(InstalledSoftwareTest, InstancesCarryBothReferences) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().enumerateInstances(kAssociationClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertiesOf(reply.instances()[0]), (std::vector<NamedValue>{
                                                       {"System", CMPI_ref, kSystemRef},
                                                       {"InstalledSoftware", CMPI_ref, kPrimaryRef},
                                                   }));
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(InstalledSoftwareTest, EnumerationWithoutSoftwareIdentitiesAnswersOkWithoutDone) {
    const std::filesystem::path file = scratchFile("orv-swid-assoc-only.reg");
    orv::providertest::writeRegistrationFile(
        file, {{kAssociationClass, "OrvaneInstalledSoftwareIdentity", "instance association"}});
    restartCore({.projectRegistrations = false, .registrations = {file}});
    std::filesystem::remove(file);
    serve(hostWith(versionSection()));
    const orv::host::Reply reply = provider().enumerateInstanceNames(kAssociationClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.objectPaths().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(InstalledSoftwareTest, SystemKeysAreTakenOnceAtInitialize) {
    serve(hostWith(versionSection()));
    EXPECT_EQ(pairsOf(provider().enumerateInstanceNames(kAssociationClass)),
              std::vector<std::string>{kSystemRef + " -> " + kPrimaryRef});
    Json renamed = hostWith(versionSection());
    renamed["host"]["fqdn"] = "renamed.providers.test";
    serve(renamed);
    EXPECT_EQ(pairsOf(provider().enumerateInstanceNames(kAssociationClass)),
              std::vector<std::string>{kSystemRef + " -> " + kPrimaryRef});
}

TEST_F(InstalledSoftwareTest, GetInstanceOfTheRunningImage) {
    serveWithAlternate();
    const orv::host::Reply reply = getAssociation(kPrimaryId);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRef + " -> " + kPrimaryRef});
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(InstalledSoftwareTest, GetInstanceNamingTheAlternateBankSucceeds) {
    serveWithAlternate();
    const orv::host::Reply reply = getAssociation(kAlternateId);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRef + " -> " + kAlternateRef});
}

TEST_F(InstalledSoftwareTest, GetInstanceOfAnUnknownIdentityFailsWithTheBrokersStatus) {
    serveWithAlternate();
    const orv::host::Reply direct = provider().core().getInstance(softwarePath("Orvane Zolti 1.0.0 build-1"));
    ASSERT_EQ(direct.rc(), CMPI_RC_ERR_NOT_FOUND);
    const orv::host::Reply reply = getAssociation("Orvane Zolti 1.0.0 build-1");
    EXPECT_EQ(reply.rc(), direct.rc());
    EXPECT_EQ(reply.message(), direct.message());
    EXPECT_TRUE(reply.instances().empty());
}

TEST_F(InstalledSoftwareTest, GetInstanceWithAReferenceToAnotherClassAnswersNothing) {
    serveWithAlternate();
    CMPIObjectPath* name = provider().path(kAssociationClass);
    CMPIValue system{};
    system.ref = systemPath();
    name->ft->addKey(name, "System", &system, CMPI_ref);
    name->ft->addKey(name, "InstalledSoftware", &system, CMPI_ref);
    const orv::host::Reply reply = provider().core().getInstance(name);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(reply.doneCount(), 0U);
}

TEST_F(InstalledSoftwareTest, ReferencesFromTheSystemLeaveTheAlternateOut) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().core().references(systemPath(), kAssociationClass, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRefInRequestNamespace + " -> " + kPrimaryRef});
}

TEST_F(InstalledSoftwareTest, AssociatorNamesFromTheSystemAreTheRunningImage) {
    serveWithAlternate();
    const orv::host::Reply reply = associatorNames(systemPath(), nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pathsOf(reply), std::vector<std::string>{kPrimaryRef});
}

TEST_F(InstalledSoftwareTest, AssociatorsFromTheSystemAreTheRunningImagesInstance) {
    serveWithAlternate();
    const orv::host::Reply reply =
        provider().core().associators(systemPath(), kAssociationClass, nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(instanceIdsOf(reply), std::vector<std::string>{kPrimaryId});
}

TEST_F(InstalledSoftwareTest, RoleFromTheSystemIsComparedIgnoringCase) {
    serveWithAlternate();
    EXPECT_EQ(referenceNames(systemPath(), "system").objectPaths().size(), 1U);
    EXPECT_EQ(referenceNames(systemPath(), "System").objectPaths().size(), 1U);
    EXPECT_EQ(referenceNames(systemPath(), "").objectPaths().size(), 1U);
    EXPECT_TRUE(referenceNames(systemPath(), "InstalledSoftware").objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, ResultRoleFromTheSystemMustBeTheSoftware) {
    serveWithAlternate();
    EXPECT_EQ(pathsOf(associatorNames(systemPath(), nullptr, "SYSTEM", "installedsoftware")),
              std::vector<std::string>{kPrimaryRef});
    EXPECT_TRUE(associatorNames(systemPath(), nullptr, nullptr, "System").objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, ResultClassFromTheSystemMustBeASoftwareIdentityClass) {
    serveWithAlternate();
    EXPECT_EQ(pathsOf(associatorNames(systemPath(), "CIM_SoftwareIdentity", nullptr, nullptr)),
              std::vector<std::string>{kPrimaryRef});
    EXPECT_EQ(pathsOf(associatorNames(systemPath(), kSoftwareClass, nullptr, nullptr)),
              std::vector<std::string>{kPrimaryRef});
    EXPECT_TRUE(associatorNames(systemPath(), "CIM_System", nullptr, nullptr).objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, ReferencesFromTheRunningImageNameTheSystemInTheRequestNamespace) {
    serveWithAlternate();
    const orv::host::Reply reply = provider().core().references(softwarePath(kPrimaryId), kAssociationClass, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pairsOf(reply), std::vector<std::string>{kSystemRefInRequestNamespace + " -> " + kPrimaryRef});
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(InstalledSoftwareTest, ReferencesFromTheAlternateBankYieldNothing) {
    serveWithAlternate();
    const orv::host::Reply reply = referenceNames(softwarePath(kAlternateId));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.objectPaths().empty());
    EXPECT_TRUE(associatorNames(softwarePath(kAlternateId), nullptr, nullptr, nullptr).objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, RoleFromTheSoftwareMustBeTheSoftware) {
    serveWithAlternate();
    EXPECT_EQ(referenceNames(softwarePath(kPrimaryId), "installedSOFTWARE").objectPaths().size(), 1U);
    EXPECT_TRUE(referenceNames(softwarePath(kPrimaryId), "System").objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, ResultRoleAndClassFromTheSoftwareMustBeTheSystem) {
    serveWithAlternate();
    const std::vector<std::string> system{kSystemRefInRequestNamespace};
    EXPECT_EQ(pathsOf(associatorNames(softwarePath(kPrimaryId), nullptr, nullptr, "system")), system);
    EXPECT_EQ(pathsOf(associatorNames(softwarePath(kPrimaryId), "CIM_ComputerSystem", nullptr, nullptr)), system);
    EXPECT_TRUE(associatorNames(softwarePath(kPrimaryId), nullptr, nullptr, "InstalledSoftware").objectPaths().empty());
    EXPECT_TRUE(associatorNames(softwarePath(kPrimaryId), "CIM_SoftwareIdentity", nullptr, nullptr).objectPaths().empty());
}

TEST_F(InstalledSoftwareTest, ReferencesFromAnUnrelatedClassYieldNothing) {
    serveWithAlternate();
    CMPIObjectPath* other = provider().path("CIM_UnitaryComputerSystem", {{"Name", "x"}, {"CreationClassName", "y"}});
    const orv::host::Reply reply = referenceNames(other);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.objectPaths().empty());
}

}  // namespace
}  // namespace swid
