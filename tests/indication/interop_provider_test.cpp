// The interop namespace through the broker core, as clients reach it: the host's
// own description and the subscription classes.
#include "indication_fixture.hpp"
#include "orv/indication/interop_provider.hpp"

namespace orv::indication::test {
namespace {

using ::testing::ElementsAre;
using ::testing::UnorderedElementsAre;

class InteropProviderTest : public IndicationTest {
protected:
    void SetUp() override {
        IndicationTest::SetUp();
        startManager();
        interop_ = std::make_unique<InteropProvider>(*core_, *manager_);
        interop_->registerWithCore();
    }
    void TearDown() override {
        scope_.reset();
        core_->shutdown();
        interop_.reset();
        IndicationTest::TearDown();
    }

    const CMPIBroker* mb() const { return core_->broker(); }

    CMPIObjectPath* classPath(const char* cls) { return mb()->eft->newObjectPath(mb(), kInteropNamespace, cls, nullptr); }

    static std::string str(const CMPIInstance* inst, const char* name) {
        CMPIData d = inst->ft->getProperty(inst, name, nullptr);
        return d.type == CMPI_string && d.value.string != nullptr ? static_cast<const char*>(d.value.string->hdl) : "<none>";
    }

    std::vector<std::string> names(const char* cls, const char* property = "Name") {
        host::Reply reply = core_->enumerateInstances(classPath(cls));
        EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        std::vector<std::string> out;
        for (const CMPIInstance* inst : reply.instances()) {
            out.push_back(str(inst, property));
        }
        return out;
    }

    CMPIInstance* newInstance(const char* cls) { return mb()->eft->newInstance(mb(), classPath(cls), nullptr); }

    static void set(CMPIInstance* inst, const char* name, const char* value) {
        inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
    }

    CMPIObjectPath* named(const char* cls, const char* name) {
        CMPIObjectPath* op = classPath(cls);
        op->ft->addKey(op, "Name", reinterpret_cast<const CMPIValue*>(name), CMPI_chars);
        return op;
    }

    std::unique_ptr<InteropProvider> interop_;
};

TEST_F(InteropProviderTest, DescribesTheHostItsNamespacesAndProfiles) {
    EXPECT_THAT(names("CIM_Namespace"), UnorderedElementsAre("root/cimv2", "root/interop"));
    EXPECT_THAT(names("CIM_ObjectManager"), ElementsAre("orv-cimhost"));
    EXPECT_THAT(names("CIM_RegisteredProfile", "RegisteredName"), ElementsAre("Indications", "Profile Registration"));
    host::Reply service = core_->enumerateInstances(classPath("CIM_IndicationService"));
    ASSERT_EQ(service.instances().size(), 1U);
    const CMPIInstance* inst = service.instances()[0];
    EXPECT_EQ(inst->ft->getProperty(inst, "DeliveryRetryAttempts", nullptr).value.uint16, 3);
    EXPECT_EQ(inst->ft->getProperty(inst, "DeliveryRetryInterval", nullptr).value.uint32, 20U);
    EXPECT_EQ(str(inst, "SystemName"), "testhost");
}

TEST_F(InteropProviderTest, FiltersDestinationsAndSubscriptionsAreCreatedReadAndDeletedThroughTheCore) {
    CMPIInstance* f = newInstance("CIM_IndicationFilter");
    set(f, "Name", "beat");
    set(f, "Query", "SELECT * FROM Raw_Indication");
    host::Reply created = core_->createInstance(classPath("CIM_IndicationFilter"), f);
    ASSERT_EQ(created.rc(), CMPI_RC_OK) << created.message();
    ASSERT_EQ(created.objectPaths().size(), 1U);
    CMPIInstance* h = newInstance("CIM_IndicationHandlerCIMXML");
    set(h, "Name", "old-style");
    set(h, "Destination", "http://127.0.0.1:5990");
    ASSERT_EQ(core_->createInstance(classPath("CIM_IndicationHandlerCIMXML"), h).rc(), CMPI_RC_OK);

    CMPIInstance* s = newInstance("CIM_IndicationSubscription");
    CMPIObjectPath* filterRef = named("CIM_IndicationFilter", "beat");
    CMPIObjectPath* handlerRef = named("CIM_IndicationHandlerCIMXML", "old-style");
    s->ft->setProperty(s, "Filter", reinterpret_cast<const CMPIValue*>(&filterRef), CMPI_ref);
    s->ft->setProperty(s, "Handler", reinterpret_cast<const CMPIValue*>(&handlerRef), CMPI_ref);
    host::Reply subscribed = core_->createInstance(classPath("CIM_IndicationSubscription"), s);
    ASSERT_EQ(subscribed.rc(), CMPI_RC_OK) << subscribed.message();
    EXPECT_EQ(core_->createInstance(classPath("CIM_IndicationSubscription"), s).rc(), CMPI_RC_ERR_ALREADY_EXISTS);

    // Destinations of either class are found under the abstract parent.
    EXPECT_THAT(names("CIM_ListenerDestination"), ElementsAre("old-style"));
    EXPECT_THAT(names("CIM_ListenerDestinationCIMXML"), ElementsAre());
    host::Reply got = core_->getInstance(named("CIM_IndicationFilter", "BEAT"));
    ASSERT_EQ(got.rc(), CMPI_RC_OK) << got.message();
    EXPECT_EQ(str(got.instances()[0], "Query"), "SELECT * FROM Raw_Indication");
    EXPECT_EQ(str(got.instances()[0], "SourceNamespace"), "root/cimv2");

    host::Reply inUse = core_->deleteInstance(named("CIM_IndicationFilter", "beat"));
    EXPECT_EQ(inUse.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(inUse.message(), "Filter in use");
    const CMPIObjectPath* subscriptionPath = subscribed.objectPaths()[0];
    ASSERT_EQ(core_->deleteInstance(subscriptionPath).rc(), CMPI_RC_OK);
    EXPECT_EQ(core_->deleteInstance(subscriptionPath).rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(core_->deleteInstance(named("CIM_IndicationFilter", "beat")).rc(), CMPI_RC_OK);
    EXPECT_TRUE(names("CIM_IndicationFilter").empty());
}

TEST_F(InteropProviderTest, RefusalsCarryTheManagersCodeAndMessage) {
    CMPIInstance* f = newInstance("CIM_IndicationFilter");
    set(f, "Name", "bad");
    set(f, "Query", "SELECT * FROM Raw_Element");
    host::Reply reply = core_->createInstance(classPath("CIM_IndicationFilter"), f);
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(reply.message(), "class Raw_Element is not an indication class");
    EXPECT_EQ(core_->createInstance(classPath("CIM_Namespace"), newInstance("CIM_Namespace")).rc(),
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(core_->getInstance(named("CIM_IndicationFilter", "missing")).rc(), CMPI_RC_ERR_NOT_FOUND);
}

}  // namespace
}  // namespace orv::indication::test
