// Indication subscriptions of the host: filters, listener destinations and the
// subscriptions that join them, with the checks a broker makes, kept in a state
// store, activated at the providers through the broker core, and matched against
// every indication a provider delivers.
//
// Threads: every member may be called from any thread. Changes are serialised;
// deliveries read an immutable snapshot of the active subscriptions, so a provider
// thread calling deliverIndication never waits for a change in progress.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/exporter/exporter.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/indication/records.hpp"
#include "orv/indication/state_store.hpp"

namespace orv::indication {

// The outcome of a change: a CMPI return code and a message for the client.
struct Status {
    CMPIrc rc = CMPI_RC_OK;
    std::string message;
    bool ok() const noexcept { return rc == CMPI_RC_OK; }
};

enum class Severity { Debug, Info, Warning, Error };

struct ManagerOptions {
    std::filesystem::path stateDir;
    // SystemName / SystemCreationClassName the host gives its own objects.
    std::string systemName = "localhost";
    std::string systemCreationClassName = "CIM_ComputerSystem";
    // CIM_IndicationService.DeliveryRetryAttempts / DeliveryRetryInterval.
    unsigned deliveryRetryAttempts = 3;
    std::chrono::seconds deliveryRetryInterval{20};
    std::function<void(Severity, std::string_view)> log;
};

// Receives each matched indication: the subscription's id, the destination URL,
// the indication's CIM-XML INSTANCE element (SELECT list applied) and the policy.
using DeliverySink = std::function<void(const std::string& subscriptionId, const std::string& destinationUrl,
                                        std::string instanceXml, const exporter::DeliveryPolicy& policy)>;

class SubscriptionManager {
public:
    // Opens the store (throws std::runtime_error when its folder cannot be used)
    // and receives the core's indications from now on; nothing is active until
    // restore() or a new subscription.
    SubscriptionManager(host::BrokerCore& core, ManagerOptions options, DeliverySink sink);
    // Stops receiving indications. Leaves the providers' filters to the core's shutdown.
    ~SubscriptionManager();
    SubscriptionManager(const SubscriptionManager&) = delete;
    SubscriptionManager& operator=(const SubscriptionManager&) = delete;

    // Reads what the store holds and activates the enabled subscriptions. Returns one
    // line per stored object that could not be restored (it stays stored).
    std::vector<std::string> restore();

    // Creation fills the system keys and checks: a filter needs a Name, a Query in
    // WQL that parses and names an indication class of its source namespace; a
    // destination needs a Name and an http(s) URL; a subscription needs an existing
    // filter and destination and is activated at the providers (a provider's refusal
    // refuses the subscription). Names are unique per kind, without regard to case:
    // CIM_ERR_ALREADY_EXISTS.
    Status createFilter(FilterRecord filter, const std::string& principal = {});
    Status createDestination(DestinationRecord destination);
    Status createSubscription(SubscriptionRecord subscription, const std::string& principal = {});
    // Deletion: CIM_ERR_NOT_FOUND when missing; a filter or destination that a
    // subscription uses answers CIM_ERR_FAILED ("Filter in use" / "Handler in use").
    Status deleteFilter(std::string_view name);
    Status deleteDestination(std::string_view name);
    Status deleteSubscription(std::string_view filterName, std::string_view handlerName);

    std::vector<FilterRecord> filters() const;
    std::vector<DestinationRecord> destinations() const;
    std::vector<SubscriptionRecord> subscriptions() const;
    std::optional<FilterRecord> filter(std::string_view name) const;
    std::optional<DestinationRecord> destination(std::string_view name) const;
    std::optional<SubscriptionRecord> subscription(std::string_view filterName, std::string_view handlerName) const;

    const ManagerOptions& options() const noexcept { return options_; }
    // The delivery policy of a subscription (retries from the indication service).
    exporter::DeliveryPolicy policyOf(const SubscriptionRecord& subscription) const;

    // The export client gave up on an indication of the subscription: 3 (Disable)
    // deactivates it and stores it disabled, 4 (Remove) deletes it, 2 (Ignore) keeps it.
    void onFatalError(const std::string& subscriptionId, exporter::OnFatalError policy);

    // How many indications matched each subscription since the start (by id).
    std::map<std::string, std::uint64_t> matchCounts() const;

    // Stops matching: indications delivered from now on are dropped. Idempotent.
    void stopDelivery();

private:
    struct Active;
    struct Snapshot;

    void deliver(std::string_view ns, const CMPIInstance* indication);
    Status activate(const SubscriptionRecord& subscription, const std::string& principal);
    Status enroll(SubscriptionRecord subscription, const std::string& principal);
    void deactivate(const SubscriptionRecord& subscription);
    void publishSnapshot();
    void log(Severity severity, const std::string& line) const;
    Status persist(const std::string& id, const std::string& text);
    Status unpersist(const std::string& id);
    Status checkFilter(const FilterRecord& filter) const;

    host::BrokerCore& core_;
    ManagerOptions options_;
    DeliverySink sink_;
    StateStore store_;

    mutable std::mutex mutex_;
    std::map<std::string, FilterRecord> filters_;            // by lower-case name
    std::map<std::string, DestinationRecord> destinations_;  // by lower-case name
    std::map<std::string, SubscriptionRecord> subscriptions_;  // by store id
    std::map<std::string, unsigned> filterUse_;              // active subscriptions per filter

    std::shared_ptr<const Snapshot> snapshot_;  // read with std::atomic_load
    std::atomic<bool> delivering_{true};
    std::uint64_t subscriberId_ = 0;
};

}  // namespace orv::indication
