#include "orv/cimhost/cim_host.hpp"

#include <unistd.h>

#include <chrono>
#include <stdexcept>
#include <thread>

#include "orv/cimhost/cim_dispatcher.hpp"
#include "orv/cimhost/cim_http_handler.hpp"
#include "orv/cimhost/log.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/http/http_server.hpp"
#include "host_indications.hpp"
#include "startup_checks.hpp"

namespace orv::cimhost {

namespace fs = std::filesystem;

struct CimHost::Impl {
    std::unique_ptr<host::BrokerCore> core;
    std::unique_ptr<detail::HostIndications> indications;
    std::unique_ptr<CimDispatcher> dispatcher;
    std::unique_ptr<http::HttpServer> server;
    std::atomic<bool> stopRequested{false};
    std::atomic<bool> runEntered{false};
    std::atomic<bool> runFinished{false};

    // The stop order, also when a start fails half-way: the providers are cleaned up while
    // the host's own interop provider still exists, since the core calls its cleanup too.
    ~Impl() {
        if (dispatcher) {
            dispatcher->drain();
        }
        if (indications) {
            indications->stop();
        }
        if (core) {
            core->shutdown();
        }
    }
};

namespace {

std::string machineName() {
    char buffer[256] = {};
    if (gethostname(buffer, sizeof buffer - 1) != 0 || buffer[0] == '\0') {
        return "localhost";
    }
    return buffer;
}

http::ServerOptions serverOptions(const HostConfig& config) {
    http::ServerOptions options;
    options.address = config.listenAddress;
    options.port = config.httpPort;
    options.http = config.enableHttp;
    options.https = config.enableHttps;
    options.httpsPort = config.httpsPort;
    options.certificateFile = config.sslCertificateFile.string();
    options.keyFile = config.sslKeyFile.string();
    options.threads = config.threads;
    options.maxRequestBytes = config.maxRequestBytes;
    options.readTimeout = config.readTimeout;
    options.writeTimeout = config.writeTimeout;
    options.keepAliveTimeout = config.keepAliveTimeout;
    options.keepAliveMaxRequests = config.keepAliveMaxRequests;
    options.maxConnectionsPerClient = config.maxConnectionsPerClient;
    options.serverName = "orv-cimhost/" ORV_VERSION;
    if (!config.credentialsFile.empty()) {
        options.credentials = http::Credentials::loadFile(config.credentialsFile);
    }
    if (!config.pamService.empty()) {
        options.pam.emplace(config.pamService);
    }
    return options;
}

void logRequest(const http::Request& request, const http::Response& response) {
    if (!logEnabled(LogLevel::Debug)) {
        return;
    }
    const std::string* method = request.header("CIMMethod");
    logLine(LogLevel::Debug, request.method + " " + request.path + " " + (method ? *method : std::string("-")) +
                                 " -> " + std::to_string(response.status) + " (" +
                                 std::to_string(response.body.size()) + " bytes)");
}

void logServerEvent(const std::string& line) {
    logLine(LogLevel::Warning, line);
}

host::CoreConfig coreConfig(const HostConfig& config) {
    host::CoreConfig core;
    core.providerDirs = config.providerDirs;
    core.registrationFiles = config.registrationFiles;
    core.mofPaths = config.mofFiles;
    if (!config.interopMof.empty()) {
        core.mofPaths.push_back(config.interopMof);
    }
    core.mofNamespace = config.mofNamespace;
    core.warningSink = [](const std::string& line) { logLine(LogLevel::Warning, line); };
    return core;
}

}  // namespace

CimHost::CimHost(const HostConfig& config) : impl_(std::make_unique<Impl>()) {
    detail::selectPlatform(config);
    detail::checkInputFiles(config);
    try {
        impl_->core = std::make_unique<host::BrokerCore>(coreConfig(config));
    } catch (const std::exception& error) {
        throw std::runtime_error(error.what());
    }
    detail::preloadProviders(*impl_->core);
    const std::string hostName = config.hostName.empty() ? machineName() : config.hostName;
    impl_->indications = std::make_unique<detail::HostIndications>(*impl_->core, config, hostName);
    if (config.preload) {
        detail::createAllProviders(*impl_->core);
    }
    impl_->dispatcher = std::make_unique<CimDispatcher>(*impl_->core, impl_->core->classes(), hostName,
                                                        config.providerCallLimit, config.arrayNullElements);
    const CimDispatcher* dispatcher = impl_->dispatcher.get();
    impl_->server = std::make_unique<http::HttpServer>(
        serverOptions(config),
        [dispatcher](const http::Request& request) { return handleCimRequest(request, *dispatcher); },
        logRequest, logServerEvent);
    impl_->server->bind();
    // Subscriptions are activated once the host is sure to serve: a start that fails
    // (port taken) activates nothing and says only why it failed.
    impl_->indications->restore();
}

CimHost::~CimHost() {
    stop();
}

int CimHost::port() const noexcept {
    return impl_->server->port();
}

int CimHost::httpsPort() const noexcept {
    return impl_->server->httpsPort();
}

void CimHost::run() {
    impl_->runEntered.store(true);
    if (!impl_->stopRequested.load()) {
        impl_->server->run();
    }
    impl_->runFinished.store(true);
    // Stop order: no new requests, the requests in flight finished, the queued
    // indications flushed (bounded), then the providers cleaned up and their threads joined.
    impl_->dispatcher->drain();
    impl_->indications->stop();
    impl_->core->shutdown();
}

void CimHost::stop() {
    impl_->stopRequested.store(true);
    // The server ignores stop() until it listens: wait for that if run() has begun.
    while (impl_->runEntered.load() && !impl_->runFinished.load()) {
        if (impl_->server->running()) {
            impl_->server->stop();
            return;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
}

}  // namespace orv::cimhost
