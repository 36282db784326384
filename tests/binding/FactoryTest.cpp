// The exported factories of a provider library built with the binding, called
// as the broker's loader calls them: load the library, look the factory up by
// name, call it, and inspect the MI record, its function table and the
// provider object behind it.
#include "ProviderLibrary.h"

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiProviderBase.h>
#include <orv/testsupport/StderrCapture.h>

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <typeinfo>

namespace {

using orv::bindingtest::ProviderLibrary;

const std::string kTraceLine = "--- _Create_InstanceMI() P10CmpiBaseMI\n";

CmpiBaseMI* providerOf(const void* hdl) { return static_cast<CmpiBaseMI*>(const_cast<void*>(hdl)); }

int useCountOf(const void* hdl) { return providerOf(hdl)->getProviderBase()->getUseCount(); }

class FactoryTest : public ::testing::Test {
protected:
    ProviderLibrary& lib = ProviderLibrary::instance();
};

TEST_F(FactoryTest, InstanceEntryPointCalledTwiceSharesOneObjectInitializedOnceWithUseCountTwo) {
    const unsigned constructionsBefore = lib.constructions();
    const unsigned initializationsBefore = lib.initializations();
    orv::testsupport::StderrCapture stderrCapture;
    CMPIInstanceMI* first = lib.createInstanceMI("TestElementProvider");
    CMPIInstanceMI* second = lib.createInstanceMI("TestElementProvider");
    const std::string trace = stderrCapture.finish();

    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first, second);
    EXPECT_EQ(first->hdl, second->hdl);
    EXPECT_EQ(lib.constructions(), constructionsBefore + 1);
    EXPECT_EQ(lib.initializations(), initializationsBefore + 1);
    EXPECT_EQ(useCountOf(first->hdl), 2);
    EXPECT_EQ(trace, kTraceLine + kTraceLine);

    lib.cleanupAll(first);
}

TEST_F(FactoryTest, InstanceFunctionTableCarriesVersion200AndKindWordPlusProviderName) {
    CMPIInstanceMI* mi = lib.createInstanceMI("TestElementProvider");
    EXPECT_EQ(mi->ft->ftVersion, 200);
    EXPECT_EQ(mi->ft->miVersion, 200);
    EXPECT_STREQ(mi->ft->miName, "instanceTestElementProvider");
    lib.cleanupAll(mi);
}

TEST_F(FactoryTest, BothEntryPointsOfOneProviderNameYieldTwoRecordsWithTheSameHandle) {
    orv::testsupport::StderrCapture stderrCapture;
    CMPIInstanceMI* inst = lib.createInstanceMI("TestLinkProvider");
    CMPIAssociationMI* assoc = lib.createAssociationMI("TestLinkProvider");
    const std::string trace = stderrCapture.finish();

    EXPECT_NE(static_cast<void*>(inst), static_cast<void*>(assoc));
    EXPECT_EQ(inst->hdl, assoc->hdl);
    EXPECT_EQ(assoc->ft->ftVersion, 200);
    EXPECT_EQ(assoc->ft->miVersion, 200);
    EXPECT_STREQ(assoc->ft->miName, "associationTestLinkProvider");
    EXPECT_EQ(useCountOf(inst->hdl), 2);
    // Only the instance entry point writes the trace line.
    EXPECT_EQ(trace, kTraceLine);

    lib.cleanupAll(inst);
}

TEST_F(FactoryTest, TwoProviderNamesOfTheSameClassYieldTwoDistinctObjects) {
    CMPIInstanceMI* element = lib.createInstanceMI("TestElementProvider");
    CMPIInstanceMI* twin = lib.createInstanceMI("TestTwinProvider");

    EXPECT_NE(element->hdl, twin->hdl);
    EXPECT_STREQ(typeid(*providerOf(element->hdl)).name(), typeid(*providerOf(twin->hdl)).name());
    EXPECT_STREQ(twin->ft->miName, "instanceTestTwinProvider");

    lib.cleanupAll(element);
    lib.cleanupAll(twin);
}

TEST_F(FactoryTest, ThrowingConstructorPassesTheExceptionOnAndStoresNoObject) {
    const auto factory = lib.instanceFactory("TestFragileProvider");
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    try {
        factory(nullptr, nullptr, &rc);
        FAIL() << "the factory returned";
    } catch (const std::runtime_error& e) {
        EXPECT_STREQ(e.what(), "constructor refused");
    }
    // The next call tries to build the object again: nothing was stored.
    EXPECT_THROW(factory(nullptr, nullptr, &rc), std::runtime_error);
}

TEST_F(FactoryTest, CleanupKeepsTheObjectUntilItsLastUseAndTheNextFactoryCallBuildsAFreshOne) {
    CMPIInstanceMI* mi = lib.createInstanceMI("TestElementProvider");
    lib.createInstanceMI("TestElementProvider");
    const unsigned constructions = lib.constructions();

    CMPIStatus st = mi->ft->cleanup(mi, nullptr, 0);
    EXPECT_EQ(st.rc, CMPI_RC_OK);
    EXPECT_EQ(useCountOf(mi->hdl), 1);
    st = mi->ft->cleanup(mi, nullptr, 0);
    EXPECT_EQ(st.rc, CMPI_RC_OK);

    CMPIInstanceMI* again = lib.createInstanceMI("TestElementProvider");
    EXPECT_EQ(lib.constructions(), constructions + 1);
    EXPECT_EQ(useCountOf(again->hdl), 1);
    lib.cleanupAll(again);
}

TEST_F(FactoryTest, CreateInstanceIsRefusedAsNotSupportedByDefault) {
    CMPIInstanceMI* mi = lib.createInstanceMI("TestElementProvider");
    CMPIStatus st = mi->ft->createInstance(mi, nullptr, nullptr, nullptr, nullptr);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(st.msg, nullptr);
    lib.cleanupAll(mi);
}

}  // namespace
