// Client requests racing health passes: every request sees a whole pass's
// records, never a half-built one, and nothing fails.
#include <atomic>
#include <thread>

#include "LatchedHealthFixture.h"

namespace latched {
namespace {

using ConcurrencyTest = LatchedHealthTest;

std::vector<Json> sensorsAt(int state, int count) {
    std::vector<Json> elements;
    for (int i = 0; i < count; ++i) {
        elements.push_back(device("CIM_Sensor", "fan" + std::to_string(i), state));
    }
    return elements;
}

TEST_F(ConcurrencyTest, RequestsRacingPassesSeeWholePasses) {
    constexpr int kElements = 20;
    serve(sensorsAt(10, kElements));
    start();
    std::atomic<bool> passing{true};
    std::atomic<int> failures{0};
    std::thread passes([&] {
        for (int state : {15, 20, 25, 30}) {
            serve(sensorsAt(state, kElements));
            runPass();
        }
        passing = false;
    });
    auto reader = [&](int which) {
        while (passing) {
            if (which == 0) {
                const std::vector<Latched> records = latched();
                // One pass raises every record: all show the same state.
                for (const Latched& record : records) {
                    if (record.healthState != records.front().healthState) {
                        ++failures;
                    }
                }
                if (records.size() != kElements) {
                    ++failures;
                }
            } else if (which == 1) {
                const orv::host::Reply reply = provider().getInstance(kLatchedClass, {{"EventId", "0"}});
                if (reply.rc() != CMPI_RC_OK && reply.message() != "failed to get instances") {
                    ++failures;
                }
            } else {
                const orv::host::Reply reply = references(latchedPath("3"));
                if (reply.rc() != CMPI_RC_OK && reply.rc() != CMPI_RC_ERR_NOT_FOUND) {
                    ++failures;
                }
                (void)rollup();
            }
        }
    };
    std::thread a(reader, 0);
    std::thread b(reader, 1);
    std::thread c(reader, 2);
    passes.join();
    a.join();
    b.join();
    c.join();
    EXPECT_EQ(failures, 0);
    const std::vector<Latched> records = latched();
    ASSERT_EQ(records.size(), static_cast<std::size_t>(kElements));
    EXPECT_EQ(records.back(), (Latched{std::to_string(5 * kElements - 1), "CIM_Sensor", "30"}));
}

}  // namespace
}  // namespace latched
