#include "SimKsi.h"

#include <cstring>

#include "KsiNodeNames.h"
#include "KsiNodeReads.h"

namespace orv::platform::sim {
namespace {

constexpr std::string_view kCallNames[] = {
    "KSI_CheckSig", "KSI_Get", "KSI_GetInstanceListAlloc", "KSI_ParamListCreate", "KSI_ParamListDestroy",
    "KSI_ParamListUsedCount", "KSI_ParamListAddString", "KSI_ParamListAddInt", "KSI_ParamListRemoveLastParam",
    "KSI_ParamListGetParam", "KSI_ParamListGetInt32", "KSI_ParamGetString",
};

std::vector<std::string> describe(const KsiParams& params)
{
    std::vector<std::string> texts;
    texts.reserve(params.size());
    for (const KSI_Param& param : params) {
        texts.push_back(param.describe());
    }
    return texts;
}

// The injected status of this invocation, or KSI_OK.
KSI_Status injected(const HostModel& host, std::string_view call, std::string_view node, const std::vector<std::string>& params)
{
    const FaultRule* rule = host.faults.fire(CallSite{call, node, &params, {}});
    if (rule == nullptr) {
        return KSI_OK;
    }
    return rule->status ? static_cast<KSI_Status>(*rule->status) : KSI_ERR_FAILURE;
}

} // namespace

KSI_Status SimKsi::checkSig(const void* signature, uint32_t length, uint32_t* result)
{
    FixtureResult fixture = source_.current();
    if (!fixture.host) {
        return KSI_ERR_FAILURE;
    }
    if (KSI_Status status = injected(*fixture.host, "KSI_CheckSig", {}, {}); status != KSI_OK) {
        return status;
    }
    if (signature == nullptr || result == nullptr || length != KSI_SIGNATURE_LENGTH ||
        std::memcmp(signature, KSI_SIGNATURE, KSI_SIGNATURE_LENGTH) != 0) {
        return KSI_ERR_SIGNATURE;
    }
    *result = KSI_INTERFACE_VERSION;
    return KSI_OK;
}

KSI_Status SimKsi::get(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize)
{
    FixtureResult fixture = source_.current();
    if (!fixture.host) {
        return KSI_ERR_FAILURE;
    }
    if (KSI_Status status = injected(*fixture.host, "KSI_Get", nodeName(node), describe(params)); status != KSI_OK) {
        return status;
    }
    return readNode(*fixture.host, node, params, out, outSize);
}

KSI_Status SimKsi::getInstanceList(KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list)
{
    FixtureResult fixture = source_.current();
    if (!fixture.host) {
        return KSI_ERR_FAILURE;
    }
    const std::vector<std::string> texts = describe(params);
    if (KSI_Status status = injected(*fixture.host, "KSI_GetInstanceListAlloc", nodeName(node), texts); status != KSI_OK) {
        return status;
    }
    return listNode(*fixture.host, node, params, list);
}

KSI_Status SimKsi::admit(KsiCall call, const KSI_Param* param)
{
    FixtureResult fixture = source_.current();
    if (!fixture.host) {
        // Parameter lists are the caller's own memory: they work without a host.
        return KSI_OK;
    }
    std::vector<std::string> texts;
    if (param != nullptr) {
        texts.push_back(param->describe());
    }
    return injected(*fixture.host, kCallNames[static_cast<size_t>(call)], {}, texts);
}

} // namespace orv::platform::sim
