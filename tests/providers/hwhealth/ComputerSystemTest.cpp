// The host's computer system served by the companion library: its one
// instance, the keys every path of the project's libraries carries, its names
// and firmware identity, the health rolled up from the watched classes, and
// the installed-software association that leads to it.
#include <cmpift.h>

#include "HwHealthFixture.h"

namespace hwhealth_test {
namespace {

using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

const std::string kSystemPath = std::string("root/cimv2:OMC_UnitaryComputerSystem.CreationClassName=") +
                                kSystemClass + ",Name=" + orv::providertest::SimHost::kFqdn;
// The same path read from an instance, whose keys follow the class's property order.
const std::string kSystemInstancePath = std::string("root/cimv2:OMC_UnitaryComputerSystem.Name=") +
                                        orv::providertest::SimHost::kFqdn + ",CreationClassName=" + kSystemClass;

const Json kSystemSection = {{"vendor", "Orvane Labs"},
                             {"product", "OL-2000"},
                             {"serialNumber", "SN-0042"},
                             {"uuid", "4c4c4544-0042-3610-8057-b7c04f563232"}};

Json device(const std::string& watchedClass, const std::string& id, int healthState) {
    return element(watchedClass, watchedClass, {{"CreationClassName", watchedClass}, {"DeviceID", id}}, healthState);
}

class ComputerSystemTest : public HwHealthTest {
protected:
    const CMPIInstance* onlyInstance(const orv::host::Reply& reply) {
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        EXPECT_EQ(reply.instances().size(), 1U);
        return reply.instances().empty() ? nullptr : reply.instances()[0];
    }

    std::string property(const char* name) {
        replies_.push_back(provider().enumerateInstances(kSystemClass));
        const CMPIInstance* instance = onlyInstance(replies_.back());
        if (instance == nullptr) {
            return "<no instance>";
        }
        const std::optional<NamedValue> value = propertyOf(instance, name);
        return value ? value->text : "<absent>";
    }

