// orv-cimlistener: receives indications over CIM-XML and prints them on standard output.
#include <signal.h>

#include <atomic>
#include <cstdio>
#include <iostream>
#include <mutex>
#include <thread>

#include "orv/listener/export_handler.hpp"
#include "orv/listener/indication_format.hpp"
#include "orv/listener/listener_options.hpp"

namespace {

using namespace orv;
using Clock = std::chrono::steady_clock;

// Prints indications, one line each, and counts them up to the --count limit.
class Printer {
public:
    explicit Printer(const listener::ListenerOptions& options) : options_(options) {}

    std::optional<std::string> take(const cimxml::InstanceModel& indication) {
        const std::string line = options_.json ? listener::formatJson(indication) : listener::formatText(indication);
        std::lock_guard lock(mutex_);
        if (options_.count && printed_ >= *options_.count) {
            return "the listener has received its " + std::to_string(*options_.count) + " indications";
        }
        std::fwrite(line.data(), 1, line.size(), stdout);
        std::fputc('\n', stdout);
        std::fflush(stdout);
        ++printed_;
        done_ = options_.count && printed_ >= *options_.count;
        return std::nullopt;
    }

    bool done() const {
        std::lock_guard lock(mutex_);
        return done_;
    }
    unsigned long printed() const {
        std::lock_guard lock(mutex_);
        return printed_;
    }

private:
    const listener::ListenerOptions& options_;
    mutable std::mutex mutex_;
    unsigned long printed_ = 0;
    bool done_ = false;
};

enum class Ending { Signal, Count, Timeout };

// Waits on the main thread for SIGTERM/SIGINT, the --count limit or the --timeout.
Ending waitForEnd(const sigset_t& signals, const Printer& printer, const listener::ListenerOptions& options) {
    const Clock::time_point deadline =
        options.timeout ? Clock::now() + *options.timeout : Clock::time_point::max();
    const timespec tick{0, 50'000'000};
    for (;;) {
        if (sigtimedwait(&signals, nullptr, &tick) > 0) {
            return Ending::Signal;
        }
        if (printer.done()) {
            return Ending::Count;
        }
        if (Clock::now() >= deadline) {
            return Ending::Timeout;
        }
    }
}

int serve(const listener::ListenerOptions& options, const sigset_t& signals) {
    Printer printer(options);
    http::ServerOptions serverOptions;
    serverOptions.address = options.address;
    serverOptions.port = options.port;
    serverOptions.path.clear();  // a listener's URL may name any path
    serverOptions.threads = 4;
    serverOptions.realm = "orv-cimlistener";
    // Stopping waits for idle kept-alive connections to time out: keep that short.
    serverOptions.keepAliveTimeout = std::chrono::seconds(1);
    // A sender keeps its connection for as long as it has indications to send.
    serverOptions.keepAliveMaxRequests = 1000000;
    http::HttpServer server(serverOptions, [&printer](const http::Request& request) {
        return listener::handleExportRequest(
            request, [&printer](const cimxml::InstanceModel& indication) { return printer.take(indication); });
    });
    try {
        server.bind();
    } catch (const std::exception& error) {
        std::cerr << "orv-cimlistener: " << error.what() << '\n';
        return 1;
    }
    std::cerr << "orv-cimlistener: listening on " << options.address << ':' << server.port() << std::endl;
    std::atomic<bool> served{false};
    std::thread thread([&] {
        server.run();
        served = true;
    });
    const Ending ending = waitForEnd(signals, printer, options);
    while (!server.running() && !served) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    server.stop();
    thread.join();
    if (ending == Ending::Timeout && options.count) {
        std::cerr << "orv-cimlistener: timed out with " << printer.printed() << " of " << *options.count
                  << " indications\n";
        return 1;
    }
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    listener::ListenerOptions options;
    try {
        options = listener::parseListenerArguments(std::vector<std::string>(argv + 1, argv + argc));
    } catch (const listener::UsageError& error) {
        std::cerr << "orv-cimlistener: " << error.what() << '\n' << listener::kListenerUsage;
        return 2;
    }
    if (options.help) {
        std::cout << listener::kListenerUsage;
        return 0;
    }
    // The signals are taken by the main thread only: every thread started later inherits the mask.
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    signal(SIGPIPE, SIG_IGN);
    return serve(options, signals);
}
