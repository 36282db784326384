// The kernel system-information nodes answered from the running machine.
// Interface addresses, the CPU topology and the CPU activity are read once per
// request (from KSI_CheckSig on, on the calling thread) and shared by the node
// reads of that request only: concurrent requests on other threads each have
// their own snapshot, and an interface that vanishes during a request still
// answers what the request's listing saw.
#pragma once

#include "cpu_load_sampler.hpp"
#include "cpu_topology.hpp"
#include "interface_addresses.hpp"

#include "orv/platform/backend/Backend.h"

#include <chrono>
#include <map>
#include <memory>

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

    // Drops the calling thread's snapshot: its next read starts a new request.
    void invalidate();

    KSI_Status checkSig(const void* signature, uint32_t length, uint32_t* result) override;
    KSI_Status get(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize) override;
    KSI_Status getInstanceList(KSI_NodeId node, const orv::platform::KsiParams& params,
                               std::optional<orv::platform::KsiParams>& list) override;

private:
    using Interfaces = std::vector<InterfaceAddresses>;
    using Activity = CpuActivities;
    struct Snapshot;

    std::shared_ptr<const Interfaces> interfaces();
    std::shared_ptr<const CpuTopology> topology();
    std::shared_ptr<const Activity> activity();
    // The calling thread's snapshot of this instance.
    Snapshot& snapshot();
    // The interface named by params[1] after the stack in params[0], as the request's snapshot has it.
    const InterfaceAddresses* vnic(const Interfaces& all, const orv::platform::KsiParams& params) const;

    KSI_Status getNetwork(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);
    KSI_Status getCpu(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);
    KSI_Status getScheduler(KSI_NodeId node, const orv::platform::KsiParams& params, void* out, uint32_t outSize);

    LinuxRoots roots_;
    const std::uint64_t id_;  // tells this instance's thread snapshots from another's
    CpuLoadSampler sampler_;
};

}  // namespace orv::linuxhost