    orv::host::Reply getSystem(const std::string& className, const std::string& name) {
        return provider().getInstance(kSystemClass, {{"CreationClassName", className}, {"Name", name}});
    }

private:
    std::vector<orv::host::Reply> replies_;
};

TEST_F(ComputerSystemTest, OneInstanceWithTheKeysThatEveryPathCarries) {
    serve({});
    const orv::host::Reply reply = provider().enumerateInstanceNames(kSystemClass);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(pathsOf(reply), std::vector<std::string>{kSystemPath});
    EXPECT_EQ(instancePathsOf(provider().enumerateInstances(kSystemClass)), std::vector<std::string>{kSystemInstancePath});
}

TEST_F(ComputerSystemTest, PropertiesNameTheHostAndItsFirmwareIdentity) {
    serve({}, {{"system", kSystemSection}});
    const orv::host::Reply reply = provider().enumerateInstances(kSystemClass);
    const CMPIInstance* instance = onlyInstance(reply);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(propertiesOf(instance),
              (std::vector<NamedValue>{
                  {"CreationClassName", CMPI_string, kSystemClass},
                  {"Name", CMPI_string, orv::providertest::SimHost::kFqdn},
                  {"NameFormat", CMPI_string, "IP"},
                  {"ElementName", CMPI_string, "simhost"},
                  {"Caption", CMPI_string, "Computer system simhost"},
                  {"Description", CMPI_string, "Computer system: Orvane Labs OL-2000"},
                  {"OtherIdentifyingInfo", CMPI_stringA,
                   "[simhost, Orvane Labs, OL-2000, SN-0042, 4c4c4544-0042-3610-8057-b7c04f563232]"},
                  {"IdentifyingDescriptions", CMPI_stringA, "[Host name, Vendor, Product name, Serial number, UUID]"},
                  {"Dedicated", CMPI_uint16A, "[0]"},
                  {"HealthState", CMPI_uint16, "5"},
                  {"OperationalStatus", CMPI_uint16A, "[2]"},
              }));
}

TEST_F(ComputerSystemTest, WithoutFirmwareIdentityOnlyTheHostNameIdentifiesIt) {
    serve({}, {{"system", {{"product", "OL-2000"}}}});
    EXPECT_EQ(property("OtherIdentifyingInfo"), "[simhost, OL-2000]");
    EXPECT_EQ(property("IdentifyingDescriptions"), "[Host name, Product name]");
    EXPECT_EQ(property("Description"), "Computer system: OL-2000");
    serve({});
    EXPECT_EQ(property("OtherIdentifyingInfo"), "[simhost]");
    EXPECT_EQ(property("Description"), "Computer system");
}

TEST_F(ComputerSystemTest, IdentityThatCannotBeReadIsLeftOutAndTheInstanceStays) {
    serve({}, {{"system", kSystemSection}}, Json::array({{{"call", "OrvHost_GetSystemIdentity"}}}));
    EXPECT_EQ(property("OtherIdentifyingInfo"), "[simhost]");
}

TEST_F(ComputerSystemTest, HealthIsTheWorstOfTheWatchedElements) {
    serve({device("CIM_Sensor", "fan0", 5), device("Orvane_DiskDrive", "sda", 20), device("CIM_PowerSupply", "ps0", 10)});
    EXPECT_EQ(property("HealthState"), "20");
    EXPECT_EQ(property("OperationalStatus"), "[6]");
}

TEST_F(ComputerSystemTest, HealthIsOkWithoutElements) {
    serve({});
    EXPECT_EQ(property("HealthState"), "5");
    EXPECT_EQ(property("OperationalStatus"), "[2]");
}

TEST_F(ComputerSystemTest, OperationalStatusFollowsTheHealthState) {
    const std::vector<std::pair<int, std::string>> cases = {
        {10, "[3]"}, {15, "[3]"}, {20, "[6]"}, {25, "[6]"}, {30, "[7]"}};
    for (const auto& [health, status] : cases) {
        serve({device("Orvane_Battery", "bat0", health)});
        EXPECT_EQ(property("OperationalStatus"), status) << "HealthState " << health;
    }
}

TEST_F(ComputerSystemTest, UnreadableClassMakesAnOkHealthUnknownButNotAWorseOne) {
    const Json fault = Json::array({{{"call", "OrvHealth_Elements"}, {"param", "Orvane_StoragePool"}}});
    serve({device("CIM_Sensor", "fan0", 5)}, Json::object(), fault);
    EXPECT_EQ(property("HealthState"), "0");
    EXPECT_EQ(property("OperationalStatus"), "[0]");
    serve({device("CIM_Sensor", "fan0", 25)}, Json::object(), fault);
    EXPECT_EQ(property("HealthState"), "25");
}

TEST_F(ComputerSystemTest, GetInstanceAnswersTheSystemsKeysOnly) {
    serve({});
    const orv::host::Reply found = getSystem(kSystemClass, orv::providertest::SimHost::kFqdn);
    ASSERT_EQ(found.rc(), CMPI_RC_OK) << found.message();
    EXPECT_EQ(instancePathsOf(found), std::vector<std::string>{kSystemInstancePath});
    EXPECT_EQ(getSystem(kSystemClass, "SIMHOST.providers.test").rc(), CMPI_RC_OK);
    EXPECT_EQ(getSystem(kSystemClass, "otherhost").rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(getSystem("CIM_ComputerSystem", orv::providertest::SimHost::kFqdn).rc(), CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(ComputerSystemTest, AssociatorsFromTheHypervisorIdentityReturnTheComputerSystem) {
    serve({}, {{"version",
                {{"product", "Orvane Zolti"}, {"productVersion", "6.0.0"}, {"buildVersion", "build-4192238"},
                 {"buildDate", "Jul 5 2016"}, {"buildTime", "12:34:56"}, {"talmekBuild", 4192238}}}});
    CMPIObjectPath* software = provider().path("Orvane_HypervisorSoftwareIdentity",
                                               {{"InstanceID", "Orvane Zolti 6.0.0 build-4192238"}});
    const orv::host::Reply reply =
        provider().core().associators(software, "Orvane_InstalledSoftwareIdentity", nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(instancePathsOf(reply), std::vector<std::string>{kSystemInstancePath});
    ASSERT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(propertyOf(reply.instances()[0], "ElementName")->text, "simhost");
}

}  // namespace
}  // namespace hwhealth_test
