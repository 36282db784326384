#include "error.hpp"

#include "array.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

ErrorImpl* impl(const CMPIError* error) { return implOf<ErrorImpl>(error, &kErrorFT); }

CMPIArray* copyArray(const CMPIArray* array) { return array != nullptr ? cloneArray(array, Owner::Parent) : nullptr; }

void freeArray(CMPIArray*& array) noexcept {
    if (array != nullptr) {
        ObjectBase* base = baseOf(array);
        base->destroy(base);
        array = nullptr;
    }
}

CMPIStatus release(CMPIError* error) { return releaseAny(error, &kErrorFT); }

CMPIError* clone(const CMPIError* error, CMPIStatus* rc) {
    CMPIError* copy = cloneError(error, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

template <std::string ErrorImpl::*Member>
CMPIString* getText(const CMPIError* error, CMPIStatus* rc) {
    ErrorImpl* e = impl(error);
    setRc(rc, e != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return e != nullptr ? newString(e->*Member, Owner::Arena) : nullptr;
}

template <std::string ErrorImpl::*Member>
CMPIStatus setText(CMPIError* error, const char* text) {
    ErrorImpl* e = impl(error);
    if (e == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    e->*Member = text != nullptr ? text : "";
    return okStatus();
}

template <class T, T ErrorImpl::*Member>
T getField(const CMPIError* error, CMPIStatus* rc) {
    ErrorImpl* e = impl(error);
    setRc(rc, e != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return e != nullptr ? e->*Member : T{};
}

template <class T, T ErrorImpl::*Member>
CMPIStatus setField(CMPIError* error, const T value) {
    ErrorImpl* e = impl(error);
    if (e == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    e->*Member = value;
    return okStatus();
}

template <CMPIArray* ErrorImpl::*Member>
CMPIArray* getArray(const CMPIError* error, CMPIStatus* rc) {
    ErrorImpl* e = impl(error);
    setRc(rc, e != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return e != nullptr ? e->*Member : nullptr;
}

template <CMPIArray* ErrorImpl::*Member>
CMPIStatus setArray(CMPIError* error, const CMPIArray* array) {
    ErrorImpl* e = impl(error);
    if (e == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    CMPIArray* copy = copyArray(array);
    if (array != nullptr && copy == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    freeArray(e->*Member);
    e->*Member = copy;
    return okStatus();
}

CMPIStatus setMessageArguments(CMPIError* error, CMPIArray* values) {
    return setArray<&ErrorImpl::messageArguments>(error, values);
}

}  // namespace

ErrorImpl::ErrorImpl(const ErrorImpl& other)
    : type(other.type), otherType(other.otherType), owningEntity(other.owningEntity), messageId(other.messageId),
      message(other.message), severity(other.severity), cause(other.cause), causeDescription(other.causeDescription),
      source(other.source), sourceFormat(other.sourceFormat), otherSourceFormat(other.otherSourceFormat),
      statusCode(other.statusCode), statusCodeDescription(other.statusCodeDescription),
      recommendedActions(copyArray(other.recommendedActions)), messageArguments(copyArray(other.messageArguments)) {}

ErrorImpl::~ErrorImpl() {
    freeArray(recommendedActions);
    freeArray(messageArguments);
}

const CMPIErrorFT kErrorFT = {
    1,
    release,
    clone,
    getField<CMPIErrorType, &ErrorImpl::type>,
    getText<&ErrorImpl::otherType>,
    getText<&ErrorImpl::owningEntity>,
    getText<&ErrorImpl::messageId>,
    getText<&ErrorImpl::message>,
    getField<CMPIErrorSeverity, &ErrorImpl::severity>,
    getField<CMPIErrorProbableCause, &ErrorImpl::cause>,
    getText<&ErrorImpl::causeDescription>,
    getArray<&ErrorImpl::recommendedActions>,
    getText<&ErrorImpl::source>,
    getField<CMPIErrorSrcFormat, &ErrorImpl::sourceFormat>,
    getText<&ErrorImpl::otherSourceFormat>,
    getField<CMPIrc, &ErrorImpl::statusCode>,
    getText<&ErrorImpl::statusCodeDescription>,
    getArray<&ErrorImpl::messageArguments>,
    setField<CMPIErrorType, &ErrorImpl::type>,
    setText<&ErrorImpl::otherType>,
    setText<&ErrorImpl::causeDescription>,
    setArray<&ErrorImpl::recommendedActions>,
    setText<&ErrorImpl::source>,
    setField<CMPIErrorSrcFormat, &ErrorImpl::sourceFormat>,
    setText<&ErrorImpl::otherSourceFormat>,
    setText<&ErrorImpl::statusCodeDescription>,
    setMessageArguments,
};

CMPIError* newError(ErrorImpl fields, Owner owner) {
    return makeObject<CMPIError, ErrorImpl>(&kErrorFT, owner, std::move(fields));
}

CMPIError* cloneError(const CMPIError* error, Owner owner) {
    ErrorImpl* e = impl(error);
    return e != nullptr ? makeObject<CMPIError, ErrorImpl>(&kErrorFT, owner, *e) : nullptr;
}

}  // namespace orv::host::detail
