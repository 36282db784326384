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
//
// Where the memory comes from is a separate matter (ObjectBase::home): objects
// an arena owns, and everything inside them, are carved from that arena's pool,
// which gives them back all at once when the arena is cleared; caller-owned
// objects and their contents come from the heap and are freed one by one. So a
// request that builds thousands of values costs a few pool chunks, not a
// malloc and a free per value.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>

namespace orv::host::detail {

class Arena;

enum class Owner : std::uint8_t { Arena, Parent, Caller };

struct ObjectBase {
    void* hdl = nullptr;       // mirrors the CMPI struct's hdl
    const void* ft = nullptr;  // mirrors the CMPI struct's ft
    ObjectBase* prev = nullptr;
    ObjectBase* next = nullptr;
    Arena* arena = nullptr;  // the arena whose list holds the object, if any
    Arena* home = nullptr;   // the arena whose pool holds its memory; nullptr: the heap
    void (*destroy)(ObjectBase*) noexcept = nullptr;  // deletes the whole object
    void (*drop)(ObjectBase*) noexcept = nullptr;     // frees the contents only
    Owner owner = Owner::Caller;
    bool released = false;
};

// Bump allocation from chunks that are given back all at once. Chunks of the
// usual size are kept per thread for the next pool, so that a request's pool
// costs no malloc once the thread has served one before.
class Pool {
public:
    struct Chunk;

    Pool() = default;
    ~Pool() { release(); }
    Pool(const Pool&) = delete;
    Pool& operator=(const Pool&) = delete;

    // 16-byte aligned memory valid until release().
    void* allocate(std::size_t size) {
        size = (size + 15) & ~static_cast<std::size_t>(15);
        if (static_cast<std::size_t>(end_ - cursor_) < size) {
            return grow(size);
        }
        void* memory = cursor_;
        cursor_ += size;
        return memory;
    }
    // Gives back every chunk.
    void release() noexcept;

private:
    void* grow(std::size_t size);

    char* cursor_ = nullptr;
    char* end_ = nullptr;
    Chunk* chunks_ = nullptr;
};

extern constinit thread_local Arena* tlsCurrentArena;
extern constinit thread_local Arena* tlsMemberHome;
extern constinit thread_local char tlsThreadTag;

// A list of objects freed together, and the pool their memory comes from.
class Arena {
public:
    Arena() noexcept : thread_(&tlsThreadTag) {}
    ~Arena() { clear(); }
    Arena(const Arena&) = delete;
    Arena& operator=(const Arena&) = delete;

    void adopt(ObjectBase* object) noexcept {
        object->arena = this;
        object->prev = nullptr;
        object->next = head_;
        if (head_ != nullptr) {
            head_->prev = object;
        }
        head_ = object;
        ++count_;
    }
    void unlink(ObjectBase* object) noexcept {
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
    // Frees every object, newest first, then gives the pool back.
    void clear() noexcept;
    // Frees the objects adopted after `mark` (a value from top()). Their pool
    // memory stays until clear(): objects made before the mark may hold values
    // carved from the pool after it.
    void clearAfter(const ObjectBase* mark) noexcept;
    void* allocate(std::size_t size) { return pool_.allocate(size); }
    // Whether the calling thread made the arena (the thread that serves what it holds).
    bool madeOnThisThread() const noexcept { return thread_ == &tlsThreadTag; }
    const ObjectBase* top() const noexcept { return head_; }
    std::size_t size() const noexcept { return count_; }

private:
    ObjectBase* head_ = nullptr;  // newest
    std::size_t count_ = 0;
    Pool pool_;
    const char* thread_;
};


// The arena new broker objects of the calling thread go to: the innermost open
// invocation or scope, else the thread's own arena.
inline Arena& currentArena() noexcept;
// The calling thread's own arena (attached provider threads, clients without a scope).
Arena& threadArena() noexcept;

inline Arena& currentArena() noexcept { return tlsCurrentArena != nullptr ? *tlsCurrentArena : threadArena(); }

inline Arena* homeFor(Owner owner) noexcept {
    switch (owner) {
    case Owner::Arena: return &currentArena();
    case Owner::Parent: return tlsMemberHome;
    default: return nullptr;
    }
}

// Makes `arena` current for the calling thread while alive.
class ArenaGuard {
public:
    explicit ArenaGuard(Arena& arena) noexcept : previous_(tlsCurrentArena) { tlsCurrentArena = &arena; }
    ~ArenaGuard() { tlsCurrentArena = previous_; }
    ArenaGuard(const ArenaGuard&) = delete;
    ArenaGuard& operator=(const ArenaGuard&) = delete;

private:
    Arena* previous_;
};

// The arena whose pool new objects placed under `owner` are carved from:
// Arena -> the current arena, Parent -> the parent's home (memberHome()),
// Caller -> none (the heap).
inline Arena* homeFor(Owner owner) noexcept;
// Memory for an object of `size` bytes from `home`'s pool, or the heap.
inline void* allocateObject(Arena* home, std::size_t size) {
    return home != nullptr ? home->allocate(size) : ::operator new(size);
}
// Gives back the memory of an object whose destructor has run (heap only: pool
// memory goes back with its arena).
inline void freeObjectMemory(void* memory, Arena* home) noexcept {
    if (home == nullptr) {
        ::operator delete(memory);
    }
}

// The home of the values a parent object being built or changed holds: new
// Parent-owned objects are carved from it. MemberHome makes it current.
inline Arena* memberHome() noexcept { return tlsMemberHome; }
class MemberHome {
public:
    explicit MemberHome(Arena* home) noexcept : previous_(tlsMemberHome) { tlsMemberHome = home; }
    ~MemberHome() { tlsMemberHome = previous_; }
    MemberHome(const MemberHome&) = delete;
    MemberHome& operator=(const MemberHome&) = delete;

private:
    Arena* previous_;
};

// Places a new object under `owner`: Arena -> the current arena. `home` is
// where its memory came from (homeFor(owner) when it was allocated).
inline void placeObject(ObjectBase* object, Owner owner, Arena* home) noexcept {
    object->owner = owner;
    object->home = home;
    if (owner == Owner::Arena) {
        currentArena().adopt(object);
    }
}

// The generic release: Caller objects drop their contents and leave the shell
// to the current arena; Arena objects drop their contents; Parent objects are
// left alone. Answers false for an object released before.
bool releaseObject(ObjectBase* object) noexcept;

}  // namespace orv::host::detail
