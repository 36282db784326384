// Which changes of the interface list the detector reports, between two
// testAndSend calls on a simulated host that the test rewrites.
#include <syslog.h>

#include "IpIndicationFixture.h"
#include "orv/testsupport/SyslogCapture.h"

namespace ipindication {
namespace {

using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

const std::string kRefreshFailure = "Unable to refresh network interface information of the system, Error: ";

class IpChangeDetectionTest : public IpIndicationTest {
protected:
    // Serves `before`, switches the detector on, serves `after`, then one testAndSend.
    std::vector<Delivered> across(const std::vector<Vnic>& before, const std::vector<Vnic>& after) {
        serve(before);
        detector().enableIndication();
        serve(after);
        from_ = std::time(nullptr);
        testAndSend();
        to_ = std::time(nullptr);
        return recorder().delivered();
    }

    std::time_t from_ = 0;
    std::time_t to_ = 0;
    SyslogCapture syslog_;
};

TEST_F(IpChangeDetectionTest, ReplacedIpv4AddressGivesOneIndicationWithTheNewAddressAsSource) {
    const std::vector<Delivered> delivered =
        across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, {Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}});
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], "vif0", ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"),
                     ipv4Endpoint("vif0", "10.0.0.6", "255.255.255.0"), from_, to_);
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{});
}

TEST_F(IpChangeDetectionTest, ReplacedIpv6AddressIsReportedUnderIPv6ddress) {
    const std::vector<Delivered> delivered =
        across({Vnic{"vif1", std::nullopt, {{"fe80::1", 64}, {"fd00::5", 64}}}},
               {Vnic{"vif1", std::nullopt, {{"fe80::1", 64}, {"fd00::6", 56}}}});
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], "vif1", ipv6Endpoint("vif1", "fd00::5", 64), ipv6Endpoint("vif1", "fd00::6", 56),
                     from_, to_);
}

TEST_F(IpChangeDetectionTest, AddingASecondAddressGivesNoIndication) {
    EXPECT_EQ(across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {{"fd00::5", 64}}}},
                     {Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {{"fd00::5", 64}, {"fd00::6", 64}}}})
                  .size(),
              0U);
}

TEST_F(IpChangeDetectionTest, RemovingAnAddressGivesNoIndication) {
    EXPECT_EQ(across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {{"fd00::5", 64}, {"fd00::6", 64}}}},
                     {Vnic{"vif0", std::nullopt, {{"fd00::6", 64}}}})
                  .size(),
              0U);
}

TEST_F(IpChangeDetectionTest, BringingUpANewInterfaceGivesNoIndication) {
    EXPECT_EQ(across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}},
                     {Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}},
                      Vnic{"vif1", {{"10.0.1.5", "255.255.255.0"}}, {{"fd01::5", 64}}}})
                  .size(),
              0U);
}

TEST_F(IpChangeDetectionTest, ChangeOfFamilyGivesNoIndication) {
    EXPECT_EQ(across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, {Vnic{"vif0", std::nullopt, {{"fd00::5", 64}}}})
                  .size(),
              0U);
}

TEST_F(IpChangeDetectionTest, Ipv4NetmaskChangeAloneCountsAsAReplacement) {
    const std::vector<Delivered> delivered =
        across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, {Vnic{"vif0", {{"10.0.0.5", "255.255.0.0"}}, {}}});
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], "vif0", ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"),
                     ipv4Endpoint("vif0", "10.0.0.5", "255.255.0.0"), from_, to_);
}

TEST_F(IpChangeDetectionTest, Ipv6PrefixChangeAloneIsNoReplacement) {
    EXPECT_EQ(across({Vnic{"vif0", std::nullopt, {{"fd00::5", 64}}}}, {Vnic{"vif0", std::nullopt, {{"fd00::5", 48}}}})
                  .size(),
              0U);
}

