// The heartbeat provider's factory called by the test itself, with the broker
// core's broker behind a broker table of the test's own whose
// deliverIndication records each heartbeat (instead of the core's
// subscribers) and fails the ones the test chooses, and whose
// prepareAttachThread hands out a context that tells when the thread released
// it, the last thing the heartbeat thread does. Lets a test see the provider's own answers (cleanup's status) and
// delivery failures, which the core never reports.
#pragma once

#include <cmpift.h>

#include <atomic>
#include <set>

#include "HeartbeatFixture.h"

namespace heartbeat {

class DirectProvider {
public:
    // `core` must outlive the object; failing lists the stamps whose delivery fails.
    DirectProvider(const CMPIBroker* core, HeartbeatLog& log, std::set<std::uint32_t> failing = {});
    // Terminates the provider (if the test did not) and unloads the library.
    ~DirectProvider();
    DirectProvider(const DirectProvider&) = delete;
    DirectProvider& operator=(const DirectProvider&) = delete;

    // Calls the exported factory, as a broker does on first use.
    CMPIIndicationMI* create();
    CMPIStatus cleanup(bool terminating);
    // Whether the heartbeat thread released its prepared context (on its way out).
    bool threadFinished() const;

private:
    static CMPIContext* prepare(const CMPIBroker* mb, const CMPIContext* ctx);
    static CMPIStatus releaseContext(CMPIContext* ctx);
    static CMPIStatus deliver(const CMPIBroker* mb, const CMPIContext* ctx, const char* ns,
                              const CMPIInstance* indication);

    HeartbeatLog& log_;
    std::set<std::uint32_t> failing_;
    CMPIBrokerFT table_{};
    CMPIBroker broker_{};
    CMPIContextFT contextTable_{};
    CMPIContext threadContext_{};
    std::atomic<bool> contextReleased_{false};
    void* library_ = nullptr;
    CMPIIndicationMI* mi_ = nullptr;
    bool terminated_ = false;
};

}  // namespace heartbeat
