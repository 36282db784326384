// The host's indication side: the export client, the subscriptions with their
// store, and the interop namespace's provider, started and stopped with the host.
#pragma once

#include <memory>
#include <string>

#include "orv/cimhost/host_config.hpp"
#include "orv/exporter/exporter.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/indication/interop_provider.hpp"
#include "orv/indication/subscription_manager.hpp"

namespace orv::cimhost::detail {

class HostIndications {
public:
    // Opens the state folder (std::runtime_error when it cannot be used) and serves
    // root/interop through the core. Nothing is activated yet.
    HostIndications(host::BrokerCore& core, const HostConfig& config, const std::string& systemName);
    ~HostIndications();
    HostIndications(const HostIndications&) = delete;
    HostIndications& operator=(const HostIndications&) = delete;

    // Re-activates the stored subscriptions; what cannot be restored is logged.
    void restore();
    // Gives the queued indications the flush time, drops the rest, joins the senders
    // and logs the counts of every subscription. Later indications are dropped.
    void stop();

private:
    std::chrono::seconds flushTimeout_;
    std::unique_ptr<exporter::Exporter> exporter_;
    std::unique_ptr<indication::SubscriptionManager> manager_;
    std::unique_ptr<indication::InteropProvider> interop_;
    bool stopped_ = false;
};

}  // namespace orv::cimhost::detail
