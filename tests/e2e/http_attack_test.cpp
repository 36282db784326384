// The HTTP front end tried as an attacker would, without credentials: slow and idle
// connections, endless or lying bodies, huge heads, pipelining, password guessing. Each
// attack must leave the host answering other clients at once with its memory bounded.
#include <gtest/gtest.h>
#include <signal.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <memory>
#include <thread>
#include <vector>

#include "host_process.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {
namespace {

using namespace std::chrono_literals;

constexpr auto kAtOnce = 5000ms;  // far below the host's 60 s read deadline
constexpr int kWorkers = 2;
constexpr int kPerClientLimit = 40;
constexpr long kMemoryBoundKib = 48 * 1024;

// The growth of the host's peak resident size since `beforeKib`, printed for the record.
long peakGrowthKib(int pid, long beforeKib, const char* attack) {
    const long grown = peakResidentKib(pid) - beforeKib;
    std::printf("%s: peak RSS %ld KiB (%+ld KiB)\n", attack, beforeKib + grown, grown);
    return grown;
}

std::vector<std::string> attackedHostArgs() {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--max-request-bytes", "65536", "--read-timeout", "60", "--threads",
                             std::to_string(kWorkers), "--max-client-connections", std::to_string(kPerClientLimit),
                             "--credentials", sourceDir() + "/tests/e2e/data/credentials"});
    return args;
}

const std::string kUser = basicAuthorizationLine("user", "secret");

class HttpAttackTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        host_ = new HostProcess(attackedHostArgs());
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0);
        delete host_;
    }
    void TearDown() override {
        EXPECT_TRUE(answersAtOnce()) << "the host stopped answering other clients";
    }

    // A proper request from 127.0.0.1 answered 200 within kAtOnce.
    static bool answersAtOnce(const std::string& source = "127.0.0.1") {
        RawConnection client(host_->port(), source);
        if (!client.send(cimPost(enumerateClassNamesBody(), "EnumerateClassNames", kUser))) {
            return false;
        }
        auto response = client.readResponse(kAtOnce);
        return response && response->status == 200;
    }

    static std::optional<RawResponse> sendAndRead(const std::string& request, const std::string& source = "127.0.0.1") {
        RawConnection client(host_->port(), source);
        client.send(request);
        return client.readResponse(kAtOnce);
    }

    static HostProcess* host_;
};

HostProcess* HttpAttackTest::host_ = nullptr;

std::vector<std::unique_ptr<RawConnection>> openConnections(int port, const std::string& source, int count,
                                                            const std::string& firstBytes) {
    std::vector<std::unique_ptr<RawConnection>> connections;
    for (int i = 0; i < count; ++i) {
        connections.push_back(std::make_unique<RawConnection>(port, source));
        if (!firstBytes.empty()) {
            connections.back()->send(firstBytes);
        }
    }
    return connections;
}

TEST_F(HttpAttackTest, SlowHeadsOnManyMoreConnectionsThanWorkersDoNotStopOtherClients) {
    auto slow = openConnections(host_->port(), "127.0.0.2", 8 * kWorkers, "POST /cimom HTTP/1.1\r\n");
    std::atomic<bool> done{false};
    std::thread trickle([&] {
        // One header byte per connection every 200 ms, as a slow-head attack sends them.
        const std::string header = "X-Slow: aaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaa";
        for (std::size_t i = 0; !done.load() && i < header.size(); ++i) {
            for (auto& connection : slow) {
                connection->send(header.substr(i, 1));
            }
            std::this_thread::sleep_for(200ms);
        }
    });
    for (int i = 0; i < 10; ++i) {
        EXPECT_TRUE(answersAtOnce()) << "request " << i;
    }
    done.store(true);
    trickle.join();
}

TEST_F(HttpAttackTest, IdleConnectionsDoNotStopOtherClients) {
    auto idle = openConnections(host_->port(), "127.0.0.3", kPerClientLimit, "");
    for (int i = 0; i < 10; ++i) {
        EXPECT_TRUE(answersAtOnce()) << "request " << i;
    }
}

TEST_F(HttpAttackTest, ConnectionsAboveThePerClientLimitAreClosedAtOnce) {
    auto held = openConnections(host_->port(), "127.0.0.4", kPerClientLimit, "");
    RawConnection oneMore(host_->port(), "127.0.0.4");
    ASSERT_TRUE(oneMore.connected());
    EXPECT_TRUE(oneMore.closedWithin(kAtOnce));
    EXPECT_FALSE(held.back()->closedWithin(200ms)) << "the connections within the limit stay open";
    EXPECT_TRUE(answersAtOnce("127.0.0.5")) << "another address is served";
    held.pop_back();
    std::this_thread::sleep_for(200ms);
    EXPECT_TRUE(answersAtOnce("127.0.0.4")) << "a freed slot takes a connection again";
}

