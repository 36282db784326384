// Every function-table slot of the encapsulated types, through the broker's
// factory table, with sfcb's value conventions.
#include <cmpimacs.h>

#include <cstring>

#include "context.hpp"
#include "core_fixture.hpp"
#include "object.hpp"

namespace orv::host::test {
namespace {

using TypesTest = CoreTest;

const CMPIValue* chars(const char* text) { return reinterpret_cast<const CMPIValue*>(text); }

TEST_F(TypesTest, StringHandleIsTheCharacterBuffer) {
    CMPIStatus rc{};
    CMPIString* s = mb()->eft->newString(mb(), "hello", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_STREQ(static_cast<const char*>(s->hdl), "hello");
    EXPECT_EQ(s->ft->getCharPtr(s, nullptr), s->hdl);
    CMPIString* copy = s->ft->clone(s, nullptr);
    EXPECT_STREQ(copy->ft->getCharPtr(copy, nullptr), "hello");
    EXPECT_EQ(copy->ft->release(copy).rc, CMPI_RC_OK);
    EXPECT_EQ(mb()->eft->newString(mb(), nullptr, &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(TypesTest, CharsSettersTakeThePointerAndGettersReportString) {
    CMPIObjectPath* op = path("Raw_Element");
    CMPIInstance* inst = mb()->eft->newInstance(mb(), op, nullptr);
    ASSERT_EQ(inst->ft->setProperty(inst, "Text", chars("value"), CMPI_chars).rc, CMPI_RC_OK);
    CMPIData d = inst->ft->getProperty(inst, "text", nullptr);
    EXPECT_EQ(d.type, CMPI_string);
    EXPECT_EQ(d.state, CMPI_goodValue);
    EXPECT_EQ(text(d.value.string), "value");
    CMPIString* s = mb()->eft->newString(mb(), "other", nullptr);
    inst->ft->setProperty(inst, "Text", reinterpret_cast<const CMPIValue*>(&s), CMPI_string);
    EXPECT_EQ(stringProperty(inst, "Text"), "other");
}

TEST_F(TypesTest, InstanceSlots) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "k1"), nullptr);
    EXPECT_EQ(inst->ft->getPropertyCount(inst, nullptr), 1U);  // the key came from the path
    CMPIUint8 small = 200;
    inst->ft->setProperty(inst, "Counter", reinterpret_cast<const CMPIValue*>(&small), CMPI_uint8);
    inst->ft->setProperty(inst, "Flag", nullptr, CMPI_boolean);
    CMPIData flag = inst->ft->getProperty(inst, "Flag", nullptr);
    EXPECT_EQ(flag.type, CMPI_boolean);
    EXPECT_EQ(flag.state, CMPI_nullValue);
    CMPIString* name = nullptr;
    CMPIData second = inst->ft->getPropertyAt(inst, 1, &name, nullptr);
    EXPECT_EQ(text(name), "Counter");
    EXPECT_EQ(second.value.uint8, 200);
    CMPIStatus rc{};
    inst->ft->getPropertyAt(inst, 9, &name, &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    CMPIData missing = inst->ft->getProperty(inst, "Nope", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_EQ(missing.state, CMPI_notFound);
    EXPECT_EQ(inst->ft->setProperty(inst, "Bad", chars("x"), static_cast<CMPIType>(0x4444)).rc,
              CMPI_RC_ERR_INVALID_DATA_TYPE);
    // setPropertyWithOrigin is filled (sfcb leaves it NULL) and sets the value.
    EXPECT_EQ(inst->ft->setPropertyWithOrigin(inst, "Text", chars("o"), CMPI_chars, "Raw_Element").rc, CMPI_RC_OK);
    EXPECT_EQ(stringProperty(inst, "Text"), "o");
}

TEST_F(TypesTest, InstancePathTakesKeysFromTheClassKeyList) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    inst->ft->setProperty(inst, "Text", chars("not a key"), CMPI_chars);
    inst->ft->setProperty(inst, "Name", chars("n1"), CMPI_chars);
    CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(op->ft->getKeyCount(op, nullptr), 1U);
    EXPECT_EQ(text(op->ft->getKey(op, "Name", nullptr).value.string), "n1");
    EXPECT_EQ(op->ft->getKey(op, "Name", nullptr).state, CMPI_keyValue);
    EXPECT_EQ(text(op->ft->getNameSpace(op, nullptr)), "root/cimv2");
}

TEST_F(TypesTest, PropertyFilterDropsUnlistedPropertiesButKeepsKeys) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "k"), nullptr);
    inst->ft->setProperty(inst, "Text", chars("t"), CMPI_chars);
    inst->ft->setProperty(inst, "Counter", chars("c"), CMPI_chars);
    const char* list[] = {"Text", nullptr};
    EXPECT_EQ(inst->ft->setPropertyFilter(inst, list, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(inst->ft->getPropertyCount(inst, nullptr), 2U);  // Name (key) and Text
    inst->ft->setProperty(inst, "Ratio", chars("dropped"), CMPI_chars);
    EXPECT_EQ(inst->ft->getPropertyCount(inst, nullptr), 2U);
}

TEST_F(TypesTest, SetObjectPathCopiesKeysIntoProperties) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    EXPECT_EQ(inst->ft->setObjectPath(inst, path("Raw_SubElement", "moved")).rc, CMPI_RC_OK);
    EXPECT_EQ(stringProperty(inst, "Name"), "moved");
    EXPECT_EQ(className(inst->ft->getObjectPath(inst, nullptr)), "Raw_SubElement");
}

TEST_F(TypesTest, ObjectPathSlots) {
    CMPIObjectPath* op = path("Raw_Element", "p");
    EXPECT_EQ(op->ft->setHostname(op, "host1").rc, CMPI_RC_OK);
    EXPECT_EQ(text(op->ft->getHostname(op, nullptr)), "host1");
    op->ft->setClassName(op, "Raw_SubElement");
    EXPECT_EQ(className(op), "Raw_SubElement");
    op->ft->setNameSpace(op, "root/other");
    CMPIObjectPath* other = path("Raw_Element");
    other->ft->setHostname(other, "host2");
    op->ft->setNameSpaceFromObjectPath(op, other);
    EXPECT_EQ(text(op->ft->getNameSpace(op, nullptr)), "root/cimv2");
    EXPECT_EQ(text(op->ft->getHostname(op, nullptr)), "host1");
    op->ft->setHostAndNameSpaceFromObjectPath(op, other);
    EXPECT_EQ(text(op->ft->getHostname(op, nullptr)), "host2");
    CMPISint64 n = -5;
    op->ft->addKey(op, "Number", reinterpret_cast<const CMPIValue*>(&n), CMPI_sint64);
    CMPIString* keyName = nullptr;
    CMPIData second = op->ft->getKeyAt(op, 1, &keyName, nullptr);
    EXPECT_EQ(text(keyName), "Number");
    EXPECT_EQ(second.value.sint64, -5);
    EXPECT_EQ(text(op->ft->toString(op, nullptr)), "//host2/root/cimv2:Raw_SubElement.Name=\"p\",Number=-5");
}

TEST_F(TypesTest, ObjectPathQualifiersComeFromTheRepository) {
    CMPIObjectPath* op = path("Raw_Element");
    CMPIStatus rc{};
    CMPIData description = op->ft->getClassQualifier(op, "Description", &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(text(description.value.string), "Served by RawElementProvider.");
    CMPIData key = op->ft->getPropertyQualifier(op, "Name", "Key", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(key.type, CMPI_boolean);
    EXPECT_EQ(key.value.boolean, 1);
    op->ft->getMethodQualifier(op, "Echo", "Description", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    CMPIData param = op->ft->getParameterQualifier(op, "Echo", "Text", "Description", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(text(param.value.string), "any text");
    op->ft->getPropertyQualifier(op, "Text", "Key", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(TypesTest, ArgsSlots) {
    CMPIArgs* args = mb()->eft->newArgs(mb(), nullptr);
    CMPIReal32 f = 1.5F;
    args->ft->addArg(args, "A", reinterpret_cast<const CMPIValue*>(&f), CMPI_real32);
    args->ft->addArg(args, "B", chars("b"), CMPI_chars);
    args->ft->addArg(args, "a", chars("replaced"), CMPI_chars);
    EXPECT_EQ(args->ft->getArgCount(args, nullptr), 2U);
    EXPECT_EQ(text(args->ft->getArg(args, "A", nullptr).value.string), "replaced");
    CMPIString* name = nullptr;
    EXPECT_EQ(text(args->ft->getArgAt(args, 1, &name, nullptr).value.string), "b");
    EXPECT_EQ(text(name), "B");
    CMPIArgs* copy = args->ft->clone(args, nullptr);
    EXPECT_EQ(copy->ft->getArgCount(copy, nullptr), 2U);
    copy->ft->release(copy);
}

TEST_F(TypesTest, ArraySlotsAndTypeChecks) {
    CMPIArray* array = mb()->eft->newArray(mb(), 2, CMPI_chars, nullptr);
    EXPECT_EQ(array->ft->getSimpleType(array, nullptr), CMPI_string);
    EXPECT_EQ(array->ft->getSize(array, nullptr), 2U);
    EXPECT_EQ(array->ft->getElementAt(array, 0, nullptr).state, CMPI_nullValue);
    EXPECT_EQ(array->ft->setElementAt(array, 1, chars("one"), CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(text(array->ft->getElementAt(array, 1, nullptr).value.string), "one");
    CMPIUint32 n = 1;
    EXPECT_EQ(array->ft->setElementAt(array, 0, reinterpret_cast<const CMPIValue*>(&n), CMPI_uint32).rc,
              CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(array->ft->setElementAt(array, 5, chars("x"), CMPI_chars).rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    EXPECT_EQ(inst->ft->setProperty(inst, "Numbers", reinterpret_cast<const CMPIValue*>(&array), CMPI_uint16A).rc,
              CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(inst->ft->setProperty(inst, "Names", reinterpret_cast<const CMPIValue*>(&array), CMPI_stringA).rc,
              CMPI_RC_OK);
}

TEST_F(TypesTest, AStringStoredAndThenReleasedStillReadsWhereItWasStored) {
    CMPIString* name = mb()->eft->newString(mb(), "kept", nullptr);
    const auto* value = reinterpret_cast<const CMPIValue*>(&name);
    CMPIArray* array = mb()->eft->newArray(mb(), 1, CMPI_string, nullptr);
    ASSERT_EQ(array->ft->setElementAt(array, 0, value, CMPI_string).rc, CMPI_RC_OK);
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    ASSERT_EQ(inst->ft->setProperty(inst, "Name", value, CMPI_string).rc, CMPI_RC_OK);
    EXPECT_EQ(name->ft->release(name).rc, CMPI_RC_OK);
    EXPECT_EQ(text(array->ft->getElementAt(array, 0, nullptr).value.string), "kept");
    EXPECT_EQ(text(inst->ft->getProperty(inst, "Name", nullptr).value.string), "kept");
}

TEST_F(TypesTest, EnumerationSlots) {
    CMPIEnumeration* en = mb()->bft->enumerateInstances(mb(), nullptr, path("Raw_SubElement"), nullptr, nullptr);
    ASSERT_NE(en, nullptr);
    CMPIEnumeration* copy = en->ft->clone(en, nullptr);
    EXPECT_TRUE(en->ft->hasNext(en, nullptr));
    EXPECT_EQ(en->ft->getNext(en, nullptr).type, CMPI_instance);
    EXPECT_EQ(en->ft->getNext(en, nullptr).type, CMPI_instance);
    EXPECT_FALSE(en->ft->hasNext(en, nullptr));
    CMPIStatus rc{};
    en->ft->getNext(en, &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_FOUND);
    CMPIArray* all = en->ft->toArray(en, nullptr);
    EXPECT_EQ(all->ft->getSize(all, nullptr), 2U);
    EXPECT_EQ(all->ft->getSimpleType(all, nullptr), CMPI_instance);
    EXPECT_TRUE(copy->ft->hasNext(copy, nullptr));  // the clone keeps its own cursor
    copy->ft->release(copy);
}

TEST_F(TypesTest, ContextEntriesReplaceByNameAndReadCharsBackAsString) {
    CMPIContext* ctx = detail::newContext(detail::Owner::Caller);
    CMPIUint32 one = 1;
    EXPECT_EQ(ctx->ft->addEntry(ctx, CMPIPrincipal, chars("first"), CMPI_chars).rc, CMPI_RC_OK);
    ctx->ft->addEntry(ctx, "CMPISessionId", reinterpret_cast<const CMPIValue*>(&one), CMPI_uint32);
    ctx->ft->addEntry(ctx, CMPIPrincipal, chars("second"), CMPI_chars);
    EXPECT_EQ(ctx->ft->getEntryCount(ctx, nullptr), 3U);  // the host extension entry, principal, session
    CMPIData principal = ctx->ft->getEntry(ctx, CMPIPrincipal, nullptr);
    EXPECT_EQ(principal.type, CMPI_string);
    EXPECT_EQ(text(principal.value.string), "second");
    CMPIStatus rc{};
    CMPIData missing = ctx->ft->getEntry(ctx, CMPIRole, &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_EQ(missing.state, CMPI_nullValue);
    CMPIString* name = nullptr;
    ctx->ft->getEntryAt(ctx, 0, &name, nullptr);
    EXPECT_EQ(text(name), CMPI_ORV_HostExtensions);
    EXPECT_TRUE(CMHasHostExtensions(ctx));
    EXPECT_EQ(ctx->ft->clone(ctx, &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    // prepareAttachThread deep-copies; detachThread releases the copy.
    CMPIContext* copy = mb()->bft->prepareAttachThread(mb(), ctx);
    ctx->ft->addEntry(ctx, CMPIPrincipal, chars("third"), CMPI_chars);
    EXPECT_EQ(text(copy->ft->getEntry(copy, CMPIPrincipal, nullptr).value.string), "second");
    EXPECT_EQ(mb()->bft->attachThread(mb(), copy).rc, CMPI_RC_OK);
    EXPECT_EQ(mb()->bft->detachThread(mb(), copy).rc, CMPI_RC_OK);
    EXPECT_EQ(ctx->ft->release(ctx).rc, CMPI_RC_OK);
    EXPECT_EQ(ctx->ft->release(ctx).rc, CMPI_RC_ERR_FAILED);  // double release: an error, not a crash
}

TEST_F(TypesTest, ErrorSlots) {
    CMPIError* error = mb()->eft->newCMPIError(mb(), "owner", "MSG1", "message", ErrorSevHigh, Fan_Failure,
                                               CMPI_RC_ERR_FAILED, nullptr);
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(text(error->ft->getOwningEntity(error, nullptr)), "owner");
    EXPECT_EQ(text(error->ft->getMessageID(error, nullptr)), "MSG1");
    EXPECT_EQ(text(error->ft->getMessage(error, nullptr)), "message");
    EXPECT_EQ(error->ft->getPerceivedSeverity(error, nullptr), ErrorSevHigh);
    EXPECT_EQ(error->ft->getProbableCause(error, nullptr), Fan_Failure);
    EXPECT_EQ(error->ft->getCIMStatusCode(error, nullptr), CMPI_RC_ERR_FAILED);
    error->ft->setErrorType(error, SoftwareError);
    error->ft->setOtherErrorType(error, "other");
    error->ft->setProbableCauseDescription(error, "fans");
    error->ft->setErrorSource(error, "src");
    error->ft->setErrorSourceFormat(error, CIMObjectHandle);
    error->ft->setOtherErrorSourceFormat(error, "fmt");
    error->ft->setCIMStatusCodeDescription(error, "desc");
    CMPIArray* actions = mb()->eft->newArray(mb(), 1, CMPI_string, nullptr);
    actions->ft->setElementAt(actions, 0, chars("replace fan"), CMPI_chars);
    error->ft->setRecommendedActions(error, actions);
    error->ft->setMessageArguments(error, actions);
    CMPIError* copy = error->ft->clone(error, nullptr);
    EXPECT_EQ(copy->ft->getErrorType(copy, nullptr), SoftwareError);
    EXPECT_EQ(text(copy->ft->getOtherErrorType(copy, nullptr)), "other");
    EXPECT_EQ(text(copy->ft->getProbableCauseDescription(copy, nullptr)), "fans");
    EXPECT_EQ(text(copy->ft->getErrorSource(copy, nullptr)), "src");
    EXPECT_EQ(copy->ft->getErrorSourceFormat(copy, nullptr), CIMObjectHandle);
    EXPECT_EQ(text(copy->ft->getOtherErrorSourceFormat(copy, nullptr)), "fmt");
    EXPECT_EQ(text(copy->ft->getCIMStatusCodeDescription(copy, nullptr)), "desc");
    CMPIArray* got = copy->ft->getRecommendedActions(copy, nullptr);
    EXPECT_EQ(text(got->ft->getElementAt(got, 0, nullptr).value.string), "replace fan");
    EXPECT_EQ(copy->ft->getMessageArguments(copy, nullptr)->ft->getSize(got, nullptr), 1U);
    copy->ft->release(copy);
}

TEST_F(TypesTest, BrokerIdentityAndTypeQueries) {
    EXPECT_EQ(mb()->bft->brokerCapabilities, 0x1BFU);
    EXPECT_STREQ(mb()->bft->brokerName, "orv-brokercore");
    CMPIObjectPath* op = path("Raw_SubElement");
    EXPECT_TRUE(mb()->eft->classPathIsA(mb(), op, "raw_base", nullptr));
    EXPECT_FALSE(mb()->eft->classPathIsA(mb(), op, "Raw_OtherSub", nullptr));
    EXPECT_TRUE(mb()->eft->isOfType(mb(), op, "CMPIObjectPath", nullptr));
    EXPECT_EQ(text(mb()->eft->getType(mb(), op, nullptr)), "CMPIObjectPath");
    EXPECT_EQ(text(mb()->eft->toString(mb(), op, nullptr)), "root/cimv2:Raw_SubElement");
    CMPIStatus rc{};
    EXPECT_EQ(mb()->eft->toString(mb(), mb()->eft->newArgs(mb(), nullptr), &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(text(mb()->eft->getMessage(mb(), "id", "default text", &rc, 0)), "default text");
    EXPECT_EQ(mb()->bft->setProperty(mb(), nullptr, op, "x", nullptr, CMPI_uint8).rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(mb()->eft->openMessageFile(mb(), "f", nullptr).rc, CMPI_RC_ERR_NOT_SUPPORTED);
    char* file = mb()->xft->resolveFileName("x");
    EXPECT_STREQ(file, "libx.so");
    free(file);
}

TEST_F(TypesTest, NoSlotOfAnyBrokerTableIsNull) {
    auto noNull = [](const void* table, std::size_t size, std::size_t from) {
        const auto* bytes = static_cast<const unsigned char*>(table);
        for (std::size_t off = from; off < size; off += sizeof(void*)) {
            void* slot = nullptr;
            std::memcpy(&slot, bytes + off, sizeof slot);
            if (slot == nullptr) {
                return off;
            }
        }
        return std::size_t{0};
    };
    EXPECT_EQ(noNull(mb()->bft, sizeof(CMPIBrokerFT), 8), 0U);
    EXPECT_EQ(noNull(mb()->eft, sizeof(CMPIBrokerEncFT), 8), 0U);
    EXPECT_EQ(noNull(mb()->xft, sizeof(CMPIBrokerExtFT), 8), 0U);
    EXPECT_EQ(noNull(mb()->mft, sizeof(CMPIBrokerMemFT), 8), 0U);
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    EXPECT_EQ(noNull(inst->ft, sizeof(CMPIInstanceFT), 8), 0U);
    CMPIObjectPath* op = path("Raw_Element");
    EXPECT_EQ(noNull(op->ft, sizeof(CMPIObjectPathFT), 8), 0U);
}

}  // namespace
}  // namespace orv::host::test
