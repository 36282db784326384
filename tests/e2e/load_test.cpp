// Load with an attack going on: 16 clients send 10,000 mixed requests each over keep-alive
// connections while 1,000 slow connections from other addresses trickle header bytes. Every
// normal request must be answered, the slow connections must all stay open, and the host's
// memory must stay bounded; p50 / p99 are printed. Labelled "load" (about 10 s).
#include <gtest/gtest.h>
#include <httplib.h>
#include <signal.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <thread>
#include <vector>

#include "host_process.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {
namespace {

using namespace std::chrono_literals;

constexpr int kClients = 16;
constexpr int kDefaultRequestsEach = 10000;
constexpr int kSlowConnections = 1000;
constexpr int kSlowPerAddress = 50;
constexpr long kMemoryBoundKib = 64 * 1024;

// ORV_LOAD_REQUESTS sets the requests of each client, for a shorter run under a sanitizer.
int requestsEach() {
    const char* count = std::getenv("ORV_LOAD_REQUESTS");
    return count != nullptr && std::atoi(count) > 0 ? std::atoi(count) : kDefaultRequestsEach;
}

struct Operation {
    const char* method;
    std::string params;
};

std::string requestBody(const Operation& operation) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" "
           "PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"" + std::string(operation.method) +
           "\"><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>" +
           operation.params + "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

const std::vector<Operation>& operations() {
    static const std::vector<Operation> kOperations = {
        {"EnumerateClassNames", ""},
        {"GetClass", "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE>"},
        {"EnumerateInstanceNames", "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE>"},
        {"EnumerateInstances", "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE>"},
    };
    return kOperations;
}

struct ClientResult {
    std::vector<double> latenciesUs;
    long failures = 0;
};

void runClient(int port, int index, ClientResult& result) {
    httplib::Client client("127.0.0.1", port);
    client.set_keep_alive(true);
    client.set_tcp_nodelay(true);
    client.set_read_timeout(30);
    const int requests = requestsEach();
    result.latenciesUs.reserve(static_cast<std::size_t>(requests));
    for (int i = 0; i < requests; ++i) {
        const Operation& operation = operations()[static_cast<std::size_t>(index + i) % operations().size()];
        const httplib::Headers headers{{"CIMOperation", "MethodCall"}, {"CIMMethod", operation.method},
                                       {"CIMObject", "root%2Fcimv2"}};
        const auto start = std::chrono::steady_clock::now();
        auto response = client.Post("/cimom", headers, requestBody(operation), "application/xml; charset=\"utf-8\"");
        const auto stop = std::chrono::steady_clock::now();
        if (!response || response->status != 200 || response->body.find("<ERROR") != std::string::npos) {
            ++result.failures;
            continue;
        }
        result.latenciesUs.push_back(std::chrono::duration<double, std::micro>(stop - start).count());
    }
}

double percentile(std::vector<double>& values, double p) {
    const auto index = static_cast<std::size_t>(p * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + static_cast<long>(index), values.end());
    return values[index];
}

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kAddressSanitizer = true;
#elif defined(__has_feature)
constexpr bool kAddressSanitizer = __has_feature(address_sanitizer);
#else
constexpr bool kAddressSanitizer = false;
#endif

#if defined(__SANITIZE_THREAD__)
constexpr bool kThreadSanitizer = true;
#elif defined(__has_feature)
constexpr bool kThreadSanitizer = __has_feature(thread_sanitizer);
#else
constexpr bool kThreadSanitizer = false;
#endif

// ThreadSanitizer keeps shadow memory and access history beside every byte the host touches
// (its documentation gives 5 to 10 times the memory): the bound scales with it.
constexpr long kMemoryBoundFactor = kThreadSanitizer ? 5 : 1;

TEST(CimHostLoad, SixteenClientsAreServedInFullWhileAThousandSlowConnectionsAreOpen) {
    if (kAddressSanitizer) {
        // The sanitizer holds freed memory back (256 MB by default); a small quarantine
        // keeps the resident size a measure of the host rather than of the tool.
        setenv("ASAN_OPTIONS", "quarantine_size_mb=8:thread_local_quarantine_size_kb=64", 0);
    }
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--read-timeout", "600"});  // the slow heads stay open all along
    HostProcess host(args);
    ASSERT_TRUE(host.waitReady()) << host.output();
    std::vector<std::unique_ptr<RawConnection>> slow;
    for (int i = 0; i < kSlowConnections; ++i) {
        const std::string source = "127.0.1." + std::to_string(1 + i / kSlowPerAddress);
        slow.push_back(std::make_unique<RawConnection>(host.port(), source));
        ASSERT_TRUE(slow.back()->send("POST /cimom HTTP/1.1\r\n")) << "slow connection " << i;
    }
    const long before = peakResidentKib(host.pid());
    std::atomic<bool> done{false};
    std::thread trickle([&] {
        while (!done.load()) {
            for (auto& connection : slow) {
                connection->send("X");
            }
            std::this_thread::sleep_for(2s);
        }
    });
    std::vector<ClientResult> results(kClients);
    std::vector<std::thread> clients;
    const auto start = std::chrono::steady_clock::now();
    for (int i = 0; i < kClients; ++i) {
        clients.emplace_back([&, i] { runClient(host.port(), i, results[static_cast<std::size_t>(i)]); });
    }
    for (auto& client : clients) {
        client.join();
    }
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    done.store(true);
    trickle.join();
    std::vector<double> all;
    long failures = 0;
    for (auto& result : results) {
        all.insert(all.end(), result.latenciesUs.begin(), result.latenciesUs.end());
        failures += result.failures;
    }
    EXPECT_EQ(failures, 0);
    ASSERT_EQ(all.size(), static_cast<std::size_t>(kClients * requestsEach()));
    const long grown = peakResidentKib(host.pid()) - before;
    std::printf("requests=%zu seconds=%.1f rps=%.0f p50=%.0fus p99=%.0fus peak RSS growth=%ld KiB\n", all.size(),
                seconds, static_cast<double>(all.size()) / seconds, percentile(all, 0.50), percentile(all, 0.99),
                grown);
    EXPECT_LT(grown, kMemoryBoundKib * kMemoryBoundFactor);
    std::size_t stillOpen = 0;
    for (auto& connection : slow) {
        stillOpen += connection->closedWithin(0ms) ? 0 : 1;
    }
    EXPECT_EQ(stillOpen, slow.size()) << "slow connections were dropped";
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

}  // namespace
}  // namespace orv::e2e
