// Broker-owned memory.
//
// Every encapsulated object the broker hands out starts with the {hdl, ft}
// pair of its CMPI struct, followed by bookkeeping. An object is owned by
// exactly one of:
//  - an Arena (the invocation's, a reply's, an object scope's or the calling
//    thread's): freed when the arena is cleared;
//  - a parent object (a property value inside an instance, an element inside an
//    array): freed with the parent; release() on it does nothing;
//  - the provider (a clone): freed by release().
// release() drops the object's contents at once but keeps its 16-byte shell
// alive in the current arena, so that a second release is answered with an
// error status instead of touching freed memory.
#pragma once

#include <cstddef>
#include <cstdint>

namespace orv::host::detail {

class Arena;

enum class Owner : std::uint8_t { Arena, Parent, Caller };

struct ObjectBase {
    void* hdl = nullptr;       // mirrors the CMPI struct's hdl
    const void* ft = nullptr;  // mirrors the CMPI struct's ft
    ObjectBase* prev = nullptr;
    ObjectBase* next = nullptr;
    Arena* arena = nullptr;
    void (*destroy)(ObjectBase*) noexcept = nullptr;  // deletes the whole object
    void (*drop)(ObjectBase*) noexcept = nullptr;     // frees the contents only
    Owner owner = Owner::Caller;
    bool released = false;
};

// A list of objects freed together.
class Arena {
public:
    Arena() = default;
    ~Arena() { clear(); }
    Arena(const Arena&) = delete;
    Arena& operator=(const Arena&) = delete;

    void adopt(ObjectBase* object) noexcept;
    void unlink(ObjectBase* object) noexcept;
    // Frees every object, newest first.
    void clear() noexcept;
    // Frees the objects adopted after `mark` (a value from top()).
    void clearAfter(const ObjectBase* mark) noexcept;
    const ObjectBase* top() const noexcept { return head_; }
    std::size_t size() const noexcept { return count_; }

private:
    ObjectBase* head_ = nullptr;  // newest
    std::size_t count_ = 0;
};

// The arena new broker objects of the calling thread go to: the innermost open
// invocation or scope, else the thread's own arena.
Arena& currentArena() noexcept;
// The calling thread's own arena (attached provider threads, clients without a scope).
Arena& threadArena() noexcept;

// Makes `arena` current for the calling thread while alive.
class ArenaGuard {
public:
    explicit ArenaGuard(Arena& arena) noexcept;
    ~ArenaGuard();
    ArenaGuard(const ArenaGuard&) = delete;
    ArenaGuard& operator=(const ArenaGuard&) = delete;

private:
    Arena* previous_;
};

// Places a new object under `owner`: Arena -> the current arena.
void placeObject(ObjectBase* object, Owner owner) noexcept;

// The generic release: Caller objects drop their contents and leave the shell
// to the current arena; Arena objects drop their contents; Parent objects are
// left alone. Answers false for an object released before.
bool releaseObject(ObjectBase* object) noexcept;

}  // namespace orv::host::detail
