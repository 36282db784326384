// Lookup by key: by DeviceID, by each InstanceID class, by each association's
// port reference; each missing key's error and message; classes not served.
#include "EthernetFixture.h"

#include <cmpift.h>

#include "orv/providertest/RegistrationFile.h"

namespace ethernet {
namespace {

using orv::providertest::classNamesOf;
using orv::providertest::keysOf;
using orv::providertest::propertiesOf;
using orv::providertest::propertyOf;

class GetInstanceTest : public EthernetTest {
protected:
    void SetUp() override { serve(hostWith({nic("vmnic0"), nic("vmnic1")})); }

    // An association path with the two references as keys (port first).
    CMPIObjectPath* assocPath(const FarEnd& row, const CMPIObjectPath* port, const CMPIObjectPath* farEnd) {
        CMPIObjectPath* path = provider().path(row.assocClass);
        CMPIValue value{};
        value.ref = const_cast<CMPIObjectPath*>(port);
        path->ft->addKey(path, row.portRole, &value, CMPI_ref);
        value.ref = const_cast<CMPIObjectPath*>(farEnd);
        path->ft->addKey(path, row.farRole, &value, CMPI_ref);
        return path;
    }

    static void expectFailure(const Reply& reply, CMPIrc rc, const std::string& message) {
        EXPECT_EQ(reply.rc(), rc);
        EXPECT_EQ(reply.message(), message);
        EXPECT_TRUE(reply.items().empty());
        EXPECT_EQ(reply.doneCount(), 0u);
    }
};

TEST_F(GetInstanceTest, PortByDeviceIdIgnoresTheOtherKeys) {
    Reply reply = provider().getInstance(kPort, {{"DeviceID", "vmnic1"},
                                                 {"SystemCreationClassName", "Other"},
                                                 {"SystemName", "elsewhere"},
                                                 {"CreationClassName", "Nothing"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_EQ(reply.doneCount(), 1u);
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyOf(reply.instances()[0], "Name")->text, "vmnic1");
    EXPECT_EQ(propertiesOf(reply.instances()[0]).size(), 30u);
}

TEST_F(GetInstanceTest, PortWithoutDeviceIdIsNotFound) {
    expectFailure(core().getInstance(portPathWithoutDeviceId()), CMPI_RC_ERR_NOT_FOUND,
                  "Specified DeviceID is not found");
}

TEST_F(GetInstanceTest, DeviceIdThatNoNicHasGivesSuccessWithNothing) {
    Reply reply = provider().getInstance(kPort, {{"DeviceID", "vmnic9"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 1u);
}

TEST_F(GetInstanceTest, EachInstanceIdClassByItsInstanceId) {
    for (const FarEnd& row : farEnds()) {
        Reply reply = core().getInstance(farEndPath(row.className, instanceId(row.className, "vmnic1")));
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << row.className;
        ASSERT_EQ(reply.instances().size(), 1u) << row.className;
        EXPECT_EQ(propertyOf(reply.instances()[0], "InstanceID")->text, instanceId(row.className, "vmnic1"));
        EXPECT_GT(propertiesOf(reply.instances()[0]).size(), 2u) << row.className;
    }
}

TEST_F(GetInstanceTest, EachInstanceIdClassWithoutInstanceIdIsAnInvalidParameter) {
    for (const FarEnd& row : farEnds()) {
        expectFailure(core().getInstance(provider().path(row.className)), CMPI_RC_ERR_INVALID_PARAMETER,
                      "DeviceID specified is not valid");
    }
}

TEST_F(GetInstanceTest, InstanceIdWithAnyPrefixNamesTheNicAfterTheLastColon) {
    Reply reply = core().getInstance(
        farEndPath("Orvane_EPCoalesceSettingData", "Orvane:Orvane_EPStatisticalInformation:vmnic1"));
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyOf(reply.instances()[0], "ElementName")->text, "vmnic1");
    Reply other = core().getInstance(farEndPath("Orvane_EPCoalesceSettingData", "x:y:vmnic0"));
    ASSERT_EQ(other.instances().size(), 1u);
    EXPECT_EQ(propertyOf(other.instances()[0], "ElementName")->text, "vmnic0");
    EXPECT_EQ(propertyOf(other.instances()[0], "InstanceID")->text, instanceId("Orvane_EPCoalesceSettingData", "vmnic0"));
}

TEST_F(GetInstanceTest, InstanceIdWithoutColonIsAnsweredAsAClassNotServed) {
    expectFailure(core().getInstance(farEndPath("Orvane_EPStatisticalInformation", "vmnic0")), CMPI_RC_ERR_NOT_FOUND,
                  "DeviceID specified is not valid");
}

TEST_F(GetInstanceTest, InstanceIdDeviceNameIsCutAfter127Characters) {
    const std::string longName(130, 'n');
    serve(hostWith({nic(longName), nic(longName.substr(0, 127))}));
    Reply reply = core().getInstance(farEndPath("Orvane_EPPauseParamsSettingData", "a:" + longName));
    ASSERT_EQ(reply.instances().size(), 1u);
    EXPECT_EQ(propertyOf(reply.instances()[0], "ElementName")->text, longName.substr(0, 127));
}

TEST_F(GetInstanceTest, EachAssociationByThePortReferenceAlone) {
    for (const FarEnd& row : farEnds()) {
        // The far-end reference names another NIC: only the port's DeviceID counts.
        Reply reply = core().getInstance(
            assocPath(row, portPath("vmnic1"), farEndPath(row.className, instanceId(row.className, "vmnic0"))));
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << row.assocClass;
        EXPECT_EQ(reply.doneCount(), 1u) << row.assocClass;
        ASSERT_EQ(reply.items().size(), 1u) << row.assocClass;
        ASSERT_EQ(reply.instances().size(), 1u) << row.assocClass;
        const std::vector<NamedValue> refs = propertiesOf(reply.instances()[0]);
        EXPECT_EQ(refs[0], (NamedValue{row.portRole, CMPI_ref, portRefText("vmnic1")})) << row.assocClass;
        EXPECT_EQ(refs[1], (NamedValue{row.farRole, CMPI_ref, farEndRefText(row.className, "vmnic1")}));
    }
}

TEST_F(GetInstanceTest, EachAssociationWhosePortHasNoDeviceIdIsAnInvalidParameter) {
    for (const FarEnd& row : farEnds()) {
        expectFailure(core().getInstance(assocPath(row, portPathWithoutDeviceId(),
                                                   farEndPath(row.className, instanceId(row.className, "vmnic0")))),
                      CMPI_RC_ERR_INVALID_PARAMETER, "DeviceID specified is not valid");
    }
}

TEST_F(GetInstanceTest, NicLookupFailureFailsTheRequest) {
    serve(hostWith({nic("vmnic0")}, Json::array({fault("GetPnicByName")})));
    expectFailure(provider().getInstance(kPort, {{"DeviceID", "vmnic0"}}), CMPI_RC_ERR_FAILED,
                  "Failed to get pnics information");
}

// A class routed to the provider that it does not serve.
class ClassNotServedTest : public EthernetTest {
protected:
    void SetUp() override {
        registration_ = host_.path().parent_path() / "not-served.reg";
        orv::providertest::writeRegistrationFile(registration_, {{"CIM_NetworkPort", "EthernetPortProvider"}});
        orv::providertest::ProviderCoreOptions options;
        options.registrations = {registration_};
        core_ = std::make_unique<orv::providertest::ProviderCore>(options);
    }
    std::filesystem::path registration_;
    std::unique_ptr<orv::providertest::ProviderCore> core_;
};

TEST_F(ClassNotServedTest, GetInstanceIsNotFound) {
    serve(hostWith({nic("vmnic0")}));
    Reply reply = core_->getInstance("CIM_NetworkPort", {{"DeviceID", "vmnic0"}});
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "DeviceID specified is not valid");
}

TEST_F(ClassNotServedTest, EnumerationIsAnInvalidClassWithoutDone) {
    serve(hostWith({nic("vmnic0")}));
    for (bool names : {false, true}) {
        Reply reply = names ? core_->enumerateInstanceNames("CIM_NetworkPort")
                            : core_->enumerateInstances("CIM_NetworkPort");
        EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_CLASS);
        EXPECT_EQ(reply.message(), "");
        EXPECT_EQ(reply.doneCount(), 0u);
        EXPECT_TRUE(reply.items().empty());
    }
}

// The NICs are fetched before the class is looked at: with none there is
// nothing to refuse.
TEST_F(ClassNotServedTest, EnumerationOnAHostWithoutNicsSucceeds) {
    serve(hostWith({}));
    Reply reply = core_->enumerateInstances("CIM_NetworkPort");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    // The broker also asks the provider for the subclass; each call ends with done.
    EXPECT_EQ(reply.doneCount(), reply.providerCalls());
}

}  // namespace
}  // namespace ethernet