TEST_F(IpChangeDetectionTest, TestAndSendWhileDisabledDoesNothingNotEvenARefresh) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, Json::array({{{"call", "getifaddrs"}}})));
    testAndSend();
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{}) << "a disabled detector read the interface list";
    EXPECT_FALSE(detector().isEnabled());

    // Snapshots taken, then switched off: a change made while off is not
    // looked at until the detector is on again.
    serve({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    detector().disableIndication();
    EXPECT_FALSE(detector().isEnabled());
    serve({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}});
    testAndSend();
    EXPECT_EQ(recorder().count(), 0U);
    detector().enableIndication();
    EXPECT_TRUE(detector().isEnabled());
    from_ = std::time(nullptr);
    testAndSend();
    to_ = std::time(nullptr);
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], "vif0", ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"),
                     ipv4Endpoint("vif0", "10.0.0.6", "255.255.255.0"), from_, to_);
}

TEST_F(IpChangeDetectionTest, EveryVanishedAddressOfTheFamilyGivesItsOwnIndication) {
    const std::vector<Delivered> delivered =
        across({Vnic{"vif0", std::nullopt, {{"fd00::5", 64}, {"fd00::6", 64}}}},
               {Vnic{"vif0", std::nullopt, {{"fd00::7", 64}}}});
    ASSERT_EQ(delivered.size(), 2U);
    expectIndication(delivered[0], "vif0", ipv6Endpoint("vif0", "fd00::5", 64), ipv6Endpoint("vif0", "fd00::7", 64),
                     from_, to_);
    expectIndication(delivered[1], "vif0", ipv6Endpoint("vif0", "fd00::6", 64), ipv6Endpoint("vif0", "fd00::7", 64),
                     from_, to_);
}

TEST_F(IpChangeDetectionTest, AReplacementIsReportedOnceAndNotAgain) {
    across({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, {Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}});
    ASSERT_EQ(recorder().count(), 1U);
    testAndSend();
    EXPECT_EQ(recorder().count(), 1U);
}

TEST_F(IpChangeDetectionTest, UnreadableInterfaceListIsLoggedAndTheSnapshotsKept) {
    serve({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    serve(hostWith({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}},
                   Json::array({{{"call", "getifaddrs"}, {"status", -11}}})));
    testAndSend();
    EXPECT_EQ(recorder().count(), 0U);
    EXPECT_EQ(syslog_.lines(), (std::vector<SyslogLine>{{LOG_ERR, kRefreshFailure + "System error\n"},
                                                        {LOG_ERR, kRefreshFailure + "System error\n"}}));
    serve({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}});
    testAndSend();
    EXPECT_EQ(recorder().count(), 1U) << "the previous snapshot still held the old address";
}

TEST_F(IpChangeDetectionTest, PreviousSnapshotIsTakenAfreshFromTheSystemAfterEachTestAndSend) {
    serve({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    // Counted from this host on: the first read refreshes the current
    // snapshot, the second (failing) would take the previous one again.
    serve(hostWith({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}},
                   Json::array({{{"call", "getifaddrs"}, {"nth", 2}}})));
    testAndSend();
    EXPECT_EQ(recorder().count(), 1U);
    EXPECT_EQ(syslog_.lines(), (std::vector<SyslogLine>{{LOG_ERR, kRefreshFailure + "Bad value for ai_flags\n"}}));
    // The previous snapshot was not copied from the current one, so it still
    // holds the old address and the replacement is reported again.
    testAndSend();
    ASSERT_EQ(recorder().count(), 2U);
    EXPECT_EQ(recorder().delivered()[1].previousInstance, ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"));
    testAndSend();
    EXPECT_EQ(recorder().count(), 2U);
}

TEST_F(IpChangeDetectionTest, EntriesWithoutAnAddressOrOfAnotherFamilyAreSkipped) {
    const Json injected = Json::array({injectedEntry("vif0", nullptr), injectedEntry("vif0", 17),
                                       injectedEntry("vif0", 99), injectedEntry("vif0", nullptr)});
    serve(hostWith({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}}, injected));
    detector().enableIndication();
    serve(hostWith({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}}, injected));
    testAndSend();
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 1U);
    EXPECT_EQ(delivered[0].previousInstance, ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"));
    EXPECT_EQ(syslog_.lines(), std::vector<SyslogLine>{});
}

}  // namespace
}  // namespace ipindication
