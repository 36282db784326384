#include "string.hpp"

#include <string>

namespace orv::host::detail {

namespace {

using StringObject = Object<std::string>;

CMPIStatus release(CMPIString* string) { return releaseAny(string, &kStringFT); }

CMPIString* clone(const CMPIString* string, CMPIStatus* rc) {
    const char* text = stringText(string);
    if (text == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newString(text, Owner::Caller);
}

char* getCharPtr(const CMPIString* string, CMPIStatus* rc) {
    const char* text = stringText(string);
    setRc(rc, text != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return const_cast<char*>(text);
}

}  // namespace

const CMPIStringFT kStringFT = {1, release, clone, getCharPtr};

CMPIString* newString(std::string_view text, Owner owner) {
    CMPIString* string = makeObject<CMPIString, std::string>(&kStringFT, owner, text);
    auto* object = static_cast<StringObject*>(baseOf(string));
    object->hdl = object->impl->data();
    return string;
}

const char* stringText(const CMPIString* string) noexcept {
    StringObject* object = objectOf<std::string>(string, &kStringFT);
    return object != nullptr ? object->impl->c_str() : nullptr;
}

}  // namespace orv::host::detail
