#include "enumeration_registry.hpp"

#include <sys/random.h>

#include <array>
#include <cstdio>
#include <vector>

#include "orv/cimxml/cim_status.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;
using Clock = std::chrono::steady_clock;

EnumerationRegistry::EnumerationRegistry(EnumerationLimits limits)
    : limits_(limits), reaper_([this] { reap(); }) {}

EnumerationRegistry::~EnumerationRegistry() { shutdown(); }

std::string EnumerationRegistry::newId() const {
    std::array<unsigned char, 16> bytes{};
    std::size_t filled = 0;
    while (filled < bytes.size()) {
        const ssize_t got = ::getrandom(bytes.data() + filled, bytes.size() - filled, 0);
        if (got < 0) {
            throw CimError(CimStatus::Failed, "no random bytes for an enumeration context");
        }
        filled += static_cast<std::size_t>(got);
    }
    std::string id;
    for (unsigned char byte : bytes) {
        char hex[3];
        std::snprintf(hex, sizeof hex, "%02x", byte);
        id += hex;
    }
    return id;
}

std::shared_ptr<EnumerationContext> EnumerationRegistry::open(const std::string& owner, const std::string& nameSpace,
                                                              PullKind kind, std::chrono::seconds timeout) {
    std::string id = newId();
    std::lock_guard<std::mutex> lock(mutex_);
    if (stopping_) {
        throw CimError(CimStatus::ServerIsShuttingDown, "the server is shutting down");
    }
    std::size_t owned = 0;
    for (const auto& entry : contexts_) {
        owned += entry.second->owner() == owner ? 1 : 0;
    }
    if (owned >= limits_.perClient) {
        throw CimError(CimStatus::ServerLimitsExceeded,
                       "this client has " + std::to_string(owned) +
                           " open enumerations, the most it may have; close one (CloseEnumeration) or let it expire");
    }
    auto context =
        std::make_shared<EnumerationContext>(id, owner, nameSpace, kind, timeout, limits_.queueCapacity);
    context->busy = true;
    contexts_.emplace(std::move(id), context);
    return context;
}

namespace {

template <class Map>
typename Map::iterator findOwned(Map& contexts, const std::string& id, const std::string& owner,
                                 const std::string& nameSpace) {
    const auto it = contexts.find(id);
    if (it == contexts.end() || it->second->owner() != owner || it->second->nameSpace() != nameSpace) {
        throw CimError(CimStatus::InvalidEnumerationContext,
                       "no open enumeration of this client and namespace has this context (unknown, closed, "
                       "ended or expired)");
    }
    return it;
}

}  // namespace

std::shared_ptr<EnumerationContext> EnumerationRegistry::acquire(const std::string& id, const std::string& owner,
                                                                 const std::string& nameSpace) {
    std::lock_guard<std::mutex> lock(mutex_);
    const auto it = findOwned(contexts_, id, owner, nameSpace);
    if (it->second->busy) {
        throw CimError(CimStatus::InvalidEnumerationContext, "another operation uses this enumeration context now");
    }
    it->second->busy = true;
    return it->second;
}

void EnumerationRegistry::release(const std::shared_ptr<EnumerationContext>& context, bool remove) {
    std::shared_ptr<EnumerationContext> removed;
    {
        std::lock_guard<std::mutex> lock(mutex_);
        context->busy = false;
        context->expires = Clock::now() + context->timeout();
        const auto it = contexts_.find(context->id());
        if (remove && it != contexts_.end()) {
            removed = std::move(it->second);
            contexts_.erase(it);
        }
    }
    if (removed) {
        removed->close();
    }
}

void EnumerationRegistry::close(const std::string& id, const std::string& owner, const std::string& nameSpace) {
    std::shared_ptr<EnumerationContext> removed;
    {
        std::lock_guard<std::mutex> lock(mutex_);
        const auto it = findOwned(contexts_, id, owner, nameSpace);
        removed = std::move(it->second);
        contexts_.erase(it);
    }
    removed->close();
}

std::size_t EnumerationRegistry::openCount() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return contexts_.size();
}

void EnumerationRegistry::reap() {
    std::unique_lock<std::mutex> lock(mutex_);
    while (!stopping_) {
        wake_.wait_for(lock, std::chrono::seconds(1));
        std::vector<std::shared_ptr<EnumerationContext>> expired;
        const auto now = Clock::now();
        for (auto it = contexts_.begin(); it != contexts_.end();) {
            if (!it->second->busy && it->second->expires <= now) {
                expired.push_back(std::move(it->second));
                it = contexts_.erase(it);
            } else {
                ++it;
            }
        }
        lock.unlock();
        // Closing makes the producers stop; the last reference joins them here,
        // outside the lock, unless an operation still holds one.
        for (auto& context : expired) {
            context->close();
        }
        expired.clear();
        lock.lock();
    }
}

void EnumerationRegistry::shutdown() {
    std::map<std::string, std::shared_ptr<EnumerationContext>> all;
    {
        std::lock_guard<std::mutex> lock(mutex_);
        stopping_ = true;
        all.swap(contexts_);
        wake_.notify_all();
    }
    for (auto& entry : all) {
        entry.second->close();
    }
    all.clear();
    if (reaper_.joinable()) {
        reaper_.join();
    }
}

}  // namespace orv::cimhost::detail
