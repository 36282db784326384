// A provider's own thread calls back into the broker while the broker runs the
// provider's factory, and again while it cleans the provider up; the factory
// and the cleanup each wait for that up-call (tests/core/upcallprovider). The
// core runs both without the lock that routing an up-call takes, so the up-call
// is answered at once; were the lock held, the provider's bounded wait would
// run out and its log would say so.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using ::testing::HasSubstr;

class ProviderThreadUpcallTest : public ::testing::Test {
protected:
    void SetUp() override {
        log_ = std::filesystem::temp_directory_path() / ("upcallprovider-" + std::to_string(::getpid()) + ".log");
        std::filesystem::remove(log_);
        ::setenv("UPCALL_PROVIDER_LOG", log_.c_str(), 1);
        CoreConfig config;
        config.providerDirs = {buildDir() / "lib"};
        config.registrationFiles = {sourceDir() / "tests/core/upcallprovider/upcallprovider.reg"};
        config.mofPaths = {sourceDir() / "tests/core/upcallprovider/upcallprovider.mof"};
        core_ = std::make_unique<BrokerCore>(config);
        ObjectScope scope;
        const CMPIBroker* mb = core_->broker();
        Reply reply = core_->enumerateInstanceNames(mb->eft->newObjectPath(mb, "root/cimv2", "Upcall_Element", nullptr));
        ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
        ASSERT_EQ(reply.objectPaths().size(), 1U);
    }

    void TearDown() override {
        core_.reset();
        ::unsetenv("UPCALL_PROVIDER_LOG");
        std::filesystem::remove(log_);
    }

    std::string providerLog() const {
        std::ifstream in(log_);
        std::stringstream all;
        all << in.rdbuf();
        return all.str();
    }

    std::filesystem::path log_;
    std::unique_ptr<BrokerCore> core_;
};

TEST_F(ProviderThreadUpcallTest, UpcallWhileTheFactoryRunsReachesTheOtherProvider) {
    EXPECT_EQ(providerLog(), "factory up-call: rc=0 names=1\n");
}

TEST_F(ProviderThreadUpcallTest, UpcallWhileTheShutdownCleansTheProviderUpIsAnsweredAsRefused) {
    core_->shutdown();
    // Once the shutdown has begun the core routes no more requests: the up-call
    // comes back at once, failed, instead of waiting for the cleanup to end.
    EXPECT_EQ(providerLog(), "factory up-call: rc=0 names=1\ncleanup up-call: rc=1 names=0\n");
}

}  // namespace
}  // namespace orv::host::test
