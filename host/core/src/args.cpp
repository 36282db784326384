#include "args.hpp"

namespace orv::host::detail {

namespace {

CMPIStatus release(CMPIArgs* args) { return releaseAny(args, &kArgsFT); }

CMPIArgs* clone(const CMPIArgs* args, CMPIStatus* rc) {
    CMPIArgs* copy = cloneArgs(args, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPIStatus addArg(const CMPIArgs* args, const char* name, const CMPIValue* value, CMPIType type) {
    ValueList* list = argsImpl(args);
    if (list == nullptr || name == nullptr) {
        return CMPIStatus{list == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER, nullptr};
    }
    return CMPIStatus{list->set(name, value, type), nullptr};
}

CMPIData getArg(const CMPIArgs* args, const char* name, CMPIStatus* rc) {
    ValueList* list = argsImpl(args);
    if (list == nullptr || name == nullptr) {
        setRc(rc, list == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullData();
    }
    return list->get(name, rc, CMPI_notFound);
}

CMPIData getArgAt(const CMPIArgs* args, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    ValueList* list = argsImpl(args);
    if (list == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    return list->at(index, name, rc, CMPI_notFound);
}

CMPICount getArgCount(const CMPIArgs* args, CMPIStatus* rc) {
    ValueList* list = argsImpl(args);
    setRc(rc, list != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return list != nullptr ? static_cast<CMPICount>(list->size()) : 0;
}

}  // namespace

const CMPIArgsFT kArgsFT = {1, release, clone, addArg, getArg, getArgAt, getArgCount};

CMPIArgs* newArgs(Owner owner) { return makeObject<CMPIArgs, ValueList>(&kArgsFT, owner); }

ValueList* argsImpl(const CMPIArgs* args) noexcept { return implOf<ValueList>(args, &kArgsFT); }

CMPIArgs* cloneArgs(const CMPIArgs* args, Owner owner) {
    ValueList* list = argsImpl(args);
    return list != nullptr ? makeObject<CMPIArgs, ValueList>(&kArgsFT, owner, *list) : nullptr;
}

}  // namespace orv::host::detail
