// Run-time checks of the CMPI C ABI: tables built in one language and called
// from the other, the embedded host's context extension, the convenience
// macros, the header set, and a provider module made with the stub macros.
#include <cmpi/cmpift.h>
#include <cmpi/cmpimacs.h>
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <pthread.h>

#include <cstddef>
#include <cstring>
#include <string>
#include <type_traits>

#include "abi_c_tables.h"
#include "abi_level100.h"

extern "C" {
int abi_alone_cmpipl_c(void);
int abi_alone_cmpios_c(void);
int abi_alone_cmpidt_c(void);
int abi_alone_cmpift_c(void);
int abi_alone_cmpimacs_c(void);
int abi_alone_cmpipl_cpp();
int abi_alone_cmpios_cpp();
int abi_alone_cmpidt_cpp();
int abi_alone_cmpift_cpp();
int abi_alone_cmpimacs_cpp();
}

namespace {

// The text of a status message, releasing the message.
std::string takeMessage(CMPIStatus& st)
{
    if (st.msg == nullptr) {
        return "<none>";
    }
    std::string text = CMGetCharPtr(st.msg);
    CMRelease(st.msg);
    st.msg = nullptr;
    return text;
}

std::string takeString(CMPIString* s)
{
    std::string text = CMGetCharPtr(s);
    CMRelease(s);
    return text;
}

// ---- tables built in C, read from C++ ---------------------------------------

TEST(AbiCrossLanguage, DataFromCTableKeepsValueAtOffsetEight)
{
    CMPIStatus rc = {CMPI_RC_ERR_FAILED, nullptr};
    CMPIData d = CMGetProperty(abi_c_instance(), "Answer", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(d.type, CMPI_uint32);
    EXPECT_EQ(d.state, CMPI_goodValue);
    EXPECT_EQ(d.value.uint32, 42u);
    CMPIUint32 raw = 0;
    std::memcpy(&raw, reinterpret_cast<const unsigned char*>(&d) + 8, sizeof raw);
    EXPECT_EQ(raw, 42u);
}

TEST(AbiCrossLanguage, MissingPropertyFromCTableIsNullWithStatus)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData d = CMGetProperty(abi_c_instance(), "Nope", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_TRUE(CMIsNullValue(d));
    EXPECT_EQ(d.type, CMPI_null);
}

TEST(AbiCrossLanguage, StatusFromCTableCarriesBrokerMessage)
{
    CMPIUint32 v = 7;
    CMPIStatus st = CMSetProperty(abi_c_instance(), "Answer", &v, CMPI_uint32);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(takeMessage(st), "read-only");
}

TEST(AbiCrossLanguage, CCallerReadsKeyFromCppObjectPathTable)
{
    CMPIObjectPathFT ft{};
    ft.ftVersion = 1;
    ft.getKey = [](const CMPIObjectPath*, const char* name, CMPIStatus* rc) {
        CMPIData d{};
        d.type = CMPI_sint64;
        d.state = CMPI_keyValue;
        d.value.sint64 = std::strcmp(name, "Id") == 0 ? -7 : 0;
        CMSetStatus(rc, CMPI_RC_OK);
        return d;
    };
    CMPIObjectPath op{const_cast<char*>("path"), &ft};
    CMPIStatus rc = {CMPI_RC_ERR_FAILED, nullptr};
    CMPIData d = abi_c_get_key(&op, "Id", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(d.type, CMPI_sint64);
    EXPECT_TRUE(CMIsKeyValue(d));
    EXPECT_EQ(d.value.sint64, -7);
}

TEST(AbiCrossLanguage, CCallerGetsStatusFromCppResultTable)
{
    static int doneCalls = 0;
    doneCalls = 0;
    CMPIResultFT ft{};
    ft.ftVersion = 1;
    ft.returnDone = [](const CMPIResult*) {
        ++doneCalls;
        CMReturn(CMPI_RC_ERR_ALREADY_EXISTS);
    };
    CMPIResult rslt{const_cast<char*>("result"), &ft};
    CMPIStatus st = abi_c_return_done(&rslt);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_ALREADY_EXISTS);
    EXPECT_EQ(st.msg, nullptr);
    EXPECT_EQ(doneCalls, 1);
}

// ---- the embedded host's context extension ----------------------------------

TEST(AbiHostExtension, EmbeddedHostContextIsDetected)
{
    EXPECT_TRUE(CMHasHostExtensions(abi_c_context(ABI_CONTEXT_EMBEDDED_HOST)));
}

TEST(AbiHostExtension, StandardContextWithoutEntryIsNotDetected)
{
    EXPECT_FALSE(CMHasHostExtensions(abi_c_context(ABI_CONTEXT_STANDARD)));
}

TEST(AbiHostExtension, EntryOfWrongTypeIsNotDetected)
{
    EXPECT_FALSE(CMHasHostExtensions(abi_c_context(ABI_CONTEXT_WRONG_TYPE)));
}

TEST(AbiHostExtension, EntryAnnouncingNoSlotsIsNotDetected)
{
    EXPECT_FALSE(CMHasHostExtensions(abi_c_context(ABI_CONTEXT_ZERO_SLOTS)));
}

TEST(AbiHostExtension, NullContextIsNotDetected)
{
    EXPECT_FALSE(CMHasHostExtensions(nullptr));
}

TEST(AbiHostExtension, ReleaseThreadMemoryIsTheSlotAfterAddEntry)
{
    const CMPIContext* ctx = abi_c_context(ABI_CONTEXT_EMBEDDED_HOST);
    using Fn = CMPIStatus (*)(const CMPIContext*);
    Fn eighth = nullptr;
    std::memcpy(&eighth, reinterpret_cast<const unsigned char*>(ctx->ft) + 56, sizeof eighth);
    EXPECT_EQ(eighth, CMContextFTExt(ctx)->releaseThreadMemory);

    unsigned before = abi_c_release_thread_memory_calls();
    CMPIStatus st = CMReleaseThreadMemory(ctx);
    EXPECT_EQ(st.rc, CMPI_RC_OK);
    EXPECT_EQ(abi_c_release_thread_memory_calls(), before + 1);
}

TEST(AbiHostExtension, EntryNameIsStable)
{
    EXPECT_STREQ(CMPI_ORV_HostExtensions, "orvHostExtensions");
}

// ---- convenience macros ------------------------------------------------------

TEST(AbiMacros, SetStatusIgnoresNullPointer)
{
    CMPIStatus* none = nullptr;
    CMSetStatus(none, CMPI_RC_ERR_FAILED);
    abi_c_set_status_with_chars(nullptr, CMPI_RC_ERR_FAILED, "unused");
    SUCCEED() << "no status was written through a null pointer";
}

TEST(AbiMacros, SetStatusFillsCodeAndClearsMessage)
{
    CMPIStatus st = {CMPI_RC_OK, abi_c_new_string("stale")};
    CMPIString* stale = st.msg;
    CMSetStatus(&st, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(st.msg, nullptr);
    CMRelease(stale);
}

TEST(AbiMacros, SetStatusWithCharsMakesMessageThroughBroker)
{
    CMPIStatus st = {CMPI_RC_OK, nullptr};
    abi_c_set_status_with_chars(&st, CMPI_RC_ERR_INVALID_PARAMETER, "bad key");
    EXPECT_EQ(st.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(takeMessage(st), "bad key");
}

TEST(AbiMacros, ReturnMacrosFromCGiveCodeAndMessage)
{
    CMPIStatus plain = abi_c_return_code(CMPI_RC_NEVER_UNLOAD);
    EXPECT_EQ(plain.rc, CMPI_RC_NEVER_UNLOAD);
    EXPECT_EQ(plain.msg, nullptr);
    CMPIStatus withText = abi_c_return_with_chars(CMPI_RC_ERR_NOT_FOUND, "gone");
    EXPECT_EQ(withText.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(takeMessage(withText), "gone");
}

CMPIStatus cppReturnIf(bool fail)
{
    if (fail)
        CMReturnWithChars(abi_c_broker(), CMPI_RC_ERR_FAILED, "failed");
    else
        CMReturn(CMPI_RC_OK);
}

TEST(AbiMacros, ReturnMacrosFromCppWorkAsSingleStatements)
{
    CMPIStatus ok = cppReturnIf(false);
    EXPECT_EQ(ok.rc, CMPI_RC_OK);
    CMPIStatus failed = cppReturnIf(true);
    EXPECT_EQ(failed.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(takeMessage(failed), "failed");
}

TEST(AbiMacros, NullObjectMeansNullPointerOrNullHandle)
{
    const CMPIInstance* none = nullptr;
    CMPIInstance noHandle{nullptr, nullptr};
    EXPECT_TRUE(CMIsNullObject(none));
    EXPECT_TRUE(CMIsNullObject(&noHandle));
    EXPECT_FALSE(CMIsNullObject(abi_c_instance()));
}

TEST(AbiMacros, ValueTestsReadStateAndTypeBits)
{
    CMPIData d{};
    d.type = CMPI_stringA;
    d.state = CMPI_keyValue;
    EXPECT_TRUE(CMIsArray(d));
    EXPECT_TRUE(CMIsKeyValue(d));
    EXPECT_FALSE(CMIsNullValue(d));
    d.type = CMPI_string;
    d.state = CMPI_nullValue | CMPI_keyValue;
    EXPECT_FALSE(CMIsArray(d));
    EXPECT_TRUE(CMIsNullValue(d));
}

TEST(AbiMacros, MessageInsertsTravelAsTypeAndPromotedValue)
{
    CMPIString* msg = abi_c_message_with_inserts(-3, 4000000000u, "x", 1);
    ASSERT_NE(msg, nullptr);
    EXPECT_EQ(takeString(msg), "inserts|sint32=-3;uint32=4000000000;chars=x;boolean=1;");
}

TEST(AbiMacros, StringCharsComeFromTheHandle)
{
    CMPIString* s = abi_c_new_string("hdl text");
    EXPECT_EQ(static_cast<void*>(CMGetCharPtr(s)), s->hdl);
    EXPECT_STREQ(CMGetCharsPtr(s, nullptr), "hdl text");
    CMRelease(s);
}

// ---- the header set ----------------------------------------------------------

TEST(AbiHeaders, EachHeaderCompilesAloneInCAndCpp)
{
    EXPECT_EQ(abi_alone_cmpipl_c(), 1);
    EXPECT_EQ(abi_alone_cmpipl_cpp(), 1);
    EXPECT_EQ(abi_alone_cmpios_c(), 4);
    EXPECT_EQ(abi_alone_cmpios_cpp(), 4);
    EXPECT_EQ(abi_alone_cmpidt_c(), 24);
    EXPECT_EQ(abi_alone_cmpidt_cpp(), 24);
    EXPECT_EQ(abi_alone_cmpift_c(), 40);
    EXPECT_EQ(abi_alone_cmpift_cpp(), 40);
    EXPECT_EQ(abi_alone_cmpimacs_c(), 64);
    EXPECT_EQ(abi_alone_cmpimacs_cpp(), 64);
}

TEST(AbiHeaders, LevelDefaultsTo200AndCanSelect100)
{
    EXPECT_EQ(CMPICurrentVersion, 200);
    EXPECT_EQ(abi_level100_current_version(), 100);
}

TEST(AbiHeaders, ThreadKeyIsThePthreadKey)
{
    EXPECT_TRUE((std::is_same_v<CMPI_THREAD_KEY_TYPE, pthread_key_t>));
}

TEST(AbiHeaders, ContextEntryNamesAreTheStandardStrings)
{
    EXPECT_STREQ(CMPIInitNameSpace, "CMPIInitNameSpace");
    EXPECT_STREQ(CMPIInvocationFlags, "CMPIInvocationFlags");
    EXPECT_STREQ(CMPIPrincipal, "CMPIPrincipal");
    EXPECT_STREQ(CMPIRole, "CMPIRole");
    EXPECT_STREQ(CMPIAcceptLanguage, "CMPIAcceptLanguage");
    EXPECT_STREQ(CMPIContentLanguage, "CMPIContentLanguage");
}

// ---- a provider module made with the stub macros -----------------------------

class AbiStubProvider : public ::testing::TestWithParam<const char*> {
protected:
    void SetUp() override
    {
        lib_ = dlopen(GetParam(), RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(lib_, nullptr) << dlerror();
    }

    void TearDown() override
    {
        if (lib_ != nullptr) {
            dlclose(lib_);
        }
    }

    // Calls the exported factory <symbol> as a broker would.
    template <typename MI>
    MI* create(const char* symbol, CMPIStatus* st)
    {
        using Factory = MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
        void* sym = dlsym(lib_, symbol);
        if (sym == nullptr) {
            ADD_FAILURE() << symbol << " is not exported";
            return nullptr;
        }
        auto factory = reinterpret_cast<Factory>(sym);
        return factory(abi_c_broker(), abi_c_context(ABI_CONTEXT_STANDARD), st);
    }

    // Creates the MI, checks the table header and that a second call gives
    // the same object.
    template <typename MI>
    MI* createChecked(const char* symbol, const char* miName)
    {
        CMPIStatus st = {CMPI_RC_ERR_FAILED, nullptr};
        MI* mi = create<MI>(symbol, &st);
        if (mi == nullptr) {
            return nullptr;
        }
        EXPECT_EQ(st.rc, CMPI_RC_OK);
        if (st.msg != nullptr) {
            CMRelease(st.msg);
        }
        EXPECT_EQ(mi->ft->ftVersion, 200);
        EXPECT_EQ(mi->ft->miVersion, 200);
        EXPECT_STREQ(mi->ft->miName, miName);
        CMPIStatus again = {CMPI_RC_OK, nullptr};
        EXPECT_EQ(create<MI>(symbol, &again), mi);
        if (again.msg != nullptr) {
            CMRelease(again.msg);
        }
        return mi;
    }

    void* lib_ = nullptr;
};

int code(CMPIStatus st)
{
    if (st.msg != nullptr) {
        CMRelease(st.msg);
    }
    return static_cast<int>(st.rc);
}

TEST_P(AbiStubProvider, FactoriesAreExportedAndHelpersStayHidden)
{
    for (const char* type : {"Instance", "Association", "Method", "Property", "Indication"}) {
        std::string symbol = std::string("AbiStub_Create_") + type + "MI";
        EXPECT_NE(dlsym(lib_, symbol.c_str()), nullptr) << symbol;
    }
    EXPECT_EQ(dlsym(lib_, "abi_stub_hidden_helper"), nullptr);
}

TEST_P(AbiStubProvider, InstanceFactoryRunsHookWithBrokerAndStatus)
{
    CMPIStatus st = {CMPI_RC_ERR_FAILED, nullptr};
    CMPIInstanceMI* mi = create<CMPIInstanceMI>("AbiStub_Create_InstanceMI", &st);
    ASSERT_NE(mi, nullptr);
    EXPECT_EQ(st.rc, CMPI_RC_OK);
    EXPECT_EQ(takeMessage(st), "hooked");
}

TEST_P(AbiStubProvider, InstanceStubFillsSlotsInOrder)
{
    auto* mi = createChecked<CMPIInstanceMI>("AbiStub_Create_InstanceMI", "instanceAbiStub");
    ASSERT_NE(mi, nullptr);
    const CMPIInstanceMIFT* ft = mi->ft;
    EXPECT_EQ(code(ft->cleanup(mi, nullptr, 0)), 1);
    EXPECT_EQ(code(ft->enumerateInstanceNames(mi, nullptr, nullptr, nullptr)), 2);
    EXPECT_EQ(code(ft->enumerateInstances(mi, nullptr, nullptr, nullptr, nullptr)), 3);
    EXPECT_EQ(code(ft->getInstance(mi, nullptr, nullptr, nullptr, nullptr)), 4);
    EXPECT_EQ(code(ft->createInstance(mi, nullptr, nullptr, nullptr, nullptr)), 5);
    EXPECT_EQ(code(ft->modifyInstance(mi, nullptr, nullptr, nullptr, nullptr, nullptr)), 6);
    EXPECT_EQ(code(ft->deleteInstance(mi, nullptr, nullptr, nullptr)), 7);
    EXPECT_EQ(code(ft->execQuery(mi, nullptr, nullptr, nullptr, "q", "l")), 8);
}

TEST_P(AbiStubProvider, AssociationStubFillsSlotsInOrder)
{
    auto* mi =
        createChecked<CMPIAssociationMI>("AbiStub_Create_AssociationMI", "associationAbiStub");
    ASSERT_NE(mi, nullptr);
    const CMPIAssociationMIFT* ft = mi->ft;
    EXPECT_EQ(code(ft->cleanup(mi, nullptr, 1)), 1);
    EXPECT_EQ(code(ft->associators(mi, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                   nullptr, nullptr)),
              2);
    EXPECT_EQ(code(ft->associatorNames(mi, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                       nullptr)),
              3);
    EXPECT_EQ(code(ft->references(mi, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr)), 4);
    EXPECT_EQ(code(ft->referenceNames(mi, nullptr, nullptr, nullptr, nullptr, nullptr)), 5);
}

TEST_P(AbiStubProvider, MethodStubAnswersThroughTheStoredBroker)
{
    auto* mi = createChecked<CMPIMethodMI>("AbiStub_Create_MethodMI", "methodAbiStub");
    ASSERT_NE(mi, nullptr);
    EXPECT_EQ(code(mi->ft->cleanup(mi, nullptr, 0)), 1);
    CMPIStatus st = mi->ft->invokeMethod(mi, nullptr, nullptr, nullptr, "Reboot", nullptr, nullptr);
    EXPECT_EQ(st.rc, 2);
    EXPECT_EQ(takeMessage(st), "Reboot");
}

TEST_P(AbiStubProvider, PropertyStubReceivesDataByValue)
{
    auto* mi = createChecked<CMPIPropertyMI>("AbiStub_Create_PropertyMI", "propertyAbiStub");
    ASSERT_NE(mi, nullptr);
    const CMPIPropertyMIFT* ft = mi->ft;
    CMPIData data{};
    data.type = CMPI_uint32;
    data.value.uint32 = 9;
    EXPECT_EQ(code(ft->cleanup(mi, nullptr, 0)), 1);
    EXPECT_EQ(code(ft->setProperty(mi, nullptr, nullptr, nullptr, "P", data)), 9);
    EXPECT_EQ(code(ft->getProperty(mi, nullptr, nullptr, nullptr, "P")), 3);
    EXPECT_EQ(code(ft->setPropertyWithOrigin(mi, nullptr, nullptr, nullptr, "P", data, "O")), 4);
}

TEST_P(AbiStubProvider, IndicationStubFillsEnableAndDisable)
{
    auto* mi =
        createChecked<CMPIIndicationMI>("AbiStub_Create_IndicationMI", "IndicationAbiStub");
    ASSERT_NE(mi, nullptr);
    const CMPIIndicationMIFT* ft = mi->ft;
    EXPECT_EQ(code(ft->cleanup(mi, nullptr, 0)), 1);
    EXPECT_EQ(code(ft->authorizeFilter(mi, nullptr, nullptr, "C", nullptr, "owner")), 2);
    EXPECT_EQ(code(ft->mustPoll(mi, nullptr, nullptr, "C", nullptr)), 3);
    EXPECT_EQ(code(ft->activateFilter(mi, nullptr, nullptr, "C", nullptr, 1)), 4);
    EXPECT_EQ(code(ft->deActivateFilter(mi, nullptr, nullptr, "C", nullptr, 1)), 5);
    ASSERT_NE(ft->enableIndications, nullptr);
    ASSERT_NE(ft->disableIndications, nullptr);
    EXPECT_EQ(code(ft->enableIndications(mi, nullptr)), 6);
    EXPECT_EQ(code(ft->disableIndications(mi, nullptr)), 7);
}

INSTANTIATE_TEST_SUITE_P(BuiltAsCAndCpp, AbiStubProvider,
                         ::testing::Values(ABI_STUB_PROVIDER_C, ABI_STUB_PROVIDER_CPP));

}  // namespace
