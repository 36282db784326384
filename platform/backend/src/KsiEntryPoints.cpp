// The kernel system-information calls: parameter lists are kept here; node
// reads and instance lists go to the selected substitute, which may also
// refuse any single list operation.
#include <memory>
#include <new>
#include <optional>

#include "ksi/Ksi.h"
#include "orv/platform/backend/Selector.h"

using orv::platform::activeBackend;
using orv::platform::KsiCall;
using orv::platform::KsiParams;

namespace {

KsiParams noParams;

const KsiParams& itemsOf(const KSI_ParamList* list)
{
    return list != nullptr ? list->items : noParams;
}

KSI_Status admit(KsiCall call, const KSI_Param* param)
{
    return activeBackend().ksi().admit(call, param);
}

// Runs body, turning an escaping exception into the status a C caller expects.
template <typename Body>
KSI_Status guarded(Body body) noexcept
{
    try {
        return body();
    } catch (const std::bad_alloc&) {
        return KSI_ERR_NO_MEMORY;
    } catch (...) {
        return KSI_ERR_FAILURE;
    }
}

KSI_Status addParam(KSI_ParamList* list, KsiCall call, KSI_Param param)
{
    if (list == nullptr) {
        return KSI_ERR_BAD_PARAM;
    }
    if (KSI_Status status = admit(call, &param); status != KSI_OK) {
        return status;
    }
    list->items.push_back(std::move(param));
    return KSI_OK;
}

const KSI_Param* slotAt(const KSI_ParamList* list, uint32_t index)
{
    if (list == nullptr || index >= list->items.size()) {
        return nullptr;
    }
    return &list->items[index];
}

} // namespace

extern "C" {

KSI_Status KSI_CheckSig(const void* signature, uint32_t length, uint32_t* result)
{
    return guarded([&] {
        activeBackend().beginBatch();
        return activeBackend().ksi().checkSig(signature, length, result);
    });
}

KSI_Status KSI_Get(KSI_NodeId node, const KSI_ParamList* params, void* out, uint32_t outSize)
{
    return guarded([&] { return activeBackend().ksi().get(node, itemsOf(params), out, outSize); });
}

KSI_Status KSI_GetInstanceListAlloc(KSI_NodeId node, const KSI_ParamList* params, KSI_ParamList** list)
{
    if (list == nullptr) {
        return KSI_ERR_BAD_PARAM;
    }
    *list = nullptr;
    return guarded([&] {
        std::optional<KsiParams> instances;
        KSI_Status status = activeBackend().ksi().getInstanceList(node, itemsOf(params), instances);
        if (status == KSI_OK && instances) {
            *list = new KSI_ParamList{std::move(*instances)};
        }
        return status;
    });
}

KSI_ParamList* KSI_ParamListCreate(uint32_t initialCount, uint32_t /*growBy*/)
{
    KSI_ParamList* list = nullptr;
    guarded([&] {
        if (KSI_Status status = admit(KsiCall::ParamListCreate, nullptr); status != KSI_OK) {
            return status;
        }
        auto created = std::make_unique<KSI_ParamList>();
        created->items.reserve(initialCount);
        list = created.release();
        return KSI_OK;
    });
    return list;
}

void KSI_ParamListDestroy(KSI_ParamList* list)
{
    guarded([&] { return admit(KsiCall::ParamListDestroy, nullptr); });
    delete list;
}

uint32_t KSI_ParamListUsedCount(const KSI_ParamList* list)
{
    guarded([&] { return admit(KsiCall::ParamListUsedCount, nullptr); });
    return list != nullptr ? static_cast<uint32_t>(list->items.size()) : 0;
}

KSI_Status KSI_ParamListAddString(KSI_ParamList* list, const char* value)
{
    if (value == nullptr) {
        return KSI_ERR_BAD_PARAM;
    }
    return guarded([&] { return addParam(list, KsiCall::ParamListAddString, KSI_Param::ofString(value)); });
}

KSI_Status KSI_ParamListAddInt(KSI_ParamList* list, int64_t value)
{
    return guarded([&] { return addParam(list, KsiCall::ParamListAddInt, KSI_Param::ofInt(value)); });
}

KSI_Status KSI_ParamListRemoveLastParam(KSI_ParamList* list)
{
    if (list == nullptr || list->items.empty()) {
        return KSI_ERR_BAD_PARAM;
    }
    return guarded([&] {
        if (KSI_Status status = admit(KsiCall::ParamListRemoveLastParam, &list->items.back()); status != KSI_OK) {
            return status;
        }
        list->items.pop_back();
        return KSI_OK;
    });
}

const KSI_Param* KSI_ParamListGetParam(const KSI_ParamList* list, uint32_t index)
{
    const KSI_Param* param = slotAt(list, index);
    if (param == nullptr || param->kind == KSI_Param::Kind::Empty) {
        return nullptr;
    }
    KSI_Status status = guarded([&] { return admit(KsiCall::ParamListGetParam, param); });
    return status == KSI_OK ? param : nullptr;
}

KSI_Status KSI_ParamListGetInt32(const KSI_ParamList* list, uint32_t index, int32_t* value)
{
    const KSI_Param* param = slotAt(list, index);
    if (param == nullptr || value == nullptr || param->kind != KSI_Param::Kind::Int) {
        return KSI_ERR_BAD_PARAM;
    }
    return guarded([&] {
        if (KSI_Status status = admit(KsiCall::ParamListGetInt32, param); status != KSI_OK) {
            return status;
        }
        *value = static_cast<int32_t>(param->intValue);
        return KSI_OK;
    });
}

const char* KSI_ParamGetString(const KSI_Param* param)
{
    if (param == nullptr || param->kind != KSI_Param::Kind::String) {
        return nullptr;
    }
    KSI_Status status = guarded([&] { return admit(KsiCall::ParamGetString, param); });
    return status == KSI_OK ? param->text.c_str() : nullptr;
}

} // extern "C"
