// The host's thread-memory release is called only where the broker offers it.
#include "CoreFixture.h"

#include <cmpi/CmpiContext.h>

namespace {

using ContextTest = orv::bindingtest::CoreFixture;

// A context table ending at addEntry, as sfcb's does, whose getEntry knows no entry.
CMPIData noEntry(const CMPIContext*, const char*, CMPIStatus* rc) {
    if (rc != nullptr) *rc = CMPIStatus{CMPI_RC_ERR_NO_SUCH_PROPERTY, nullptr};
    CMPIData d{};
    d.type = CMPI_null;
    d.state = CMPI_notFound;
    return d;
}

CMPIContextFT sfcbLikeTable = {1, nullptr, nullptr, noEntry, nullptr, nullptr, nullptr};
int sfcbLikeHandle = 0;
CMPIContext sfcbLikeContext = {&sfcbLikeHandle, &sfcbLikeTable};

TEST_F(ContextTest, BrokerWithoutTheExtensionIsDetectedAndReleaseDoesNothing) {
    CmpiContext ctx(&sfcbLikeContext);
    EXPECT_FALSE(ctx.hasThreadMemoryRelease());
    EXPECT_NO_THROW(ctx.releaseThreadMemory());
}

TEST_F(ContextTest, EmbeddedHostContextOffersTheRelease) {
    orv::host::Reply reply = core->getInstance(path("Test_Element", "self"));
    ASSERT_EQ(reply.instances().size(), 1u);
    CMPIData offered = reply.instances()[0]->ft->getProperty(reply.instances()[0], "HostExtensions", nullptr);
    EXPECT_EQ(offered.type, CMPI_boolean);
    EXPECT_EQ(offered.value.boolean, 1);
}

}  // namespace
