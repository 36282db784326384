// Delivery of indications to CIM-XML listeners.
//
// The exporter turns each indication into a CIM-XML export request (ExportIndication
// with the NewIndication parameter) and posts it to the destination's URL. It never
// blocks the thread that submits: every destination has a bounded queue and one
// sender thread of its own, which keeps the order of the indications it sends.
// A request that fails is retried as the subscription's delivery policy says; when
// the retries are spent the indication is dropped and the fatal-error handler is told,
// with the subscription's OnFatalErrorPolicy, so that the subscription's owner can
// disable or remove it.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace orv::exporter {

// CIM_IndicationSubscription.OnFatalErrorPolicy: 2 Ignore, 3 Disable, 4 Remove.
enum class OnFatalError { Ignore = 2, Disable = 3, Remove = 4 };

// The delivery properties of a subscription (DeliveryRetryAttempts,
// DeliveryRetryInterval, OnFatalErrorPolicy).
struct DeliveryPolicy {
    unsigned retryAttempts = 3;                     // further attempts after the first
    std::chrono::milliseconds retryInterval{20000}; // wait between two attempts
    OnFatalError onFatal = OnFatalError::Ignore;
};

// What happened to the indications of one subscription so far.
struct SubscriptionCounts {
    std::uint64_t delivered = 0;  // accepted by the listener
    std::uint64_t retried = 0;    // attempts after a failed one
    std::uint64_t dropped = 0;    // lost: queue full, retries spent, or shut down
};

enum class ExportLogLevel { Debug, Info, Warning, Error };

struct ExporterConfig {
    // Indications waiting per destination; one more is dropped (and counted).
    std::size_t queueLimit = 1000;
    std::chrono::milliseconds connectTimeout{5000};
    std::chrono::milliseconds readTimeout{10000};
    // A sender with nothing to send for this long ends, closing its connection; the
    // next indication for its destination starts a new one.
    std::chrono::milliseconds idleTimeout{60000};
    // Verify the listener's certificate on https destinations.
    bool verifyPeer = true;
    std::string caFile;  // certificates to verify with; system default when empty
    // Diagnostics: a line per change of a destination's state (failing, reachable
    // again, queue overflowing) at Warning/Info, and one per delivery at Debug. Called
    // from sender threads and, for an overflowing queue, from submit(); lines below
    // logLevel are not even formatted.
    std::function<void(ExportLogLevel, std::string_view)> log;
    ExportLogLevel logLevel = ExportLogLevel::Info;
};

class Exporter {
public:
    explicit Exporter(ExporterConfig config = {});
    // Shuts down with no flush budget: what is queued is dropped.
    ~Exporter();
    Exporter(const Exporter&) = delete;
    Exporter& operator=(const Exporter&) = delete;

    // Never blocks on the network: queues the indication for the destination's
    // sender thread (started on the first submit to that URL, or after it was idle). instanceXml is the
    // CIM-XML <INSTANCE> element of the indication, with the property list already
    // applied and embedded instances already encoded. After shutdown() the indication
    // is dropped and counted.
    void submit(const std::string& subscriptionId, const std::string& destinationUrl,
                std::string instanceXml, const DeliveryPolicy& policy);

    // Called from a sender thread when an indication of the subscription could not be
    // delivered after all its retries. It must not call back into the exporter's
    // shutdown().
    void setFatalErrorHandler(std::function<void(const std::string& subscriptionId, OnFatalError)> handler);

    SubscriptionCounts counts(const std::string& subscriptionId) const;
    // Every subscription's counts, by subscription id in id order (for a summary at shutdown).
    std::vector<std::pair<std::string, SubscriptionCounts>> allCounts() const;
    // Forgets a subscription's counts (after it was deleted).
    void forget(const std::string& subscriptionId);

    // Stops taking indications, gives the senders up to flushBudget to deliver what
    // is queued (no retry waits beyond it), drops the rest and joins every sender.
    // Idempotent.
    void shutdown(std::chrono::milliseconds flushBudget);

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

// Whether https destinations can be reached with this build.
bool tlsSupported() noexcept;

// Whether url can be a destination of this exporter; *why says what is wrong with it.
bool validDestinationUrl(std::string_view url, std::string* why = nullptr);

}  // namespace orv::exporter
