// The host's canonical name without waiting on the resolver: a resolver held
// back by the test stands for a DNS server that does not answer.
#include "canonical_name.hpp"

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <mutex>

using orv::linuxhost::CanonicalNameCache;
using namespace std::chrono_literals;

namespace {

// A resolver that answers "<name>.example.org" once released, counting its calls.
class HeldResolver {
public:
    CanonicalNameCache::Resolver function()
    {
        return [this](const std::string& name) -> std::optional<std::string> {
            std::unique_lock<std::mutex> lock(mutex_);
            ++calls_;
            called_.notify_all();
            released_.wait(lock, [&] { return open_; });
            if (unknown_) return std::nullopt;
            return name + ".example.org";
        };
    }
    void release(bool unknown = false)
    {
        std::lock_guard<std::mutex> lock(mutex_);
        open_ = true;
        unknown_ = unknown;
        released_.notify_all();
    }
    int calls()
    {
        std::lock_guard<std::mutex> lock(mutex_);
        return calls_;
    }
    // Waits (at most 10 s) until a lookup has reached the resolver.
    bool waitForCall()
    {
        std::unique_lock<std::mutex> lock(mutex_);
        return called_.wait_for(lock, std::chrono::seconds(10), [&] { return calls_ > 0; });
    }

private:
    std::mutex mutex_;
    std::condition_variable released_;
    std::condition_variable called_;
    bool open_ = false;
    bool unknown_ = false;
    int calls_ = 0;
};

// Asks until the answer is the expected one or a second has passed.
std::string eventually(CanonicalNameCache& cache, const std::string& host, const std::string& expected)
{
    std::string name;
    for (auto until = std::chrono::steady_clock::now() + 1s; std::chrono::steady_clock::now() < until;) {
        name = cache.nameFor(host);
        if (name == expected) break;
        std::this_thread::sleep_for(1ms);
    }
    return name;
}

}  // namespace

TEST(CanonicalName, AnUnansweredLookupGivesThePlainHostNameAtOnce)
{
    HeldResolver resolver;
    CanonicalNameCache cache(resolver.function(), {5ms, 300s});
    const auto start = std::chrono::steady_clock::now();
    for (int request = 0; request < 13; ++request) EXPECT_EQ(cache.nameFor("node1"), "node1");
    EXPECT_LT(std::chrono::steady_clock::now() - start, 100ms);
    EXPECT_EQ(resolver.calls(), 1);  // one lookup in flight, not one per request
    resolver.release();
    EXPECT_EQ(eventually(cache, "node1", "node1.example.org"), "node1.example.org");
}

TEST(CanonicalName, AFastResolverIsAnsweredOnTheFirstRequest)
{
    CanonicalNameCache cache([](const std::string& name) { return std::optional<std::string>(name + ".lan"); }, {2s, 300s});
    EXPECT_EQ(cache.nameFor("node2"), "node2.lan");
}

TEST(CanonicalName, ANameTheResolverDoesNotKnowIsItself)
{
    HeldResolver resolver;
    resolver.release(true);
    CanonicalNameCache cache(resolver.function(), {2s, 300s});
    EXPECT_EQ(cache.nameFor("node3"), "node3");
    EXPECT_EQ(cache.nameFor("node3"), "node3");
    EXPECT_EQ(resolver.calls(), 1);
}

TEST(CanonicalName, ARenamedHostIsResolvedAfresh)
{
    CanonicalNameCache cache([](const std::string& name) { return std::optional<std::string>(name + ".lan"); }, {2s, 300s});
    EXPECT_EQ(cache.nameFor("before"), "before.lan");
    EXPECT_EQ(cache.nameFor("after"), "after.lan");
}

TEST(CanonicalName, AnOldAnswerIsRefreshedWhileTheOldOneIsStillGiven)
{
    std::mutex mutex;
    int generation = 0;
    CanonicalNameCache cache(
        [&](const std::string& name) {
            std::lock_guard<std::mutex> lock(mutex);
            return std::optional<std::string>(name + ".v" + std::to_string(++generation));
        },
        {2s, std::chrono::seconds(0)});
    EXPECT_EQ(cache.nameFor("node4"), "node4.v1");
    EXPECT_EQ(eventually(cache, "node4", "node4.v3"), "node4.v3");
}

TEST(CanonicalName, StopsWhileALookupIsInFlight)
{
    HeldResolver resolver;
    std::thread releaser;
    {
        CanonicalNameCache cache(resolver.function(), {1ms, 300s});
        EXPECT_EQ(cache.nameFor("node5"), "node5");
        // The cache is destroyed only once its lookup is in flight.
        const bool inFlight = resolver.waitForCall();
        if (!inFlight) resolver.release();  // so that the cache can end
        ASSERT_TRUE(inFlight) << "no lookup reached the resolver";
        releaser = std::thread([&] {
            std::this_thread::sleep_for(20ms);
            resolver.release();
        });
    }  // waits for the lookup, then ends its thread
    releaser.join();
    EXPECT_EQ(resolver.calls(), 1);
}
