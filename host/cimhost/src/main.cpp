// orv-cimhost: serves the registered CMPI providers to CIM-XML clients.
//
// Exit status: 0 after a clean stop (SIGTERM or SIGINT), 1 when the host cannot start,
// 2 for bad command-line options or configuration.
#include <pthread.h>
#include <signal.h>

#include <cstdio>
#include <exception>
#include <string>
#include <thread>

#include "orv/cimhost/cim_host.hpp"
#include "orv/cimhost/host_config.hpp"
#include "orv/cimhost/log.hpp"

namespace {

using namespace orv::cimhost;

// SIGUSR1 only wakes the signal thread when the host stops on its own.
sigset_t stopSignals() {
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, SIGTERM);
    sigaddset(&set, SIGINT);
    sigaddset(&set, SIGUSR1);
    return set;
}

void failStart(const char* what, int status) {
    std::fprintf(stderr, "orv-cimhost: %s\n", what);
    std::fflush(stderr);
    std::_Exit(status);
}

int serve(const HostConfig& config, const sigset_t& signals) {
    std::unique_ptr<CimHost> host;
    try {
        host = std::make_unique<CimHost>(config);
    } catch (const std::exception& error) {
        failStart((std::string("cannot start: ") + error.what()).c_str(), 1);
    }
    std::thread signalThread([&host, &signals] {
        int received = 0;
        sigwait(&signals, &received);
        if (received != SIGUSR1) {
            logLine(LogLevel::Info, std::string("stopping on ") + (received == SIGINT ? "SIGINT" : "SIGTERM"));
        }
        host->stop();
    });
    if (host->port() >= 0) {
        logLine(LogLevel::Info, "listening on " + config.listenAddress + ":" + std::to_string(host->port()) +
                                    " (POST /cimom)");
    }
    if (host->httpsPort() >= 0) {
        logLine(LogLevel::Info, "listening on " + config.listenAddress + ":" + std::to_string(host->httpsPort()) +
                                    " (HTTPS, POST /cimom)");
    }
    host->run();
    pthread_kill(signalThread.native_handle(), SIGUSR1);
    signalThread.join();
    host.reset();
    logLine(LogLevel::Info, "stopped");
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    // Block the stop signals before any thread starts, so only the signal thread takes them.
    const sigset_t signals = stopSignals();
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    signal(SIGPIPE, SIG_IGN);

    CommandLine commandLine;
    try {
        commandLine = parseCommandLine(argc, argv);
    } catch (const std::exception& error) {
        failStart(error.what(), 2);
    }
    if (commandLine.showHelp) {
        std::fputs(usageText().c_str(), stdout);
        return 0;
    }
    if (commandLine.showVersion) {
        std::puts(versionText().c_str());
        return 0;
    }
    setLogLevel(commandLine.config.logLevel);
    return serve(commandLine.config, signals);
}
