#include "host_indications.hpp"

#include <map>

#include "orv/cimhost/log.hpp"

namespace orv::cimhost::detail {

namespace {

LogLevel levelOf(indication::Severity severity) {
    switch (severity) {
    case indication::Severity::Debug: return LogLevel::Debug;
    case indication::Severity::Info: return LogLevel::Info;
    case indication::Severity::Warning: return LogLevel::Warning;
    case indication::Severity::Error: return LogLevel::Error;
    }
    return LogLevel::Info;
}

LogLevel levelOf(exporter::ExportLogLevel level) {
    switch (level) {
    case exporter::ExportLogLevel::Debug: return LogLevel::Debug;
    case exporter::ExportLogLevel::Info: return LogLevel::Info;
    case exporter::ExportLogLevel::Warning: return LogLevel::Warning;
    case exporter::ExportLogLevel::Error: return LogLevel::Error;
    }
    return LogLevel::Info;
}

exporter::ExportLogLevel exportLevel() {
    if (logEnabled(LogLevel::Debug)) return exporter::ExportLogLevel::Debug;
    if (logEnabled(LogLevel::Info)) return exporter::ExportLogLevel::Info;
    if (logEnabled(LogLevel::Warning)) return exporter::ExportLogLevel::Warning;
    return exporter::ExportLogLevel::Error;
}

exporter::ExporterConfig exporterConfig(const HostConfig& config) {
    exporter::ExporterConfig out;
    out.queueLimit = config.indicationQueueLimit;
    out.logLevel = exportLevel();
    out.log = [](exporter::ExportLogLevel level, std::string_view line) { logLine(levelOf(level), line); };
    return out;
}

indication::ManagerOptions managerOptions(const HostConfig& config, const std::string& systemName) {
    indication::ManagerOptions options;
    options.stateDir = config.stateDir;
    options.systemName = systemName;
    options.deliveryRetryAttempts = config.deliveryRetryAttempts;
    options.deliveryRetryInterval = config.deliveryRetryInterval;
    options.log = [](indication::Severity severity, std::string_view line) { logLine(levelOf(severity), line); };
    return options;
}

}  // namespace

HostIndications::HostIndications(host::BrokerCore& core, const HostConfig& config, const std::string& systemName)
    : flushTimeout_(config.indicationFlushTimeout),
      exporter_(std::make_unique<exporter::Exporter>(exporterConfig(config))) {
    exporter::Exporter* sender = exporter_.get();
    manager_ = std::make_unique<indication::SubscriptionManager>(
        core, managerOptions(config, systemName),
        [sender](const std::string& id, const std::string& url, std::string xml,
                 const exporter::DeliveryPolicy& policy) { sender->submit(id, url, std::move(xml), policy); });
    indication::SubscriptionManager* manager = manager_.get();
    exporter_->setFatalErrorHandler(
        [manager](const std::string& id, exporter::OnFatalError policy) { manager->onFatalError(id, policy); });
    interop_ = std::make_unique<indication::InteropProvider>(core, *manager_);
    interop_->registerWithCore();
}

HostIndications::~HostIndications() { stop(); }

void HostIndications::restore() {
    for (const std::string& problem : manager_->restore()) {
        logLine(LogLevel::Error, "cannot restore " + problem);
    }
    const auto restored = manager_->subscriptions();
    logLine(LogLevel::Info, std::to_string(restored.size()) + " indication subscription(s) in " +
                                manager_->options().stateDir.string());
}

void HostIndications::stop() {
    if (stopped_) {
        return;
    }
    stopped_ = true;
    exporter_->shutdown(std::chrono::duration_cast<std::chrono::milliseconds>(flushTimeout_));
    std::map<std::string, std::pair<std::uint64_t, exporter::SubscriptionCounts>> all;
    for (const auto& [id, matched] : manager_->matchCounts()) {
        all[id].first = matched;
    }
    for (const auto& [id, counts] : exporter_->allCounts()) {
        all[id].second = counts;
    }
    for (const auto& [id, counts] : all) {
        logLine(LogLevel::Info, "indications of subscription " + id + ": " + std::to_string(counts.first) +
                                    " matched, " + std::to_string(counts.second.delivered) + " delivered, " +
                                    std::to_string(counts.second.retried) + " retried, " +
                                    std::to_string(counts.second.dropped) + " dropped");
    }
}

}  // namespace orv::cimhost::detail
