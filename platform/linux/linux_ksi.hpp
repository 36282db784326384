// The kernel system-information nodes answered from the running machine.
// Interface addresses and the CPU topology are read once per batch (one
// request of a provider) and shared by the node reads of that batch; an
// interface that vanished since the listing answers KSI_ERR_NOT_FOUND.
#pragma once

#include "cpu_state.hpp"
#include "cpu_topology.hpp"
#include "interface_addresses.hpp"

#include "orv/platform/backend/Backend.h"

#include <chrono>
#include <map>
#include <memory>
#include <mutex>

namespace orv::linuxhost {

struct LinuxRoots {
    std::string sys = "/sys";
    std::string proc = "/proc";
    std::string dev = "/dev";
    std::chrono::milliseconds loadWindow{50};
};

// The one TCP/IP stack instance the machine has.
inline constexpr const char* kDefaultStack = "defaultTcpipStack";

class LinuxKsi final : public orv::platform::KsiBackend {
public:
    explicit LinuxKsi(LinuxRoots roots);

    // Drops the per-batch snapshots.
    void invalidate();

    KSI_Status checkSig(const void* signature, uint32_t length, uint32_t* result) override;
    KSI_Status get(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize) override;
    KSI_Status getInstanceList(KSI_NodeId node, const orv::platform::KsiParams& params,
                               std::optional<orv::platform::KsiParams>& list) override;

private:
    using Interfaces = std::vector<InterfaceAddresses>;
    using Activity = std::map<unsigned, CpuActivity>;

    std::shared_ptr<const Interfaces> interfaces();
    std::shared_ptr<const CpuTopology> topology();
    std::shared_ptr<const Activity> activity();
    // The interface named by params[1] after the stack in params[0], if it still exists.
    const InterfaceAddresses* vnic(const Interfaces& all, const orv::platform::KsiParams& params) const;

    KSI_Status getNetwork(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);
    KSI_Status getCpu(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);
    KSI_Status getScheduler(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);

    LinuxRoots roots_;
    std::mutex mutex_;
    std::shared_ptr<const Interfaces> interfaces_;
    std::shared_ptr<const CpuTopology> topology_;
    std::shared_ptr<const Activity> activity_;
};

}  // namespace orv::linuxhost
