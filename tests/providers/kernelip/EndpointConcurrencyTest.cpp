// Requests on several broker threads at once: each builds its own records
// and returns the whole, well-formed answer.
#include <atomic>
#include <string>
#include <thread>

#include "KernelIPFixture.h"

namespace kernelip {
namespace {

using Endpoints = std::vector<std::pair<std::string, std::string>>;

class EndpointConcurrencyTest : public KernelIPTest {};

TEST_F(EndpointConcurrencyTest, ConcurrentRequestsEachSeeEveryRecordInOrder) {
    serve(hostWith(threeVnics()));
    const Endpoints expected = endpointsOf(provider().enumerateInstances(kKernelParent));
    ASSERT_EQ(expected.size(), 7U);
    std::atomic<int> mismatches{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([this, &expected, &mismatches] {
            for (int i = 0; i < 25; ++i) {
                const orv::host::Reply all = provider().enumerateInstances(kKernelParent);
                const orv::host::Reply one = provider().getInstance(kIPv4Class, {{"Name", "vif2"}});
                const std::optional<NamedValue> address =
                    one.instances().size() == 1 ? orv::providertest::propertyOf(one.instances()[0], "IPv4Address")
                                                : std::nullopt;
                if (endpointsOf(all) != expected || !address || address->text != "192.168.5.7") {
                    ++mismatches;
                }
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(mismatches.load(), 0);
}

}  // namespace
}  // namespace kernelip
