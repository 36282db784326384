#include "orv/exporter/exporter.hpp"

#include <atomic>
#include <map>
#include <mutex>
#include <set>
#include <vector>

#include "destination.hpp"

namespace orv::exporter {

struct Exporter::Impl final : DeliveryEvents {
    explicit Impl(ExporterConfig configIn) : config(std::move(configIn)) {
        senderOptions.connectTimeout = config.connectTimeout;
        senderOptions.readTimeout = config.readTimeout;
        senderOptions.verifyPeer = config.verifyPeer;
        senderOptions.caFile = config.caFile;
    }

    void count(const std::string& subscriptionId, Outcome outcome) override {
        std::lock_guard lock(countsMutex);
        SubscriptionCounts& counts = countsBySubscription[subscriptionId];
        switch (outcome) {
            case Outcome::Delivered: ++counts.delivered; break;
            case Outcome::Retried: ++counts.retried; break;
            case Outcome::Dropped: ++counts.dropped; break;
        }
    }

    void fatal(const std::string& subscriptionId, OnFatalError policy) override {
        std::function<void(const std::string&, OnFatalError)> handler;
        {
            std::lock_guard lock(mutex);
            handler = fatalHandler;
        }
        if (handler) {
            handler(subscriptionId, policy);
        }
    }

    bool logs(ExportLogLevel level) const override {
        return config.log && level >= config.logLevel;
    }

    void log(ExportLogLevel level, std::string_view line) override {
        if (logs(level)) {
            config.log(level, line);
        }
    }

    std::uint64_t nextMessageId() override {
        return messageIds.fetch_add(1, std::memory_order_relaxed);
    }

    // The destination of url, started on first use; nullptr for URLs that cannot be one.
    Destination* destinationFor(const std::string& url);

    const ExporterConfig config;
    SenderOptions senderOptions;
    std::atomic<std::uint64_t> messageIds{1};

    mutable std::mutex mutex;  // destinations, badUrls, stopped, fatalHandler
    std::map<std::string, std::unique_ptr<Destination>, std::less<>> destinations;
    std::set<std::string, std::less<>> badUrls;
    bool stopped = false;
    std::function<void(const std::string&, OnFatalError)> fatalHandler;

    std::mutex shutdownMutex;  // one shutdown at a time

    mutable std::mutex countsMutex;
    std::map<std::string, SubscriptionCounts, std::less<>> countsBySubscription;
};

Destination* Exporter::Impl::destinationFor(const std::string& url) {
    if (auto found = destinations.find(url); found != destinations.end()) {
        if (!found->second->ended()) {
            return found->second.get();
        }
        destinations.erase(found);
    }
    std::erase_if(destinations, [](const auto& entry) { return entry.second->ended(); });
    std::string why;
    std::optional<DestinationUrl> parsed = parseDestinationUrl(url, &why);
    if (parsed && parsed->https && !tlsSupported()) {
        parsed.reset();
        why = "this build has no TLS support";
    }
    if (!parsed) {
        if (badUrls.insert(url).second) {
            log(ExportLogLevel::Error, "cannot deliver indications to " + url + ": " + why);
        }
        return nullptr;
    }
    auto destination =
        std::make_unique<Destination>(url, *parsed, senderOptions, config.queueLimit, config.idleTimeout, *this);
    return destinations.emplace(url, std::move(destination)).first->second.get();
}

Exporter::Exporter(ExporterConfig config) : impl_(std::make_unique<Impl>(std::move(config))) {}

Exporter::~Exporter() {
    shutdown(std::chrono::milliseconds(0));
}

void Exporter::submit(const std::string& subscriptionId, const std::string& destinationUrl,
                      std::string instanceXml, const DeliveryPolicy& policy) {
    bool queued = false;
    {
        std::lock_guard lock(impl_->mutex);
        QueuedIndication indication{subscriptionId, std::move(instanceXml), policy};
        // A sender that has just ended for being idle is replaced by a new one.
        for (int attempt = 0; attempt < 2 && !impl_->stopped && !queued; ++attempt) {
            Destination* destination = impl_->destinationFor(destinationUrl);
            if (destination == nullptr) {
                break;
            }
            const Destination::Enqueued result = destination->enqueue(indication);
            queued = result == Destination::Enqueued::Yes;
            if (result == Destination::Enqueued::QueueFull) {
                break;
            }
        }
    }
    if (!queued) {
        impl_->count(subscriptionId, DeliveryEvents::Outcome::Dropped);
    }
}

void Exporter::setFatalErrorHandler(std::function<void(const std::string&, OnFatalError)> handler) {
    std::lock_guard lock(impl_->mutex);
    impl_->fatalHandler = std::move(handler);
}

SubscriptionCounts Exporter::counts(const std::string& subscriptionId) const {
    std::lock_guard lock(impl_->countsMutex);
    auto found = impl_->countsBySubscription.find(subscriptionId);
    return found == impl_->countsBySubscription.end() ? SubscriptionCounts{} : found->second;
}

std::vector<std::pair<std::string, SubscriptionCounts>> Exporter::allCounts() const {
    std::lock_guard lock(impl_->countsMutex);
    return {impl_->countsBySubscription.begin(), impl_->countsBySubscription.end()};
}

void Exporter::forget(const std::string& subscriptionId) {
    std::lock_guard lock(impl_->countsMutex);
    impl_->countsBySubscription.erase(subscriptionId);
}

void Exporter::shutdown(std::chrono::milliseconds flushBudget) {
    std::lock_guard shutdownLock(impl_->shutdownMutex);
    std::map<std::string, std::unique_ptr<Destination>, std::less<>> destinations;
    {
        std::lock_guard lock(impl_->mutex);
        impl_->stopped = true;
        destinations.swap(impl_->destinations);
    }
    const Clock::time_point deadline = Clock::now() + flushBudget;
    for (auto& [url, destination] : destinations) {
        destination->beginShutdown(deadline);
    }
    for (auto& [url, destination] : destinations) {
        destination->waitEnded(deadline);
    }
    for (auto& [url, destination] : destinations) {
        destination->stopAndJoin();
    }
}

bool tlsSupported() noexcept {
#ifdef ORV_EXPORT_TLS
    return true;
#else
    return false;
#endif
}

bool validDestinationUrl(std::string_view url, std::string* why) {
    std::optional<DestinationUrl> parsed = parseDestinationUrl(url, why);
    if (parsed && parsed->https && !tlsSupported()) {
        if (why != nullptr) {
            *why = "this build has no TLS support";
        }
        return false;
    }
    return parsed.has_value();
}

}  // namespace orv::exporter
