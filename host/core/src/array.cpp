#include "array.hpp"

#include <cstring>

#include "value.hpp"

namespace orv::host::detail {

void ArrayImpl::allocate(CMPICount count) {
    home = memberHome();
    size = count;
    if (count != 0) {
        elements = static_cast<CMPIData*>(allocateObject(home, sizeof(CMPIData) * count));
    }
}

ArrayImpl::ArrayImpl(CMPICount count, CMPIType type)
    : elementType(storedType(static_cast<CMPIType>(type & ~CMPI_ARRAY))) {
    allocate(count);
    for (CMPICount i = 0; i < size; ++i) {
        elements[i] = CMPIData{};
        elements[i].type = elementType;
        elements[i].state = CMPI_nullValue;
    }
}

ArrayImpl::ArrayImpl(const ArrayImpl& other) : elementType(other.elementType) {
    allocate(other.size);
    // Plain values, and the strings of an array of the same pool (which that pool's
    // values share), are copied in one move.
    if (!ownsMember(elementType) || (elementType == CMPI_string && home != nullptr && home == other.home)) {
        if (size != 0) {
            std::memcpy(elements, other.elements, sizeof(CMPIData) * size);
        }
        return;
    }
    for (CMPICount i = 0; i < size; ++i) {
        copyValue(elements[i], other.elements[i]);
    }
}

ArrayImpl::~ArrayImpl() {
    // In a pool, strings and scalars have nothing to free.
    const bool nothingToFree = home != nullptr && (elementType == CMPI_string || !ownsMember(elementType));
    for (CMPICount i = 0; !nothingToFree && i < size; ++i) {
        freeValue(elements[i]);
    }
    if (elements != nullptr) {
        freeObjectMemory(elements, home);
    }
}

namespace {

CMPIStatus release(CMPIArray* array) { return releaseAny(array, &kArrayFT); }

CMPIArray* clone(const CMPIArray* array, CMPIStatus* rc) {
    CMPIArray* copy = cloneArray(array, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPICount getSize(const CMPIArray* array, CMPIStatus* rc) {
    ArrayImpl* impl = arrayImpl(array);
    setRc(rc, impl != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return impl != nullptr ? impl->size : 0;
}

CMPIType getSimpleType(const CMPIArray* array, CMPIStatus* rc) {
    ArrayImpl* impl = arrayImpl(array);
    setRc(rc, impl != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return impl != nullptr ? impl->elementType : CMPI_null;
}

CMPIData getElementAt(const CMPIArray* array, CMPICount index, CMPIStatus* rc) {
    ArrayImpl* impl = arrayImpl(array);
    if (impl == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    if (index >= impl->size) {
        setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
        return nullData(CMPI_badValue);
    }
    setRc(rc, CMPI_RC_OK);
    return impl->elements[index];
}

CMPIStatus setElementAt(CMPIArray* array, CMPICount index, const CMPIValue* value, CMPIType type) {
    ArrayImpl* impl = arrayImpl(array);
    if (impl == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (index >= impl->size) {
        return CMPIStatus{CMPI_RC_ERR_NO_SUCH_PROPERTY, nullptr};
    }
    if (storedType(type) != impl->elementType) {
        return CMPIStatus{CMPI_RC_ERR_TYPE_MISMATCH, nullptr};
    }
    CMPIData stored{};
    MemberHome members(impl->home);
    if (CMPIrc rc = storeValue(stored, value, type); rc != CMPI_RC_OK) {
        return CMPIStatus{rc, nullptr};
    }
    if (CMPIData& old = impl->elements[index]; old.state == CMPI_goodValue && ownsMember(old.type)) {
        retireValue(old);  // a null element (the usual one) has nothing to retire
    }
    impl->elements[index] = stored;
    return okStatus();
}

}  // namespace

const CMPIArrayFT kArrayFT = {1, release, clone, getSize, getSimpleType, getElementAt, setElementAt};

CMPIArray* newArray(CMPICount size, CMPIType elementType, Owner owner) {
    return makeObject<CMPIArray, ArrayImpl>(&kArrayFT, owner, size, elementType);
}

ArrayImpl* arrayImpl(const CMPIArray* array) noexcept { return implOf<ArrayImpl>(array, &kArrayFT); }

CMPIArray* cloneArray(const CMPIArray* array, Owner owner) {
    ArrayImpl* impl = arrayImpl(array);
    return impl != nullptr ? makeObject<CMPIArray, ArrayImpl>(&kArrayFT, owner, *impl) : nullptr;
}

CMPIType arrayElementType(const CMPIArray* array) noexcept {
    ArrayImpl* impl = arrayImpl(array);
    return impl != nullptr ? impl->elementType : CMPI_null;
}

}  // namespace orv::host::detail
