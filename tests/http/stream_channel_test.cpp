// A streamed body's two ends: an answer given early takes the place of the handler's own,
// once, and only while nothing of the body has gone.
#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <thread>

#include "stream_channel.hpp"

namespace orv::http::detail {
namespace {

Response whole(int status, std::string body) {
    Response response;
    response.status = status;
    response.body = std::move(body);
    return response;
}

TEST(StreamChannel, AnEarlyAnswerReachesTheConnectionAndTheHandlersAnswerIsDropped) {
    int wakes = 0;
    StreamChannel channel(1024, [&wakes] { ++wakes; });
    EXPECT_TRUE(channel.answer(whole(200, "<early/>")));
    EXPECT_EQ(wakes, 1);
    StreamChannel::Batch batch = channel.take();
    ASSERT_TRUE(batch.whole);
    EXPECT_EQ(batch.whole->body, "<early/>");
    EXPECT_FALSE(batch.head);
    EXPECT_FALSE(channel.answer(whole(200, "<second/>"))) << "one answer only";
    EXPECT_FALSE(channel.begin(whole(200, "<late/>"))) << "the handler's body is dropped";
    EXPECT_FALSE(channel.settle()) << "the handler's return value is dropped";
}

TEST(StreamChannel, PiecesArriveJoinedInTheOrderTheyWereWritten) {
    StreamChannel channel(1 << 20, [] {});
    EXPECT_TRUE(channel.begin(whole(200, "<a>")));
    EXPECT_TRUE(channel.write("<b/>"));
    StreamChannel::Batch first = channel.take();
    EXPECT_EQ(first.data, "<a><b/>");
    EXPECT_TRUE(channel.write(std::string(20000, 'c')));
    EXPECT_TRUE(channel.write("</a>"));
    channel.end();
    StreamChannel::Batch second = channel.take();
    EXPECT_FALSE(second.head);
    EXPECT_EQ(second.data, std::string(20000, 'c') + "</a>");
    EXPECT_TRUE(second.last);
}

TEST(StreamChannel, NoEarlyAnswerOnceTheBodyBegan) {
    StreamChannel channel(1024, [] {});
    EXPECT_TRUE(channel.begin(whole(200, "<first/>")));
    EXPECT_FALSE(channel.answer(whole(200, "<early/>")));
    StreamChannel::Batch batch = channel.take();
    EXPECT_FALSE(batch.whole);
    ASSERT_TRUE(batch.head);
    EXPECT_EQ(batch.data, "<first/>");
    EXPECT_TRUE(channel.settle());
}

TEST(StreamChannel, NoEarlyAnswerOnceTheHandlerReturned) {
    StreamChannel channel(1024, [] {});
    EXPECT_TRUE(channel.settle());
    EXPECT_FALSE(channel.answer(whole(200, "<early/>")));
    EXPECT_FALSE(channel.take().whole);
}

TEST(StreamChannel, ReleaseHandsTheWorkerOverOnlyWhileTheHandlerRuns) {
    WorkerPool pool(1);
    StreamChannel channel(1024, [] {});
    std::promise<void> started;
    std::promise<void> proceed;
    pool.post([&] {
        channel.runOn(pool, WorkerPool::current());
        started.set_value();
        proceed.get_future().wait();
        channel.settle();
    });
    started.get_future().wait();
    channel.release();
    EXPECT_EQ(pool.threadCount(), 2U);
    std::promise<void> next;
    pool.post([&next] { next.set_value(); });
    EXPECT_EQ(next.get_future().wait_for(std::chrono::seconds(5)), std::future_status::ready);
    proceed.set_value();
    pool.join();
}

TEST(StreamChannel, AnswerRacingTheHandlersReturnHasExactlyOneWinner) {
    for (int round = 0; round < 200; ++round) {
        StreamChannel channel(1024, [] {});
        std::atomic<bool> go{false};
        bool answered = false;
        std::thread watchdog([&] {
            while (!go.load()) {
            }
            answered = channel.answer(whole(200, "<early/>"));
        });
        go.store(true);
        const bool handlerWon = channel.settle();
        watchdog.join();
        EXPECT_NE(answered, handlerWon) << "round " << round;
    }
}

}  // namespace
}  // namespace orv::http::detail
