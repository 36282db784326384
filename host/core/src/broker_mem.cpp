// The memory table (CMPIBrokerMemFT): marks over the calling thread's current
// arena, and raw blocks that belong to it like any broker object.
#include "broker_tables.hpp"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

#include "memory.hpp"

namespace orv::host::detail {

namespace {

// A raw block: the bookkeeping, then the caller's bytes, 16-byte aligned.
struct alignas(16) RawBlock : ObjectBase {
    std::size_t size = 0;
};

void destroyBlock(ObjectBase* base) noexcept {
    static_cast<RawBlock*>(base)->~RawBlock();
    std::free(base);
}
void dropNothing(ObjectBase* /*base*/) noexcept {}

RawBlock* blockOf(void* ptr) { return reinterpret_cast<RawBlock*>(static_cast<char*>(ptr) - sizeof(RawBlock)); }

void* allocate(std::size_t size) {
    void* memory = std::malloc(sizeof(RawBlock) + size);
    if (memory == nullptr) {
        return nullptr;
    }
    auto* block = new (memory) RawBlock();
    block->size = size;
    block->hdl = block + 1;
    block->destroy = destroyBlock;
    block->drop = dropNothing;
    placeObject(block, Owner::Arena, nullptr);
    return block + 1;
}

void freeBlock(void* ptr) {
    if (ptr == nullptr) {
        return;
    }
    RawBlock* block = blockOf(ptr);
    if (block->arena != nullptr) {
        block->arena->unlink(block);
    }
    block->destroy(block);
}

// A marker is an empty raw block: release frees everything adopted after it.
CMPIGcStat* mark(const CMPIBroker* /*mb*/, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_OK);
    return static_cast<CMPIGcStat*>(allocate(0));
}

CMPIStatus releaseMark(const CMPIBroker* /*mb*/, const CMPIGcStat* gc) {
    if (gc == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_PARAMETER, nullptr};
    }
    RawBlock* marker = blockOf(const_cast<void*>(gc));
    if (marker->arena != nullptr) {
        marker->arena->clearAfter(marker);
    }
    freeBlock(const_cast<void*>(gc));
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

void* cmpiMalloc(const CMPIBroker* /*mb*/, size_t size) { return allocate(size); }

void* cmpiCalloc(const CMPIBroker* /*mb*/, size_t count, size_t size) {
    if (size != 0 && count > SIZE_MAX / size) {
        return nullptr;
    }
    void* ptr = allocate(count * size);
    if (ptr != nullptr) {
        std::memset(ptr, 0, count * size);
    }
    return ptr;
}

void* cmpiRealloc(const CMPIBroker* /*mb*/, void* ptr, size_t size) {
    void* grown = allocate(size);
    if (grown != nullptr && ptr != nullptr) {
        std::memcpy(grown, ptr, std::min(size, blockOf(ptr)->size));
        freeBlock(ptr);
    }
    return grown;
}

char* cmpiStrDup(const CMPIBroker* /*mb*/, const char* text) {
    if (text == nullptr) {
        return nullptr;
    }
    std::size_t length = std::strlen(text) + 1;
    auto* copy = static_cast<char*>(allocate(length));
    if (copy != nullptr) {
        std::memcpy(copy, text, length);
    }
    return copy;
}

void cmpiFree(const CMPIBroker* /*mb*/, void* ptr) { freeBlock(ptr); }

// free<Type>: releases an object whatever its owner (a no-op for one a parent owns).
template <class Pub>
void freeObject(const CMPIBroker* /*mb*/, Pub* object) {
    if (object != nullptr && object->ft != nullptr) {
        object->ft->release(object);
    }
}

}  // namespace

const CMPIBrokerMemFT kBrokerMemFT = {
    CMPICurrentVersion,
    mark,
    releaseMark,
    cmpiMalloc,
    cmpiCalloc,
    cmpiRealloc,
    cmpiStrDup,
    cmpiFree,
    freeObject<CMPIInstance>,
    freeObject<CMPIObjectPath>,
    freeObject<CMPIArgs>,
    freeObject<CMPIString>,
    freeObject<CMPIArray>,
    freeObject<CMPIDateTime>,
    freeObject<CMPISelectExp>,
};

}  // namespace orv::host::detail
