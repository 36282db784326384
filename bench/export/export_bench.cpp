// Delivery of indications by the export client to a listener on the loopback:
//   throughput  indications per second from one submitting thread to one listener
//   latency     submit to the listener's receipt, p50 / p99, for 1 and 10 subscriptions
//               (10 submits per indication, to one destination or to ten)
//   down        cost of submit() when the listener is down
// The listener runs in this process with orv-cimlistener's request handler.
//
//   export_bench [--count N] [--rate PER_SECOND]
#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "orv/exporter/exporter.hpp"
#include "orv/http/http_server.hpp"
#include "orv/listener/export_handler.hpp"

namespace {

using namespace orv;
using Clock = std::chrono::steady_clock;
using namespace std::chrono_literals;

// Records, for every indication sequence number, when it was submitted and received.
class Recorder {
public:
    void reset(std::size_t count) {
        std::lock_guard lock(mutex_);
        submitted_.assign(count, Clock::time_point{});
        latencies_.clear();
        latencies_.reserve(count * 10);
    }
    void submitted(std::size_t sequence) {
        std::lock_guard lock(mutex_);
        submitted_[sequence] = Clock::now();
    }
    void received(std::size_t sequence) {
        const Clock::time_point now = Clock::now();
        std::lock_guard lock(mutex_);
        latencies_.push_back(std::chrono::duration<double, std::micro>(now - submitted_.at(sequence)).count());
    }
    std::size_t receivedCount() {
        std::lock_guard lock(mutex_);
        return latencies_.size();
    }
    std::vector<double> latencies() {
        std::lock_guard lock(mutex_);
        return latencies_;
    }

private:
    std::mutex mutex_;
    std::vector<Clock::time_point> submitted_;
    std::vector<double> latencies_;
};

class Listener {
public:
    explicit Listener(Recorder& recorder) {
        http::ServerOptions options;
        options.port = 0;
        options.path = "/.*";
        options.threads = 16;
        options.keepAliveMaxRequests = 1000000;  // as orv-cimlistener: senders keep their connection
        server_ = std::make_unique<http::HttpServer>(options, [&recorder](const http::Request& request) {
            return listener::handleExportRequest(request, [&recorder](const cimxml::InstanceModel& indication) {
                recorder.received(std::stoul(*indication.properties.at(0).value));
                return std::optional<std::string>();
            });
        });
        server_->bind();
        thread_ = std::thread([this] { server_->run(); });
        while (!server_->running()) {
            std::this_thread::sleep_for(1ms);
        }
    }
    ~Listener() {
        server_->stop();
        thread_.join();
    }
    std::string url(const std::string& path) const {
        return "http://127.0.0.1:" + std::to_string(server_->port()) + path;
    }

private:
    std::unique_ptr<http::HttpServer> server_;
    std::thread thread_;
};

std::string indication(std::size_t sequence) {
    return "<INSTANCE CLASSNAME=\"OMC_BenchIndication\"><PROPERTY NAME=\"Sequence\" TYPE=\"uint64\"><VALUE>" +
           std::to_string(sequence) +
           "</VALUE></PROPERTY><PROPERTY NAME=\"Description\" TYPE=\"string\"><VALUE>heartbeat of the "
           "benchmark</VALUE></PROPERTY></INSTANCE>";
}

double percentile(std::vector<double> values, double fraction) {
    if (values.empty()) {
        return 0;
    }
    std::sort(values.begin(), values.end());
    return values[std::min(values.size() - 1, static_cast<std::size_t>(fraction * static_cast<double>(values.size())))];
}

bool waitReceived(Recorder& recorder, std::size_t count) {
    const Clock::time_point until = Clock::now() + 120s;
    while (recorder.receivedCount() < count) {
        if (Clock::now() > until) {
            return false;
        }
        std::this_thread::sleep_for(100us);
    }
    return true;
}

void throughput(Recorder& recorder, Listener& listener, std::size_t count) {
    recorder.reset(count);
    exporter::ExporterConfig config;
    config.queueLimit = count;
    exporter::Exporter exporter(config);
    const Clock::time_point start = Clock::now();
    for (std::size_t i = 0; i < count; ++i) {
        recorder.submitted(i);
        exporter.submit("s", listener.url("/throughput"), indication(i), {});
    }
    const bool complete = waitReceived(recorder, count);
    const double seconds = std::chrono::duration<double>(Clock::now() - start).count();
    std::printf("throughput: %zu indications, one thread, one listener: %.0f indications/s%s\n", count,
                static_cast<double>(count) / seconds, complete ? "" : " (INCOMPLETE)");
}

// Submits `count` indications at `rate` per second, each to `subscriptions` subscriptions
// whose destinations are one URL or one URL each.
void latency(Recorder& recorder, Listener& listener, std::size_t count, double rate, int subscriptions,
             bool sharedDestination) {
    exporter::ExporterConfig config;
    config.queueLimit = count;
    exporter::Exporter exporter(config);
    auto destination = [&](int s) {
        return listener.url(sharedDestination ? "/shared" : "/destination" + std::to_string(s));
    };
    // Connections and sender threads are set up before the clock starts.
    recorder.reset(1);
    recorder.submitted(0);
    for (int s = 0; s < subscriptions; ++s) {
        exporter.submit("warmup", destination(s), indication(0), {});
    }
    waitReceived(recorder, static_cast<std::size_t>(subscriptions));
    recorder.reset(count);
    const auto period = std::chrono::duration<double>(1.0 / rate);
    const Clock::time_point start = Clock::now();
    for (std::size_t i = 0; i < count; ++i) {
        std::this_thread::sleep_until(start + std::chrono::duration_cast<Clock::duration>(period * static_cast<double>(i)));
        recorder.submitted(i);
        const std::string xml = indication(i);
        for (int s = 0; s < subscriptions; ++s) {
            exporter.submit("sub" + std::to_string(s), destination(s), xml, {});
        }
    }
    const bool complete = waitReceived(recorder, count * static_cast<std::size_t>(subscriptions));
    const std::vector<double> latencies = recorder.latencies();
    std::printf("latency: %2d subscription(s)%s, %zu indications at %.0f/s: p50 %.0f us, p99 %.0f us%s\n",
                subscriptions,
                subscriptions == 1 ? "                 " : sharedDestination ? ", one destination " : ", ten destinations",
                count, rate, percentile(latencies, 0.50), percentile(latencies, 0.99), complete ? "" : " (INCOMPLETE)");
}

void listenerDown(std::size_t count) {
    std::string url;
    {
        Recorder unused;
        Listener closed(unused);
        url = closed.url("/down");  // nothing listens there any more
    }
    exporter::ExporterConfig config;
    config.queueLimit = 1000;
    exporter::Exporter exporter(config);
    const std::string xml = indication(0);
    const exporter::DeliveryPolicy policy;  // 3 retries, 20 s apart
    exporter.submit("s", url, xml, policy);  // starts the sender, which stays in its retries
    std::this_thread::sleep_for(50ms);
    std::vector<double> queued;
    std::vector<double> dropped;
    for (std::size_t i = 0; i < count; ++i) {
        std::string copy = xml;  // what a caller hands over
        const Clock::time_point before = Clock::now();
        exporter.submit("s", url, std::move(copy), policy);
        const double cost = std::chrono::duration<double, std::micro>(Clock::now() - before).count();
        (i < config.queueLimit ? queued : dropped).push_back(cost);
    }
    std::printf("listener down: %zu submits queued: p50 %.2f us, p99 %.2f us; %zu dropped (queue full): "
                "p50 %.2f us, p99 %.2f us; max of all %.1f us\n",
                queued.size(), percentile(queued, 0.50), percentile(queued, 0.99), dropped.size(),
                percentile(dropped, 0.50), percentile(dropped, 0.99),
                std::max(percentile(queued, 1.0), percentile(dropped, 1.0)));
    std::printf("listener down: dropped count %llu of %zu\n",
                static_cast<unsigned long long>(exporter.counts("s").dropped), count + 1);
    exporter.shutdown(0ms);
}

}  // namespace

int main(int argc, char** argv) {
    std::size_t count = 20000;
    double rate = 1000;
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string option = argv[i];
        if (option == "--count") {
            count = std::strtoul(argv[i + 1], nullptr, 10);
        } else if (option == "--rate") {
            rate = std::strtod(argv[i + 1], nullptr);
        } else {
            std::fprintf(stderr, "usage: export_bench [--count N] [--rate PER_SECOND]\n");
            return 2;
        }
    }
    Recorder recorder;
    Listener listener(recorder);
    throughput(recorder, listener, count);
    const std::size_t paced = std::min<std::size_t>(count, static_cast<std::size_t>(rate * 5));
    // Ten subscriptions get a tenth of the rate: the same number of requests per second.
    latency(recorder, listener, paced, rate, 1, true);
    latency(recorder, listener, paced / 10, rate / 10, 10, true);
    latency(recorder, listener, paced / 10, rate / 10, 10, false);
    listenerDown(count * 5);
    return 0;
}