TEST_F(HttpAttackTest, ChunkedBodyAboveTheLimitAnswers413AsSoonAsItIsPassed) {
    RawConnection client(host_->port());
    std::string head = cimPost("", "EnumerateClassNames", kUser);
    head.replace(head.find("Content-Length: 0"), 17, "Transfer-Encoding: chunked");
    ASSERT_TRUE(client.send(head));
    const std::string chunk = "2000\r\n" + std::string(0x2000, ' ') + "\r\n";
    for (int i = 0; i < 10; ++i) {  // 80 KiB, above the 64 KiB limit; the body never ends
        client.send(chunk);
    }
    auto response = client.readResponse(kAtOnce);
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 413);
}

TEST_F(HttpAttackTest, HundredMegabyteChunkedBodyLeavesMemoryBounded) {
    const long before = peakResidentKib(host_->pid());
    RawConnection client(host_->port());
    std::string head = cimPost("", "EnumerateClassNames", kUser);
    head.replace(head.find("Content-Length: 0"), 17, "Transfer-Encoding: chunked");
    client.send(head);
    const std::string chunk = "100000\r\n" + std::string(0x100000, 'x') + "\r\n";
    for (int i = 0; i < 100 && client.send(chunk); ++i) {
    }
    EXPECT_LT(peakGrowthKib(host_->pid(), before, "100 MB chunked body"), kMemoryBoundKib);
}

TEST_F(HttpAttackTest, MoreHeaderFieldsThanAllowedAnswer431) {
    std::string fields;
    for (int i = 0; i < 150; ++i) {
        fields += "X-Field-" + std::to_string(i) + ": x\r\n";
    }
    auto response = sendAndRead(cimPost(enumerateClassNamesBody(), "EnumerateClassNames", kUser + fields));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 431);
}

TEST_F(HttpAttackTest, OversizedHeadAnswers431) {
    const std::string field = "X-Big: " + std::string(32768, 'b') + "\r\n";
    auto response = sendAndRead(cimPost(enumerateClassNamesBody(), "EnumerateClassNames", kUser + field));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 431);
}

TEST_F(HttpAttackTest, FiftyThousandHeadersOfEightKilobytesLeaveMemoryBounded) {
    const long before = peakResidentKib(host_->pid());
    const std::string field = "X-Big: " + std::string(8000, 'h') + "\r\n";
    for (int request = 0; request < 4; ++request) {
        RawConnection client(host_->port());
        client.send("POST /cimom HTTP/1.1\r\nHost: 127.0.0.1\r\n" + kUser);
        for (int i = 0; i < 50000 && client.send(field); ++i) {
        }
    }
    EXPECT_LT(peakGrowthKib(host_->pid(), before, "4 x 50,000 headers of 8 KB"), kMemoryBoundKib);
}

TEST_F(HttpAttackTest, PipelinedRequestsAreAnsweredInOrder) {
    RawConnection client(host_->port());
    std::string requests;
    for (int id = 1; id <= 3; ++id) {
        requests += cimPost(enumerateClassNamesBody(id), "EnumerateClassNames", kUser);
    }
    ASSERT_TRUE(client.send(requests));  // one write
    for (int id = 1; id <= 3; ++id) {
        auto response = client.readResponse(kAtOnce);
        ASSERT_TRUE(response) << "response " << id;
        EXPECT_EQ(response->status, 200);
        EXPECT_NE(response->body.find("<MESSAGE ID=\"" + std::to_string(id) + "\""), std::string::npos)
            << response->body.substr(0, 200);
    }
}

TEST_F(HttpAttackTest, ConnectionClosesAfterTheHundredthRequest) {
    RawConnection client(host_->port());
    std::string requests;
    for (int id = 1; id <= 101; ++id) {
        requests += cimPost(enumerateClassNamesBody(id), "EnumerateClassNames", kUser);
    }
    client.send(requests);
    for (int id = 1; id <= 100; ++id) {
        auto response = client.readResponse(kAtOnce);
        ASSERT_TRUE(response) << "response " << id;
        EXPECT_EQ(response->headers["connection"], id == 100 ? "close" : "") << "response " << id;
    }
    EXPECT_TRUE(client.closedWithin(kAtOnce));
}

std::string headWithContentLength(const std::string& length) {
    std::string head = cimPost("", "EnumerateClassNames", kUser);
    head.replace(head.find("Content-Length: 0"), 17, "Content-Length: " + length);
    return head;
}

