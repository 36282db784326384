#include "memory.hpp"

#include <cstdlib>
#include <new>

namespace orv::host::detail {

constinit thread_local Arena* tlsCurrentArena = nullptr;
constinit thread_local Arena* tlsMemberHome = nullptr;
constinit thread_local char tlsThreadTag = 0;

struct Pool::Chunk {
    Chunk* next;
    std::size_t size;  // usable bytes after the header
};

namespace {

constexpr std::size_t kChunkHeader = (sizeof(Pool::Chunk*) + sizeof(std::size_t) + 15) & ~std::size_t{15};
constexpr std::size_t kChunkSize = 16 * 1024 - kChunkHeader;  // usable bytes of a usual chunk
constexpr std::size_t kCachedChunks = 16;

char* chunkData(void* chunk) noexcept { return static_cast<char*>(chunk) + kChunkHeader; }

// Usual-size chunks given back on this thread, for the next pool.
struct ChunkCache {
    Pool::Chunk* head = nullptr;
    std::size_t count = 0;
    ~ChunkCache();
};

thread_local bool tlsCacheGone = false;

ChunkCache::~ChunkCache() {
    tlsCacheGone = true;
    while (head != nullptr) {
        Pool::Chunk* next = head->next;
        std::free(head);
        head = next;
    }
}

ChunkCache& chunkCache() noexcept {
    thread_local ChunkCache cache;
    return cache;
}

}  // namespace

void* Pool::grow(std::size_t size) {
    Chunk* chunk = nullptr;
    const bool usual = size <= kChunkSize;
    if (usual && !tlsCacheGone && chunkCache().head != nullptr) {
        ChunkCache& cache = chunkCache();
        chunk = cache.head;
        cache.head = chunk->next;
        --cache.count;
    } else {
        const std::size_t usable = usual ? kChunkSize : size;
        chunk = static_cast<Chunk*>(std::malloc(kChunkHeader + usable));
        if (chunk == nullptr) {
            throw std::bad_alloc();
        }
        chunk->size = usable;
    }
    chunk->next = chunks_;
    chunks_ = chunk;
    char* data = chunkData(chunk);
    if (usual) {  // the rest of a usual chunk serves what follows
        cursor_ = data + size;
        end_ = data + chunk->size;
    }
    return data;
}

void Pool::release() noexcept {
    while (chunks_ != nullptr) {
        Chunk* next = chunks_->next;
        if (chunks_->size == kChunkSize && !tlsCacheGone && chunkCache().count < kCachedChunks) {
            ChunkCache& cache = chunkCache();
            chunks_->next = cache.head;
            cache.head = chunks_;
            ++cache.count;
        } else {
            std::free(chunks_);
        }
        chunks_ = next;
    }
    cursor_ = end_ = nullptr;
}

namespace {

// The thread's own arena is destroyed at thread exit, freeing what attached
// provider threads and scope-less clients left behind.
Arena& ownArena() noexcept {
    thread_local Arena arena;
    return arena;
}


}  // namespace

void Arena::clear() noexcept {
    clearAfter(nullptr);
    pool_.release();
}

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
