// testAndSend racing enableIndication / disableIndication / isEnabled while
// the host changes: every call returns, and what is delivered is whole.
#include <atomic>
#include <thread>

#include "IpIndicationFixture.h"

namespace ipindication {
namespace {

using DetectorConcurrencyTest = IpIndicationTest;

std::vector<Vnic> hostNumber(int round) {
    const std::string last = std::to_string(5 + round % 2);
    return {Vnic{"vif0", {{"10.0.0." + last, "255.255.255.0"}}, {{"fd00::" + last, 64}}},
            Vnic{"vif1", {{"10.0.1.5", "255.255.255.0"}}, {}}};
}

TEST_F(DetectorConcurrencyTest, TestAndSendRacesEnableAndDisableSafely) {
    constexpr int kRounds = 40;
    serve(hostNumber(0));
    std::atomic<bool> done{false};
    std::thread checker([&] {
        while (!done.load()) {
            testAndSend();
        }
    });
    std::thread toggler([&] {
        for (int i = 0; !done.load(); ++i) {
            if (i % 2 == 0) {
                detector().enableIndication();
            } else {
                detector().disableIndication();
            }
            (void)detector().isEnabled();
        }
    });
    for (int round = 1; round <= kRounds; ++round) {
        serve(hostNumber(round));
        detector().poll();
        std::this_thread::yield();
    }
    done = true;
    checker.join();
    toggler.join();

    // Every delivered indication replaced one vif0 address by the other of its family.
    for (const Delivered& delivered : recorder().delivered()) {
        ASSERT_EQ(delivered.properties.size(), 7U);
        EXPECT_EQ(delivered.properties[0].text, "Orvane:vif0");
        EXPECT_EQ(delivered.sourceInstance.size(), 9U);
        EXPECT_EQ(delivered.previousInstance.size(), 9U);
        EXPECT_NE(delivered.sourceInstance[7].text, delivered.previousInstance[7].text);
    }

    // Still a working detector afterwards.
    detector().enableIndication();
    testAndSend();
    recorder().clear();
    serve(hostNumber(kRounds + 1));
    testAndSend();
    EXPECT_EQ(recorder().count(), 2U);
}

}  // namespace
}  // namespace ipindication
