// The interop namespace's instances, served by the host itself through an
// instance MI that the broker core routes to like any provider's: filters,
// listener destinations and subscriptions from the subscription manager, and the
// host's own description (indication service, object manager, namespaces,
// registered profiles).
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <memory>
#include <string>
#include <vector>

#include "orv/host/broker_core.hpp"
#include "orv/indication/subscription_manager.hpp"

namespace orv::indication {

inline constexpr const char* kInteropNamespace = "root/interop";

struct InteropDescription {
    std::string objectManagerName = "orv-cimhost";
    std::string objectManagerDescription = "orv-cimhost, the embedded CIM host";
};

class InteropProvider {
public:
    InteropProvider(host::BrokerCore& core, SubscriptionManager& manager, InteropDescription description = {});
    ~InteropProvider();
    InteropProvider(const InteropProvider&) = delete;
    InteropProvider& operator=(const InteropProvider&) = delete;

    // Makes the broker core route the interop classes of root/interop to this
    // provider. Call once, before requests are served.
    void registerWithCore();

    // The classes it serves, in root/interop.
    static const std::vector<std::string>& classNames();

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::indication
