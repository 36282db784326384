// Requests reach the providers registered for the class, its nearest
// registered superclass and (for enumerations) every subclass.
#include <set>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using RoutingTest = CoreTest;

std::multiset<std::string> classesOf(const Reply& reply) {
    std::multiset<std::string> out;
    for (const CMPIInstance* inst : reply.instances()) {
        out.insert(className(inst->ft->getObjectPath(inst, nullptr)));
    }
    return out;
}

TEST_F(RoutingTest, EnumerationOfAParentClassReachesEverySubclassProviderDeep) {
    Reply reply = core_->enumerateInstances(path("Raw_Base"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    // Raw_Element, Raw_SubElement (a subclass of Raw_Element) and Raw_OtherSub, two each.
    EXPECT_EQ(classesOf(reply), (std::multiset<std::string>{"Raw_Element", "Raw_Element", "Raw_SubElement",
                                                             "Raw_SubElement", "Raw_OtherSub", "Raw_OtherSub"}));
    EXPECT_EQ(reply.doneCount(), 3U);
    EXPECT_EQ(reply.providerCalls(), 3U);
}

TEST_F(RoutingTest, ClassNamesCompareWithoutCase) {
    Reply reply = core_->enumerateInstances(path("raw_ELEMENT"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.instances().size(), 4U);  // Raw_Element's two and Raw_SubElement's two
}

TEST_F(RoutingTest, ReturnedItemsKeepTheProviderOrderAndTypes) {
    Reply reply = core_->enumerateInstances(path("Raw_SubElement"), as("many"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.items().size(), 5U);
    for (std::size_t i = 0; i < 5; ++i) {
        const ReturnedItem& item = reply.items()[i];
        ASSERT_EQ(item.kind, ReturnedItem::Kind::Instance);
        EXPECT_EQ(item.data.type, CMPI_instance);
        EXPECT_EQ(stringProperty(item.data.value.inst, "Name"), "Raw_SubElement-" + std::to_string(i));
    }
    const CMPIInstance* first = reply.instances().front();
    CMPIData counter = first->ft->getProperty(first, "Counter", nullptr);
    EXPECT_EQ(counter.type, CMPI_uint32);
    CMPIData ratio = first->ft->getProperty(first, "Ratio", nullptr);
    EXPECT_EQ(ratio.type, CMPI_real64);
    EXPECT_DOUBLE_EQ(ratio.value.real64, 0.5);
    CMPIData numbers = first->ft->getProperty(first, "Numbers", nullptr);
    ASSERT_EQ(numbers.type, CMPI_uint16A);
    EXPECT_EQ(numbers.value.array->ft->getSize(numbers.value.array, nullptr), 3U);
}

TEST_F(RoutingTest, EnumerateInstanceNamesReturnsPathsWithKeysFromTheClassKeyList) {
    Reply reply = core_->enumerateInstanceNames(path("Raw_SubElement"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.objectPaths().size(), 2U);
    const CMPIObjectPath* op = reply.objectPaths()[0];
    EXPECT_EQ(op->ft->getKeyCount(op, nullptr), 1U);  // only Name is a key
    CMPIData key = op->ft->getKey(op, "name", nullptr);
    EXPECT_EQ(key.type, CMPI_string);
    EXPECT_EQ(text(key.value.string), "Raw_SubElement-0");
}

TEST_F(RoutingTest, ProviderReturningNothingAnswersOkAndEmpty) {
    Reply reply = core_->enumerateInstances(path("Raw_SubElement"), as("none"));
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.items().empty());
    EXPECT_EQ(reply.doneCount(), 1U);
}

TEST_F(RoutingTest, StatusWithMessageReachesTheClient) {
    Reply reply = core_->getInstance(path("Raw_Element", "x"), as("error"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(reply.message(), "denied by raw provider");
    EXPECT_EQ(text(reply.status().msg), "denied by raw provider");
}

TEST_F(RoutingTest, StatusWithoutMessageHasNullMessage) {
    Reply reply = core_->getInstance(path("Raw_Element", "x"), as("errornomsg"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "");
    EXPECT_EQ(reply.status().msg, nullptr);
}

TEST_F(RoutingTest, GetInstanceAppliesThePropertyList) {
    CallOptions opts;
    opts.properties = std::vector<std::string>{"Text"};
    Reply reply = core_->getInstance(path("Raw_Element", "wanted"), opts);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 1U);
    const CMPIInstance* inst = reply.instances()[0];
    EXPECT_EQ(stringProperty(inst, "Name"), "wanted");  // a key stays
    EXPECT_EQ(stringProperty(inst, "Text"), "raw text");
    CMPIStatus rc{};
    inst->ft->getProperty(inst, "Counter", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
}

TEST_F(RoutingTest, GetInstanceOfAClassWithoutProviderIsNotFound) {
    // Raw_Base is known but no provider serves it or a superclass: as sfcb, no such instance.
    Reply reply = core_->getInstance(path("Raw_Base", "x"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(reply.message(), "no provider registered for class Raw_Base: no such instance");
    EXPECT_EQ(reply.providerCalls(), 0U);
}

TEST_F(RoutingTest, OtherRequestsOfAClassWithoutProviderAreNotSupported) {
    Reply reply = core_->deleteInstance(path("Raw_Base", "x"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(reply.message(), "no provider registered for class Raw_Base");
}

TEST_F(RoutingTest, UnknownClassAndNamespaceAreReported) {
    EXPECT_EQ(core_->getInstance(path("No_Such_Class", "x")).rc(), CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(core_->getInstance(path("Raw_Element", "x", "root/nowhere")).rc(), CMPI_RC_ERR_INVALID_NAMESPACE);
}

TEST_F(RoutingTest, CreateModifyDeleteReachTheInstanceProvider) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "made"), nullptr);
    CMPIUint32 counter = 9;
    inst->ft->setProperty(inst, "Counter", reinterpret_cast<const CMPIValue*>(&counter), CMPI_uint32);

    Reply created = core_->createInstance(path("Raw_Element"), inst);
    ASSERT_EQ(created.rc(), CMPI_RC_OK) << created.message();
    ASSERT_EQ(created.objectPaths().size(), 1U);
    EXPECT_EQ(text(created.objectPaths()[0]->ft->toString(created.objectPaths()[0], nullptr)),
              "root/cimv2:Raw_Element.Name=\"made\"");

    Reply modified = core_->modifyInstance(path("Raw_Element", "made"), inst);
    ASSERT_EQ(modified.instances().size(), 1U);
    EXPECT_EQ(modified.instances()[0]->ft->getProperty(modified.instances()[0], "Counter", nullptr).value.uint32, 9U);

    Reply deleted = core_->deleteInstance(path("Raw_Element", "made"));
    EXPECT_EQ(deleted.rc(), CMPI_RC_OK);
    EXPECT_EQ(deleted.doneCount(), 1U);
}

TEST_F(RoutingTest, ExecQueryReachesProvidersOfTheFromClassAndFiltersByWhere) {
    Reply reply = core_->execQuery(path("Raw_Element"), "SELECT * FROM Raw_Element WHERE Counter >= 3", "WQL");
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    // Raw_Element and Raw_SubElement providers each keep q-3 and q-4.
    EXPECT_EQ(reply.instances().size(), 4U);
    EXPECT_EQ(core_->execQuery(path("Raw_Element"), "SELECT FROM", "WQL").rc(), CMPI_RC_ERR_INVALID_QUERY);
}

TEST_F(RoutingTest, AssociatorsWithoutFilterReachEveryAssociationProvider) {
    Reply reply = core_->associators(path("Raw_Element", "a"), nullptr, nullptr, nullptr, nullptr);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.instances().size(), 2U);  // Raw_Assoc and Raw_SubAssoc registrations
    EXPECT_EQ(stringProperty(reply.instances()[0], "Text"), "Raw_Assoc");
    EXPECT_EQ(stringProperty(reply.instances()[1], "Text"), "Raw_SubAssoc");
}

TEST_F(RoutingTest, AssociationFilterOnAParentReachesItsSubclassesToo) {
    Reply parent = core_->references(path("Raw_Element", "a"), "raw_assoc", nullptr);
    ASSERT_EQ(parent.rc(), CMPI_RC_OK);
    EXPECT_EQ(parent.instances().size(), 2U);
    Reply sub = core_->referenceNames(path("Raw_Element", "a"), "Raw_SubAssoc", nullptr);
    ASSERT_EQ(sub.objectPaths().size(), 1U);
    EXPECT_EQ(className(sub.objectPaths()[0]), "Raw_SubAssoc");
    const CMPIObjectPath* ref = sub.objectPaths()[0];
    EXPECT_EQ(ref->ft->getKeyCount(ref, nullptr), 2U);
    EXPECT_EQ(ref->ft->getKey(ref, "Left", nullptr).type, CMPI_ref);
    Reply names = core_->associatorNames(path("Raw_Element", "a"), "Raw_SubAssoc", nullptr, nullptr, nullptr);
    EXPECT_EQ(names.objectPaths().size(), 1U);
}

TEST_F(RoutingTest, InvokeMethodReturnsValueAndOutArguments) {
    CMPIArgs* in = mb()->eft->newArgs(mb(), nullptr);
    CMPIUint32 number = 5;
    in->ft->addArg(in, "Text", reinterpret_cast<const CMPIValue*>("hello"), CMPI_chars);
    in->ft->addArg(in, "Number", reinterpret_cast<const CMPIValue*>(&number), CMPI_uint32);
    Reply reply = core_->invokeMethod(path("Raw_Element", "m"), "Echo", in);
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    ASSERT_EQ(reply.items().size(), 1U);
    EXPECT_EQ(reply.items()[0].kind, ReturnedItem::Kind::Data);
    EXPECT_EQ(reply.items()[0].data.value.uint32, 42U);
    const CMPIArgs* out = reply.outArgs();
    ASSERT_EQ(out->ft->getArgCount(out, nullptr), 2U);
    CMPIData echoed = out->ft->getArg(out, "Text", nullptr);
    EXPECT_EQ(echoed.type, CMPI_string);
    EXPECT_EQ(text(echoed.value.string), "hello");
    EXPECT_EQ(core_->invokeMethod(path("Raw_Element", "m"), "Nope", in).rc(), CMPI_RC_ERR_METHOD_NOT_FOUND);
}

TEST_F(RoutingTest, InvokeMethodContextCarriesTheRegistrationParameters) {
    Reply reply = core_->invokeMethod(path("Raw_Element", "m"), "Params", nullptr);
    ASSERT_EQ(reply.items().size(), 1U);
    EXPECT_EQ(reply.items()[0].data.type, CMPI_string);
    EXPECT_EQ(text(reply.items()[0].data.value.string), "mode=element limit=5");
}

TEST_F(RoutingTest, MethodContextHoldsPrincipalFlagsRoleAndSession) {
    CallOptions opts;
    opts.principal = "alice";
    opts.role = "admin";
    opts.flags = CMPI_FLAG_DeepInheritance;
    opts.sessionId = 77;
    Reply reply = core_->invokeMethod(path("Raw_Element", "m"), "Context", nullptr, opts);
    const CMPIArgs* out = reply.outArgs();
    EXPECT_EQ(text(out->ft->getArg(out, CMPIPrincipal, nullptr).value.string), "alice");
    EXPECT_EQ(text(out->ft->getArg(out, CMPIRole, nullptr).value.string), "admin");
    EXPECT_EQ(out->ft->getArg(out, CMPIInvocationFlags, nullptr).value.uint32, CMPI_FLAG_DeepInheritance);
    EXPECT_EQ(out->ft->getArg(out, "CMPISessionId", nullptr).value.uint32, 77U);
    EXPECT_EQ(out->ft->getArg(out, CMPI_ORV_HostExtensions, nullptr).value.uint32, 1U);
}

TEST_F(RoutingTest, UpCallsReturnWhatOtherProvidersReturn) {
    Reply reply = core_->enumerateInstances(path("Raw_Element"), as("upcall"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    // Raw_Element's provider returns the up-call's two Raw_SubElement instances;
    // Raw_SubElement's own provider returns its two.
    EXPECT_EQ(classesOf(reply), (std::multiset<std::string>{"Raw_SubElement", "Raw_SubElement", "Raw_SubElement",
                                                             "Raw_SubElement"}));
    Reply got = core_->invokeMethod(path("Raw_Element", "m"), "UpCallGet", nullptr);
    ASSERT_EQ(got.rc(), CMPI_RC_OK) << got.message();
    ASSERT_EQ(got.items().size(), 1U);
    ASSERT_EQ(got.items()[0].data.type, CMPI_instance);
    EXPECT_EQ(stringProperty(got.items()[0].data.value.inst, "Name"), "fetched");
}

}  // namespace
}  // namespace orv::host::test

namespace orv::host::test {
namespace {

TEST_F(RoutingTest, EnumerationStopsAtTheFirstFailingSubclassProvider) {
    Reply reply = core_->enumerateInstances(path("Raw_Broken"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(reply.providerCalls(), 1U);  // Raw_Missing's library, first in class order, fails
    EXPECT_THAT(reply.message(), ::testing::HasSubstr("librawmissing.so"));
}

}  // namespace
}  // namespace orv::host::test
