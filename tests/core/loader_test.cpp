// Loading providers: libraries, factories, failures reported with the dynamic
// loader's text, garbage MIs, shutdown order and idle unloading.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using LoaderTest = CoreTest;
using ::testing::HasSubstr;

TEST_F(LoaderTest, NoLibraryIsLoadedBeforeTheFirstRequest) {
    EXPECT_TRUE(core_->loadedLibraries().empty());
    core_->enumerateInstances(path("Raw_SubElement"));
    EXPECT_EQ(core_->loadedLibraries(), std::vector<std::string>{"rawtestprovider"});
}

TEST_F(LoaderTest, MissingLibraryAnswersFailedWithTheDlerrorText) {
    Reply reply = core_->enumerateInstances(path("Raw_Missing"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_THAT(reply.message(), HasSubstr("librawmissing.so: cannot open shared object file"));
    // The same answer again: the failure is remembered.
    EXPECT_EQ(core_->getInstance(path("Raw_Missing", "x")).message(), reply.message());
}

TEST_F(LoaderTest, MissingFactoryAnswersFailedWithTheDlerrorText) {
    Reply reply = core_->enumerateInstances(path("Raw_NoFactory"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_THAT(reply.message(), HasSubstr("NoSuchProvider_Create_InstanceMI"));
    EXPECT_THAT(reply.message(), HasSubstr("undefined symbol"));
}

TEST_F(LoaderTest, FailingFactoryAnswersFailedWithItsMessage) {
    Reply reply = core_->enumerateInstances(path("Raw_FactoryFails"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_THAT(reply.message(), HasSubstr("Error initializing provider RawFailingProvider"));
    EXPECT_THAT(reply.message(), HasSubstr("factory refused"));
}

TEST_F(LoaderTest, MiWithoutFunctionTableIsRefused) {
    Reply reply = core_->enumerateInstances(path("Raw_NullTable"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_THAT(reply.message(), HasSubstr("without a function table"));
}

TEST_F(LoaderTest, MissingMiSlotAnswersFailedInsteadOfCrashing) {
    Reply reply = core_->enumerateInstances(path("Raw_Garbage"));
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_FAILED);
    EXPECT_THAT(reply.message(), HasSubstr("has no enumerateInstances"));
}

TEST_F(LoaderTest, GarbageHandedToTheResultGetsErrorStatuses) {
    Reply reply = core_->enumerateInstances(path("Raw_SubElement"), as("garbage"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    ASSERT_EQ(reply.items().size(), 4U);  // only the four status codes it reported
    EXPECT_EQ(reply.items()[0].data.value.uint32, static_cast<CMPIUint32>(CMPI_RC_ERR_INVALID_PARAMETER));
    EXPECT_EQ(reply.items()[1].data.value.uint32, static_cast<CMPIUint32>(CMPI_RC_ERR_INVALID_HANDLE));
    EXPECT_EQ(reply.items()[2].data.value.uint32, static_cast<CMPIUint32>(CMPI_RC_ERR_INVALID_PARAMETER));
    EXPECT_EQ(reply.items()[3].data.value.uint32, static_cast<CMPIUint32>(CMPI_RC_ERR_INVALID_DATA_TYPE));
}

TEST_F(LoaderTest, FactoryContextHasFlagsPrincipalAndParameters) {
    core_->invokeMethod(path("Raw_Element", "m"), "Echo", nullptr);
    EXPECT_THAT(providerLog(),
                HasSubstr("factory RawElementProvider Method flags=0 principal=$$ params=mode=element limit=5"));
}

TEST_F(LoaderTest, OneMiPerProviderNameAndKind) {
    core_->enumerateInstances(path("Raw_SubElement"));
    core_->enumerateInstances(path("Raw_OtherSub"));
    core_->enumerateInstances(path("Raw_SubElement"));
    std::string log = providerLog();
    std::size_t first = log.find("factory RawSubProvider Instance");
    ASSERT_NE(first, std::string::npos);
    EXPECT_EQ(log.find("factory RawSubProvider Instance", first + 1), std::string::npos);
}

TEST_F(LoaderTest, ShutdownDisablesIndicationsThenCleansUpEveryProviderAndKindOnce) {
    core_->enumerateInstances(path("Raw_Base"));
    core_->invokeMethod(path("Raw_Element", "m"), "Echo", nullptr);
    core_->associators(path("Raw_Element", "a"), nullptr, nullptr, nullptr, nullptr);
    ASSERT_EQ(core_->activateFilter("root/cimv2", "SELECT * FROM Raw_Indication").rc(), CMPI_RC_OK);
    core_->shutdown();
    std::string log = providerLog();
    std::size_t disable = log.find("disableIndications");
    ASSERT_NE(disable, std::string::npos);
    // RawSubProvider's instance MI lives in the same library as RawElementProvider's:
    // each provider is still cleaned up, once.
    for (const char* line : {"cleanup RawElementProvider terminating=1", "cleanup RawElementProvider Method terminating=1",
                             "cleanup RawSubProvider terminating=1",
                             "cleanup RawAssocProvider Association terminating=1",
                             "cleanup RawIndicationProvider Indication terminating=1"}) {
        std::size_t at = log.find(line);
        ASSERT_NE(at, std::string::npos) << line << "\n" << log;
        EXPECT_GT(at, disable) << line;
        EXPECT_EQ(log.find(line, at + 1), std::string::npos) << "twice: " << line;
    }
    EXPECT_TRUE(core_->loadedLibraries().empty());
    EXPECT_EQ(core_->enumerateInstances(path("Raw_SubElement")).rc(), CMPI_RC_ERR_FAILED);
    core_->shutdown();  // idempotent
}

TEST_F(LoaderTest, IdleUnloadCleansUpAndReloadsOnTheNextRequest) {
    core_->enumerateInstances(path("Raw_SubElement"));
    EXPECT_EQ(core_->unloadIdleProviders(), 1U);
    EXPECT_THAT(providerLog(), HasSubstr("cleanup RawSubProvider terminating=0"));
    EXPECT_TRUE(core_->loadedLibraries().empty());
    EXPECT_EQ(core_->enumerateInstances(path("Raw_SubElement")).instances().size(), 2U);
    EXPECT_EQ(core_->loadedLibraries().size(), 1U);
}

TEST_F(LoaderTest, DoNotUnloadKeepsTheLibraryAndAsksAgain) {
    ::setenv("RAW_PROVIDER_CLEANUP_RC", "50", 1);
    core_->enumerateInstances(path("Raw_SubElement"));
    EXPECT_EQ(core_->unloadIdleProviders(), 0U);
    EXPECT_EQ(core_->unloadIdleProviders(), 0U);
    std::string log = providerLog();
    std::size_t first = log.find("terminating=0");
    ASSERT_NE(first, std::string::npos);
    EXPECT_NE(log.find("terminating=0", first + 1), std::string::npos);  // asked twice
    ::setenv("RAW_PROVIDER_CLEANUP_RC", "0", 1);
    EXPECT_EQ(core_->unloadIdleProviders(), 1U);
}

TEST_F(LoaderTest, NeverUnloadEndsIdleUnloadingForGood) {
    ::setenv("RAW_PROVIDER_CLEANUP_RC", "51", 1);
    core_->enumerateInstances(path("Raw_SubElement"));
    EXPECT_EQ(core_->unloadIdleProviders(), 0U);
    ::setenv("RAW_PROVIDER_CLEANUP_RC", "0", 1);
    EXPECT_EQ(core_->unloadIdleProviders(), 0U);
    std::string log = providerLog();
    std::size_t first = log.find("terminating=0");
    EXPECT_EQ(log.find("terminating=0", first + 1), std::string::npos);  // never asked again
}

TEST_F(LoaderTest, UnloadNeverRegistrationIsNotAskedToUnload) {
    ASSERT_EQ(core_->enableIndications("root/cimv2", "Raw_Indication").rc(), CMPI_RC_OK);
    EXPECT_EQ(core_->unloadIdleProviders(), 0U);
    EXPECT_EQ(providerLog().find("terminating=0"), std::string::npos);
}

}  // namespace
}  // namespace orv::host::test
