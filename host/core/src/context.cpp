#include "context.hpp"

namespace orv::host::detail {

namespace {

const void* tableOf() { return &kContextFT.std; }

CMPIStatus release(CMPIContext* context) { return releaseAny(context, tableOf()); }

// Contexts are not copied by clone (as in sfcb): prepareAttachThread makes the
// copy a provider thread may keep.
CMPIContext* clone(const CMPIContext* /*context*/, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

CMPIData getEntry(const CMPIContext* context, const char* name, CMPIStatus* rc) {
    ValueList* entries = contextImpl(context);
    if (entries == nullptr || name == nullptr) {
        setRc(rc, entries == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullData();
    }
    return entries->get(name, rc, CMPI_nullValue);
}

CMPIData getEntryAt(const CMPIContext* context, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    ValueList* entries = contextImpl(context);
    if (entries == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    return entries->at(index, name, rc, CMPI_nullValue);
}

CMPICount getEntryCount(const CMPIContext* context, CMPIStatus* rc) {
    ValueList* entries = contextImpl(context);
    setRc(rc, entries != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return entries != nullptr ? static_cast<CMPICount>(entries->size()) : 0;
}

CMPIStatus addEntry(const CMPIContext* context, const char* name, const CMPIValue* value, CMPIType type) {
    ValueList* entries = contextImpl(context);
    if (entries == nullptr || name == nullptr) {
        return CMPIStatus{entries == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER, nullptr};
    }
    return CMPIStatus{entries->set(name, value, type), nullptr};
}

CMPIStatus releaseThreadMemory(const CMPIContext* context) {
    if (contextImpl(context) == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    currentArena().clear();
    return okStatus();
}

}  // namespace

const CMPIContextFTExt kContextFT = {
    {1, release, clone, getEntry, getEntryAt, getEntryCount, addEntry},
    releaseThreadMemory,
};

CMPIContext* newContext(Owner owner) {
    CMPIContext* context = makeObject<CMPIContext, ValueList>(&kContextFT.std, owner);
    CMPIUint32 extensions = 1;
    contextImpl(context)->set(CMPI_ORV_HostExtensions, reinterpret_cast<const CMPIValue*>(&extensions), CMPI_uint32);
    return context;
}

ValueList* contextImpl(const CMPIContext* context) noexcept {
    return implOf<ValueList>(context, &kContextFT.std);
}

CMPIContext* copyContext(const CMPIContext* context) {
    ValueList* entries = contextImpl(context);
    return entries != nullptr ? makeObject<CMPIContext, ValueList>(&kContextFT.std, Owner::Caller, *entries) : nullptr;
}


}  // namespace orv::host::detail
