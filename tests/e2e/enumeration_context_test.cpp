// The enumeration contexts of the pull operations: a bounded queue between a
// producer thread and the pulls, and the registry that opens, finds, expires and
// bounds them.
#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <thread>

#include "enumeration_registry.hpp"
#include "orv/cimxml/cim_status.hpp"

namespace orv::cimhost::detail {
namespace {

using namespace std::chrono_literals;

int codeOf(const std::function<void()>& action) {
    try {
        action();
    } catch (const cimxml::CimError& error) {
        return error.code();
    }
    return 0;
}

// A producer of `count` objects "0", "1", ... that records the most it ever saw queued.
EnumerationContext::Producer counting(int count, std::atomic<int>* pushed, bool* stoppedEarly = nullptr) {
    return [count, pushed, stoppedEarly](const EnumerationContext::Push& push) -> std::pair<int, std::string> {
        for (int i = 0; i < count; ++i) {
            if (!push(std::to_string(i))) {
                if (stoppedEarly != nullptr) {
                    *stoppedEarly = true;
                }
                return {0, ""};
            }
            ++*pushed;
        }
        return {0, ""};
    };
}

// Waits up to 5 s for `counter` to reach `value`, then a little longer to see it stay.
void settle(const std::atomic<int>& counter, int value) {
    for (int i = 0; i < 500 && counter.load() < value; ++i) {
        std::this_thread::sleep_for(10ms);
    }
    std::this_thread::sleep_for(50ms);
}

TEST(EnumerationContext, AFullQueueHoldsTheProducerBackUntilAPullTakes) {
    std::atomic<int> pushed{0};
    EnumerationContext context("id", "u", "root/cimv2", PullKind::InstancePaths, 60s, 4);
    context.start(counting(1000, &pushed));
    settle(pushed, 4);
    EXPECT_EQ(pushed.load(), 4);  // the queue's capacity, not the 1000 the producer has
    EnumerationContext::Batch first = context.take(3);
    EXPECT_EQ(first.fragments, (std::vector<std::string>{"0", "1", "2"}));
    EXPECT_FALSE(first.end);
    std::size_t total = first.fragments.size();
    int expected = 3;
    for (;;) {
        EnumerationContext::Batch batch = context.take(100);
        for (const std::string& fragment : batch.fragments) {
            EXPECT_EQ(fragment, std::to_string(expected++));
        }
        total += batch.fragments.size();
        if (batch.end) {
            break;
        }
    }
    EXPECT_EQ(total, 1000u);
    EXPECT_TRUE(context.exhausted());
    EXPECT_EQ(context.remaining(), std::optional<std::size_t>(0));
}

TEST(EnumerationContext, ClosingStopsABlockedProducer) {
    std::atomic<int> pushed{0};
    bool stoppedEarly = false;
    {
        EnumerationContext context("id", "u", "root/cimv2", PullKind::InstancePaths, 60s, 2);
        context.start(counting(1000000, &pushed, &stoppedEarly));
        settle(pushed, 2);
        context.close();
    }  // joins the producer
    EXPECT_TRUE(stoppedEarly);
    EXPECT_EQ(pushed.load(), 2);
}

TEST(EnumerationContext, AnErrorComesAfterTheObjectsBeforeIt) {
    EnumerationContext context("id", "u", "root/cimv2", PullKind::Instances, 60s, 8);
    context.start([](const EnumerationContext::Push& push) -> std::pair<int, std::string> {
        push("a");
        return {2, "denied"};
    });
    EnumerationContext::Batch first = context.take(5);
    EXPECT_EQ(first.fragments, (std::vector<std::string>{"a"}));
    EXPECT_FALSE(first.end);
    EXPECT_EQ(first.errorCode, 0);
    EnumerationContext::Batch second = context.take(5);
    EXPECT_TRUE(second.fragments.empty());
    EXPECT_EQ(second.errorCode, 2);
    EXPECT_EQ(second.errorMessage, "denied");
}

TEST(EnumerationContext, TakingZeroWaitsForNothing) {
    EnumerationContext context("id", "u", "root/cimv2", PullKind::Instances, 60s, 8);
    context.start([](const EnumerationContext::Push&) -> std::pair<int, std::string> {
        std::this_thread::sleep_for(200ms);
        return {0, ""};
    });
    const auto before = std::chrono::steady_clock::now();
    EnumerationContext::Batch batch = context.take(0);
    EXPECT_LT(std::chrono::steady_clock::now() - before, 150ms);
    EXPECT_FALSE(batch.end);
    EXPECT_EQ(context.remaining(), std::nullopt);
}

TEST(EnumerationRegistry, ContextValuesAreLongRandomAndDistinct) {
    EnumerationRegistry registry;
    std::set<std::string> ids;
    for (int i = 0; i < 20; ++i) {
        auto context = registry.open("user" + std::to_string(i), "root/cimv2", PullKind::Instances, 60s);
        EXPECT_EQ(context->id().size(), 32u);
        EXPECT_EQ(context->id().find_first_not_of("0123456789abcdef"), std::string::npos);
        ids.insert(context->id());
        registry.release(context, false);
    }
    EXPECT_EQ(ids.size(), 20u);
}

TEST(EnumerationRegistry, AContextIsFoundOnlyByItsOwnerInItsNamespace) {
    EnumerationRegistry registry;
    auto context = registry.open("alice", "root/cimv2", PullKind::Instances, 60s);
    const std::string id = context->id();
    registry.release(context, false);
    constexpr int kInvalid = static_cast<int>(cimxml::CimStatus::InvalidEnumerationContext);
    EXPECT_EQ(codeOf([&] { registry.acquire(id, "bob", "root/cimv2"); }), kInvalid);
    EXPECT_EQ(codeOf([&] { registry.acquire(id, "alice", "root/interop"); }), kInvalid);
    EXPECT_EQ(codeOf([&] { registry.acquire(id + "0", "alice", "root/cimv2"); }), kInvalid);
    auto again = registry.acquire(id, "alice", "root/cimv2");
    // In use by one operation: a second one is refused.
    EXPECT_EQ(codeOf([&] { registry.acquire(id, "alice", "root/cimv2"); }), kInvalid);
    registry.release(again, true);
    EXPECT_EQ(codeOf([&] { registry.acquire(id, "alice", "root/cimv2"); }), kInvalid);
    EXPECT_EQ(registry.openCount(), 0u);
}

TEST(EnumerationRegistry, EachClientHasABoundOnOpenContexts) {
    EnumerationLimits limits;
    limits.perClient = 3;
    EnumerationRegistry registry(limits);
    for (int i = 0; i < 3; ++i) {
        registry.release(registry.open("alice", "root/cimv2", PullKind::Instances, 60s), false);
    }
    EXPECT_EQ(codeOf([&] { registry.open("alice", "root/cimv2", PullKind::Instances, 60s); }),
              static_cast<int>(cimxml::CimStatus::ServerLimitsExceeded));
    EXPECT_EQ(codeOf([&] { registry.release(registry.open("bob", "root/cimv2", PullKind::Instances, 60s), false); }), 0);
    EXPECT_EQ(registry.openCount(), 4u);
}

TEST(EnumerationRegistry, ExpiredContextsAreFreedWithoutAnotherRequest) {
    EnumerationRegistry registry;
    std::atomic<int> pushed{0};
    bool stoppedEarly = false;
    auto context = registry.open("alice", "root/cimv2", PullKind::Instances, 1s);
    context->start(counting(1000000, &pushed, &stoppedEarly));
    const std::string id = context->id();
    registry.release(context, false);
    std::weak_ptr<EnumerationContext> watch = context;
    context.reset();
    for (int i = 0; i < 50 && registry.openCount() != 0; ++i) {
        std::this_thread::sleep_for(100ms);
    }
    EXPECT_EQ(registry.openCount(), 0u);
    EXPECT_TRUE(watch.expired());  // freed, its producer joined
    EXPECT_TRUE(stoppedEarly);
}

TEST(EnumerationRegistry, AContextInUseDoesNotExpire) {
    EnumerationRegistry registry;
    auto context = registry.open("alice", "root/cimv2", PullKind::Instances, 1s);
    std::this_thread::sleep_for(2500ms);
    EXPECT_EQ(registry.openCount(), 1u);
    registry.release(context, true);
}

TEST(EnumerationRegistry, CloseWhileAPullWaitsAbandonsThePull) {
    EnumerationRegistry registry;
    auto context = registry.open("alice", "root/cimv2", PullKind::Instances, 60s);
    context->start([](const EnumerationContext::Push& push) -> std::pair<int, std::string> {
        while (push("x")) {
            std::this_thread::sleep_for(1ms);
        }
        return {0, ""};
    });
    const std::string id = context->id();
    std::thread closer([&registry, id] {
        std::this_thread::sleep_for(50ms);
        registry.close(id, "alice", "root/cimv2");
    });
    EnumerationContext::Batch batch = context->take(1000000);
    closer.join();
    EXPECT_TRUE(context->closed());
    EXPECT_FALSE(batch.end);
    registry.release(context, true);
    EXPECT_EQ(registry.openCount(), 0u);
}

TEST(EnumerationRegistry, ShutdownClosesEverythingAndRefusesNewOpens) {
    EnumerationRegistry registry;
    std::atomic<int> pushed{0};
    auto context = registry.open("alice", "root/cimv2", PullKind::Instances, 60s);
    context->start(counting(1000000, &pushed));
    registry.release(context, false);
    context.reset();
    registry.shutdown();
    EXPECT_EQ(registry.openCount(), 0u);
    EXPECT_EQ(codeOf([&] { registry.open("alice", "root/cimv2", PullKind::Instances, 60s); }),
              static_cast<int>(cimxml::CimStatus::ServerIsShuttingDown));
}

// Many clients pulling their own enumerations at once (run under TSan).
TEST(EnumerationRegistry, ConcurrentEnumerationsEachGetTheirOwnObjects) {
    EnumerationRegistry registry;
    std::vector<std::thread> clients;
    std::atomic<int> failures{0};
    for (int c = 0; c < 8; ++c) {
        clients.emplace_back([&registry, &failures, c] {
            std::atomic<int> pushed{0};
            const std::string owner = "client" + std::to_string(c);
            auto context = registry.open(owner, "root/cimv2", PullKind::Instances, 60s);
            context->start(counting(500, &pushed));
            const std::string id = context->id();
            registry.release(context, false);
            int next = 0;
            for (bool end = false; !end;) {
                auto held = registry.acquire(id, owner, "root/cimv2");
                EnumerationContext::Batch batch = held->take(7);
                for (const std::string& fragment : batch.fragments) {
                    failures += fragment == std::to_string(next++) ? 0 : 1;
                }
                end = batch.end;
                registry.release(held, end);
            }
            failures += next == 500 ? 0 : 1;
        });
    }
    for (auto& client : clients) {
        client.join();
    }
    EXPECT_EQ(failures.load(), 0);
    EXPECT_EQ(registry.openCount(), 0u);
}

}  // namespace
}  // namespace orv::cimhost::detail
