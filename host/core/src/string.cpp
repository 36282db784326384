#include "string.hpp"

#include <cstring>
#include <new>

namespace orv::host::detail {

namespace {

// A string is one allocation: the object, then its NUL-terminated characters. The
// characters cannot be freed apart from the shell, so a released string keeps them until
// its arena is cleared, like the shell of any released object.
struct StringObject : ObjectBase {
    std::size_t length = 0;
    char* text() noexcept { return reinterpret_cast<char*>(this + 1); }

    static void destroyFn(ObjectBase* base) noexcept {
        auto* object = static_cast<StringObject*>(base);
        Arena* home = object->home;
        object->~StringObject();
        freeObjectMemory(object, home);
    }
    static void dropFn(ObjectBase* /*base*/) noexcept {}
};

StringObject* stringObject(const CMPIString* string) noexcept {
    if (string == nullptr || string->ft != &kStringFT || string->hdl == nullptr) {
        return nullptr;
    }
    return static_cast<StringObject*>(baseOf(string));
}

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
    Arena* home = homeFor(owner);
    void* memory = allocateObject(home, sizeof(StringObject) + text.size() + 1);
    auto* object = new (memory) StringObject();
    char* chars = object->text();
    if (!text.empty()) {
        std::memcpy(chars, text.data(), text.size());
    }
    chars[text.size()] = '\0';
    object->length = text.size();
    object->hdl = chars;
    object->ft = &kStringFT;
    object->destroy = &StringObject::destroyFn;
    object->drop = &StringObject::dropFn;
    placeObject(object, owner, home);
    return reinterpret_cast<CMPIString*>(static_cast<ObjectBase*>(object));
}

// A string a parent owns is never released or changed, and its pool memory
// lasts as long as the pool: another value of the same pool may refer to it.
// A string the current arena owns and whose memory is in the same pool becomes
// such a string instead of being copied: releasing it afterwards does nothing,
// and its text stays as long as the pool, as a copy's would.
CMPIString* memberString(const CMPIString* string) {
    StringObject* object = stringObject(string);
    if (object == nullptr) {
        return nullptr;
    }
    Arena* home = memberHome();
    if (home != nullptr && object->home == home) {
        if (object->owner == Owner::Arena && object->arena == home && tlsCurrentArena == home) {
            home->unlink(object);
            object->owner = Owner::Parent;
        }
        if (object->owner == Owner::Parent) {
            return const_cast<CMPIString*>(string);
        }
    }
    return newString(std::string_view(object->text(), object->length), Owner::Parent);
}

const char* stringText(const CMPIString* string) noexcept {
    StringObject* object = stringObject(string);
    return object != nullptr ? object->text() : nullptr;
}

}  // namespace orv::host::detail
