#include "memory.hpp"

namespace orv::host::detail {

namespace {

// The thread's own arena is destroyed at thread exit, freeing what attached
// provider threads and scope-less clients left behind.
Arena& ownArena() noexcept {
    thread_local Arena arena;
    return arena;
}

thread_local Arena* tlsCurrent = nullptr;

}  // namespace

void Arena::adopt(ObjectBase* object) noexcept {
    object->arena = this;
    object->prev = nullptr;
    object->next = head_;
    if (head_ != nullptr) {
        head_->prev = object;
    }
    head_ = object;
    ++count_;
}

void Arena::unlink(ObjectBase* object) noexcept {
    if (object->prev != nullptr) {
        object->prev->next = object->next;
    } else {
        head_ = object->next;
    }
    if (object->next != nullptr) {
        object->next->prev = object->prev;
    }
    object->prev = object->next = nullptr;
    object->arena = nullptr;
    --count_;
}

void Arena::clear() noexcept { clearAfter(nullptr); }

void Arena::clearAfter(const ObjectBase* mark) noexcept {
    // Destroying an object may retire its children into the current arena,
    // which can be this one: take the head again after every destroy.
    while (head_ != nullptr && head_ != mark) {
        ObjectBase* object = head_;
        unlink(object);
        object->destroy(object);
    }
}

Arena& threadArena() noexcept { return ownArena(); }

Arena& currentArena() noexcept { return tlsCurrent != nullptr ? *tlsCurrent : ownArena(); }

ArenaGuard::ArenaGuard(Arena& arena) noexcept : previous_(tlsCurrent) { tlsCurrent = &arena; }

ArenaGuard::~ArenaGuard() { tlsCurrent = previous_; }

void placeObject(ObjectBase* object, Owner owner) noexcept {
    object->owner = owner;
    if (owner == Owner::Arena) {
        currentArena().adopt(object);
    }
}

bool releaseObject(ObjectBase* object) noexcept {
    if (object->released) {
        return false;
    }
    if (object->owner == Owner::Parent) {
        return true;
    }
    object->released = true;
    object->drop(object);
    object->hdl = nullptr;
    if (object->owner == Owner::Caller) {
        object->owner = Owner::Arena;
        currentArena().adopt(object);
    }
    return true;
}

}  // namespace orv::host::detail
