// The shape shared by every encapsulated type: an ObjectBase followed by the
// type's contents, with helpers to create, check and convert.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <new>
#include <optional>
#include <utility>

#include "memory.hpp"

namespace orv::host::detail {

template <class Impl>
struct Object : ObjectBase {
    std::optional<Impl> impl;

    static void destroyFn(ObjectBase* base) noexcept {
        auto* object = static_cast<Object*>(base);
        Arena* home = object->home;
        object->~Object();
        freeObjectMemory(object, home);
    }
    static void dropFn(ObjectBase* base) noexcept { static_cast<Object*>(base)->impl.reset(); }
};

// Creates an object of type Pub (a CMPI struct) whose function table is `ft`;
// hdl points at the contents unless the caller resets it. The contents are
// built with the object's home as the home of the values they copy.
template <class Pub, class Impl, class FT, class... Args>
Pub* makeObject(const FT* ft, Owner owner, Args&&... args) {
    Arena* home = homeFor(owner);
    auto* object = new (allocateObject(home, sizeof(Object<Impl>))) Object<Impl>();
    object->home = home;
    {
        MemberHome members(home);
        object->impl.emplace(std::forward<Args>(args)...);
    }
    object->hdl = &*object->impl;
    object->ft = ft;
    object->destroy = &Object<Impl>::destroyFn;
    object->drop = &Object<Impl>::dropFn;
    placeObject(object, owner, home);
    return reinterpret_cast<Pub*>(static_cast<ObjectBase*>(object));
}

inline ObjectBase* baseOf(const void* pub) noexcept {
    return static_cast<ObjectBase*>(const_cast<void*>(pub));
}

// The object behind `pub` when it is one of ours of this type and not released.
template <class Impl, class Pub, class FT>
Object<Impl>* objectOf(const Pub* pub, const FT* ft) noexcept {
    if (pub == nullptr || pub->ft != ft || pub->hdl == nullptr) {
        return nullptr;
    }
    return static_cast<Object<Impl>*>(baseOf(pub));
}

template <class Impl, class Pub, class FT>
Impl* implOf(const Pub* pub, const FT* ft) noexcept {
    Object<Impl>* object = objectOf<Impl>(pub, ft);
    return object != nullptr ? &*object->impl : nullptr;
}

// Status helpers. The message string belongs to the current arena.
inline CMPIStatus okStatus() noexcept { return CMPIStatus{CMPI_RC_OK, nullptr}; }
CMPIStatus makeStatus(CMPIrc rc, const char* message = nullptr);
inline void setRc(CMPIStatus* rc, CMPIrc code) noexcept {
    if (rc != nullptr) {
        rc->rc = code;
        rc->msg = nullptr;
    }
}
inline void setRc(CMPIStatus* rc, CMPIStatus status) noexcept {
    if (rc != nullptr) {
        *rc = status;
    }
}
// A CMPIData that says "nothing here" with the given state.
CMPIData nullData(CMPIValueState state = CMPI_nullValue) noexcept;

// Release for any of our objects: OK, or CMPI_RC_ERR_INVALID_HANDLE for a
// foreign or already released object.
CMPIStatus releaseAny(const void* pub, const void* ft) noexcept;

// Frees a caller-owned object the core made for an MI call (its context,
// result), unless the provider released it already.
void disposeObject(const void* pub) noexcept;

}  // namespace orv::host::detail
