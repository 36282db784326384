#include "enumeration.hpp"

#include "array.hpp"
#include "value.hpp"

namespace orv::host::detail {

EnumerationImpl::EnumerationImpl(const EnumerationImpl& other) : items(other.items.size()), cursor(other.cursor) {
    for (std::size_t i = 0; i < items.size(); ++i) {
        copyValue(items[i], other.items[i]);
    }
}

EnumerationImpl::~EnumerationImpl() {
    for (CMPIData& item : items) {
        freeValue(item);
    }
}

namespace {

EnumerationImpl* impl(const CMPIEnumeration* enumeration) { return enumerationImpl(enumeration); }

CMPIStatus release(CMPIEnumeration* enumeration) { return releaseAny(enumeration, &kEnumerationFT); }

CMPIEnumeration* clone(const CMPIEnumeration* enumeration, CMPIStatus* rc) {
    CMPIEnumeration* copy = cloneEnumeration(enumeration, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPIData getNext(const CMPIEnumeration* enumeration, CMPIStatus* rc) {
    EnumerationImpl* e = impl(enumeration);
    if (e == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    if (e->cursor >= e->items.size()) {
        setRc(rc, CMPI_RC_ERR_NOT_FOUND);
        return nullData();
    }
    setRc(rc, CMPI_RC_OK);
    return e->items[e->cursor++];
}

CMPIBoolean hasNext(const CMPIEnumeration* enumeration, CMPIStatus* rc) {
    EnumerationImpl* e = impl(enumeration);
    setRc(rc, e != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return static_cast<CMPIBoolean>(e != nullptr && e->cursor < e->items.size());
}

// All items, whatever has been read already, in an array of the first item's type.
CMPIArray* toArray(const CMPIEnumeration* enumeration, CMPIStatus* rc) {
    EnumerationImpl* e = impl(enumeration);
    if (e == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    CMPIType type = e->items.empty() ? CMPI_instance : e->items.front().type;
    CMPIArray* array = newArray(static_cast<CMPICount>(e->items.size()), type, Owner::Arena);
    ArrayImpl* a = arrayImpl(array);
    MemberHome members(a->home);
    for (std::size_t i = 0; i < e->items.size(); ++i) {
        freeValue(a->elements[i]);
        copyValue(a->elements[i], e->items[i]);
    }
    setRc(rc, CMPI_RC_OK);
    return array;
}

}  // namespace

const CMPIEnumerationFT kEnumerationFT = {1, release, clone, getNext, hasNext, toArray};

CMPIEnumeration* newEnumeration(Owner owner) {
    return makeObject<CMPIEnumeration, EnumerationImpl>(&kEnumerationFT, owner);
}

EnumerationImpl* enumerationImpl(const CMPIEnumeration* enumeration) noexcept {
    return implOf<EnumerationImpl>(enumeration, &kEnumerationFT);
}

CMPIEnumeration* cloneEnumeration(const CMPIEnumeration* enumeration, Owner owner) {
    EnumerationImpl* e = enumerationImpl(enumeration);
    return e != nullptr ? makeObject<CMPIEnumeration, EnumerationImpl>(&kEnumerationFT, owner, *e) : nullptr;
}

}  // namespace orv::host::detail
