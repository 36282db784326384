// The open enumerations of the pull operations, by their EnumerationContext value.
//
// Values are 128 random bits (getrandom) in hex, so a client cannot guess another
// client's enumeration; a context is found only with the owner (the authenticated
// user, "" without authentication) and namespace that opened it. Each owner may
// hold `perClient` open enumerations. A context's timer runs while no operation
// uses it; one second after it passes, a reaper thread closes the context and
// frees it (its producer joined) even if no request ever names it again.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

#include "enumeration_context.hpp"

namespace orv::cimhost::detail {

struct EnumerationLimits {
    std::size_t perClient = 32;            // open enumerations of one owner
    std::size_t queueCapacity = 64;        // encoded objects waiting in one enumeration
    std::uint32_t maxObjectCount = 1000;   // objects in one response, whatever the client asks
    std::chrono::seconds defaultTimeout{60};
    std::chrono::seconds maxTimeout{600};
};

class EnumerationRegistry {
public:
    explicit EnumerationRegistry(EnumerationLimits limits = {});
    // shutdown()
    ~EnumerationRegistry();
    EnumerationRegistry(const EnumerationRegistry&) = delete;
    EnumerationRegistry& operator=(const EnumerationRegistry&) = delete;

    const EnumerationLimits& limits() const noexcept { return limits_; }

    // A new context, in use by the calling operation until release(). Throws
    // CimError: CIM_ERR_SERVER_LIMITS_EXCEEDED when the owner has `perClient`
    // open, CIM_ERR_SERVER_IS_SHUTTING_DOWN after shutdown().
    std::shared_ptr<EnumerationContext> open(const std::string& owner, const std::string& nameSpace, PullKind kind,
                                             std::chrono::seconds timeout);
    // The context of `id`, now in use by the calling operation. Throws CimError
    // CIM_ERR_INVALID_ENUMERATION_CONTEXT when there is none for this owner and
    // namespace (unknown, expired, closed, another client's) or another operation
    // uses it now.
    std::shared_ptr<EnumerationContext> acquire(const std::string& id, const std::string& owner,
                                                const std::string& nameSpace);
    // Ends the calling operation's use: the timer starts again, or, with `remove`
    // (end of sequence, an error, CloseEnumeration), the context is closed and freed.
    void release(const std::shared_ptr<EnumerationContext>& context, bool remove);

    // CloseEnumeration: removes and closes the context even while a pull waits on
    // it (that pull then answers CIM_ERR_PULL_HAS_BEEN_ABANDONED). Throws as acquire
    // does for a context this owner and namespace do not have.
    void close(const std::string& id, const std::string& owner, const std::string& nameSpace);

    // How many enumerations are open (all owners).
    std::size_t openCount() const;
    // Closes and frees every context and stops the reaper; later opens are refused.
    void shutdown();

private:
    void reap();
    std::string newId() const;

    const EnumerationLimits limits_;
    mutable std::mutex mutex_;
    std::condition_variable wake_;
    std::map<std::string, std::shared_ptr<EnumerationContext>> contexts_;
    bool stopping_ = false;
    std::thread reaper_;
};

}  // namespace orv::cimhost::detail
