// Kernel system-information nodes of the simulated host.
#pragma once

#include "FixtureSource.h"
#include "orv/platform/backend/Backend.h"

namespace orv::platform::sim {

class SimKsi final : public KsiBackend {
public:
    explicit SimKsi(FixtureSource& source) : source_(source) {}

    KSI_Status checkSig(const void* signature, uint32_t length, uint32_t* result) override;
    KSI_Status get(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize) override;
    KSI_Status getInstanceList(KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list) override;
    KSI_Status admit(KsiCall call, const KSI_Param* param) override;

private:
    FixtureSource& source_;
};

} // namespace orv::platform::sim