TEST_F(HttpAttackTest, NegativeContentLengthAnswers400AtOnce) {
    auto response = sendAndRead(headWithContentLength("-1"));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 400);
}

TEST_F(HttpAttackTest, ContentLengthBeyondSixtyFourBitsAnswers400AtOnce) {
    auto response = sendAndRead(headWithContentLength("18446744073709551617"));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 400);
}

TEST_F(HttpAttackTest, ContentLengthAboveTheLimitAnswers413AtOnceWithoutWaitingForTheBody) {
    auto response = sendAndRead(headWithContentLength("10000000000"));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 413);
}

TEST_F(HttpAttackTest, LowerCaseBasicSchemeWithTheRightPasswordIsAccepted) {
    auto response = sendAndRead(cimPost(enumerateClassNamesBody(), "EnumerateClassNames",
                                         basicAuthorizationLine("user", "secret", "basic")));
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 200);
}

TEST_F(HttpAttackTest, BodyIsNotReadBeforeTheLoginIsChecked) {
    RawConnection client(host_->port());
    std::string head = headWithContentLength("60000");
    head.replace(head.find(kUser), kUser.size(), basicAuthorizationLine("user", "wrong"));
    ASSERT_TRUE(client.send(head));  // no body follows
    auto response = client.readResponse(kAtOnce);
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 401);
}

std::optional<RawResponse> wrongLogin(int port, const std::string& source) {
    RawConnection client(port, source);
    client.send(cimPost(enumerateClassNamesBody(), "EnumerateClassNames", basicAuthorizationLine("user", "guess")));
    return client.readResponse(10000ms);
}

std::size_t occurrences(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
        ++count;
    }
    return count;
}

TEST_F(HttpAttackTest, FailedLoginsAreLoggedWithTheClientAddressAtMostOnceASecond) {
    const std::string line = "orv-cimhost: warning: failed login from 127.0.0.6 as user \"user\"\n";
    for (int i = 0; i < 5; ++i) {
        auto response = wrongLogin(host_->port(), "127.0.0.6");
        ASSERT_TRUE(response);
        EXPECT_EQ(response->status, 401);
    }
    std::this_thread::sleep_for(1100ms);
    ASSERT_TRUE(wrongLogin(host_->port(), "127.0.0.6"));
    std::this_thread::sleep_for(100ms);
    const std::string& output = host_->output();
    EXPECT_EQ(occurrences(output, line), 1U) << output;
    EXPECT_EQ(occurrences(output, "orv-cimhost: warning: failed login from 127.0.0.6 as user \"user\" (4 more from "
                                  "this address since the last line)\n"),
              1U)
        << output;
}

TEST_F(HttpAttackTest, RepeatedFailedLoginsAreDelayedForThatAddressOnly) {
    using Clock = std::chrono::steady_clock;
    for (int i = 0; i < 7; ++i) {
        ASSERT_TRUE(wrongLogin(host_->port(), "127.0.0.7"));
    }
    // The eighth failure in a row waits 1.6 s; meanwhile another client is served.
    Clock::time_point attackerAnswered;
    const Clock::time_point start = Clock::now();
    std::thread attacker([&] {
        auto response = wrongLogin(host_->port(), "127.0.0.7");
        EXPECT_TRUE(response && response->status == 401);
        attackerAnswered = Clock::now();
    });
    std::this_thread::sleep_for(100ms);
    EXPECT_TRUE(answersAtOnce());
    const Clock::time_point otherAnswered = Clock::now();
    attacker.join();
    EXPECT_GE(attackerAnswered - start, 1500ms);
    EXPECT_LT(otherAnswered, attackerAnswered) << "the other client waited for the attacker's delay";
}

TEST(HttpAttackLifecycle, SigtermWithSlowAndIdleConnectionsOpenStopsCleanly) {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--read-timeout", "60", "--keepalive-timeout", "60"});
    HostProcess host(args);
    ASSERT_TRUE(host.waitReady()) << host.output();
    auto idle = openConnections(host.port(), "127.0.0.8", 30, "");
    auto slow = openConnections(host.port(), "127.0.0.9", 30, "POST /cimom HTTP/1.1\r\nHost: x");
    RawConnection kept(host.port());
    kept.send(cimPost(enumerateClassNamesBody(), "EnumerateClassNames"));
    auto response = kept.readResponse(kAtOnce);
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 200);
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
    EXPECT_TRUE(idle.front()->closedWithin(1000ms));
    EXPECT_TRUE(kept.closedWithin(1000ms));
}

}  // namespace
}  // namespace orv::e2e
