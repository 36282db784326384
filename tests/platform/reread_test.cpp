// A running simulated host follows its fixture file.
#include <gtest/gtest.h>

#include <memory>
#include <utility>

#include "KsiHelpers.h"
#include "SimHost.h"
#include "tmkctl/network/NetworkInfoImpl.h"
#include "tmkctl/util/AutoVector.h"

namespace orv::platform::test {
namespace {

using TmkCtl::Network::NetworkInfoImpl;

TEST(FixtureReread, ChangedFileIsSeenByTheNextRequest)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    EXPECT_EQ(TmkCtl::Util::AutoVector<NodeMgr::Network::Pnic>(NetworkInfoImpl().GetPnics()).size(), 4u);
    fixture["nics"].erase(3);
    host.rewrite(fixture);
    EXPECT_EQ(TmkCtl::Util::AutoVector<NodeMgr::Network::Pnic>(NetworkInfoImpl().GetPnics()).size(), 3u);
}

TEST(FixtureReread, WithinOneBatchTheDataStaysAsItWas)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    ASSERT_EQ(checkSignature(), KSI_OK);
    fixture["cpu"]["powerPolicy"]["shortName"] = "static";
    host.rewrite(fixture);
    PowerKsi_Policy policy;
    ASSERT_EQ(KSI_Get(KSI_NODE_power_currentPolicy, nullptr, &policy, sizeof policy), KSI_OK);
    EXPECT_STREQ(policy.shortName, "dynamic");
    ASSERT_EQ(checkSignature(), KSI_OK);
    ASSERT_EQ(KSI_Get(KSI_NODE_power_currentPolicy, nullptr, &policy, sizeof policy), KSI_OK);
    EXPECT_STREQ(policy.shortName, "static");
}

TEST(FixtureReread, BrokenThenFixedFileRecovers)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    testing::internal::CaptureStderr();
    host.rewriteText("{ broken");
    EXPECT_NE(checkSignature(), KSI_OK);
    EXPECT_NE(checkSignature(), KSI_OK);  // unchanged: not reported again
    const std::string reported = testing::internal::GetCapturedStderr();
    EXPECT_EQ(reported.find("rejected"), reported.rfind("rejected")) << reported;
    EXPECT_NE(reported.find("rejected"), std::string::npos) << reported;
    host.rewrite(fixture);
    EXPECT_EQ(checkSignature(), KSI_OK);
}

TEST(FixtureReread, NicsAreFoundByTheirNamesInTheRewrittenFile)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    std::unique_ptr<NodeMgr::Network::Pnic> before(NetworkInfoImpl().GetPnicByName("vmnic3"));
    ASSERT_NE(before, nullptr);
    fixture["nics"].erase(3);
    fixture["nics"][0]["name"] = "vmnic9";
    fixture["nics"][0]["mtu"] = 1234;
    std::swap(fixture["nics"][0], fixture["nics"][2]);
    host.rewrite(fixture);
    EXPECT_EQ(NetworkInfoImpl().GetPnicByName("vmnic3"), nullptr);
    EXPECT_EQ(NetworkInfoImpl().GetPnicByName("vmnic0"), nullptr);
    std::unique_ptr<NodeMgr::Network::Pnic> renamed(NetworkInfoImpl().GetPnicByName("vmnic9"));
    ASSERT_NE(renamed, nullptr);
    EXPECT_EQ(renamed->GetName(), "vmnic9");
    EXPECT_EQ(renamed->GetMTU(), 1234u);
    std::unique_ptr<NodeMgr::Network::Pnic> moved(NetworkInfoImpl().GetPnicByName("vmnic2"));
    ASSERT_NE(moved, nullptr);
    EXPECT_EQ(moved->GetName(), "vmnic2");
    // A NIC handed out before keeps the host it was made from.
    EXPECT_EQ(before->GetName(), "vmnic3");
}

TEST(FixtureReread, FaultCountersStartAgainWithANewFile)
{
    Json fixture = defaultHost();
    addFault(fixture, {{"call", "KSI_CheckSig"}, {"nth", 1}});
    SimHost host(fixture);
    EXPECT_NE(checkSignature(), KSI_OK);
    EXPECT_EQ(checkSignature(), KSI_OK);
    fixture["host"]["name"] = "renamed";
    host.rewrite(fixture);
    EXPECT_NE(checkSignature(), KSI_OK);
}

} // namespace
} // namespace orv::platform::test

#include <atomic>
#include <thread>

namespace orv::platform::test {
namespace {

TEST(FixtureReread, ConcurrentRequestsWhileTheFileChanges)
{
    Json fixture = defaultHost();
    SimHost host(fixture);
    std::atomic<bool> stop{false};
    std::atomic<int> requests{0};
    auto worker = [&] {
        while (!stop.load()) {
            TmkCtl::Util::AutoVector<NodeMgr::Network::Pnic> pnics = NetworkInfoImpl().GetPnics();
            EXPECT_GE(pnics.size(), 3u);
            for (NodeMgr::Network::Pnic* pnic : pnics) {
                EXPECT_FALSE(pnic->GetName().empty());
            }
            EXPECT_EQ(checkSignature(), KSI_OK);
            ++requests;
        }
    };
    std::thread first(worker);
    std::thread second(worker);
    for (int i = 0; i < 20; ++i) {
        fixture["nics"][0]["mtu"] = 1500 + i;
        if (i % 2 == 0) {
            fixture["nics"].push_back(defaultHost()["nics"][0]);
            fixture["nics"].back()["name"] = "extra" + std::to_string(i);
        }
        host.rewrite(fixture);
    }
    while (requests.load() < 50) {
        std::this_thread::yield();
    }
    stop = true;
    first.join();
    second.join();
}

} // namespace
} // namespace orv::platform::test
