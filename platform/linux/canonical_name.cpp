#include "canonical_name.hpp"

#include <memory>
#include <netdb.h>
#include <sys/socket.h>

namespace orv::linuxhost {

CanonicalNameCache::CanonicalNameCache(Resolver resolver, Timing timing) : resolver_(std::move(resolver)), timing_(timing) {}

CanonicalNameCache::~CanonicalNameCache()
{
    {
        std::lock_guard<std::mutex> lock(mutex_);
        stopping_ = true;
    }
    changed_.notify_all();
    if (worker_.joinable()) worker_.join();
}

bool CanonicalNameCache::fresh(const std::string& hostName, Clock::time_point now) const
{
    return answer_ && answer_->hostName == hostName && now - answer_->at < timing_.refresh;
}

std::string CanonicalNameCache::nameFor(const std::string& hostName)
{
    std::unique_lock<std::mutex> lock(mutex_);
    if (fresh(hostName, Clock::now())) return answer_->canonical;
    const bool known = answer_ && answer_->hostName == hostName;
    const bool alreadyAsked = resolving_ == hostName || wanted_ == hostName;
    if (!alreadyAsked) request(hostName);
    if (!known && !alreadyAsked) {
        // A name never resolved before: the resolver usually answers from its
        // files at once, so wait a little rather than answer the short name.
        changed_.wait_for(lock, timing_.firstWait, [&] { return stopping_ || (answer_ && answer_->hostName == hostName); });
    }
    if (answer_ && answer_->hostName == hostName) return answer_->canonical;  // stale, or just arrived
    return hostName;
}

void CanonicalNameCache::request(const std::string& hostName)
{
    wanted_ = hostName;
    if (!worker_.joinable()) worker_ = std::thread([this] { work(); });
    changed_.notify_all();
}

void CanonicalNameCache::work()
{
    std::unique_lock<std::mutex> lock(mutex_);
    while (!stopping_) {
        if (!wanted_) {
            changed_.wait(lock, [&] { return stopping_ || wanted_.has_value(); });
            continue;
        }
        std::string hostName = std::move(*wanted_);
        wanted_.reset();
        resolving_ = hostName;
        lock.unlock();
        std::optional<std::string> canonical = resolver_(hostName);
        lock.lock();
        resolving_.reset();
        answer_ = Answer{hostName, canonical.value_or(hostName), Clock::now()};
        changed_.notify_all();
    }
}

std::optional<std::string> resolveCanonicalName(const std::string& hostName)
{
    addrinfo hints{};
    hints.ai_family = AF_UNSPEC;
    hints.ai_flags = AI_CANONNAME;
    addrinfo* result = nullptr;
    if (::getaddrinfo(hostName.c_str(), nullptr, &hints, &result) != 0) return std::nullopt;
    std::unique_ptr<addrinfo, void (*)(addrinfo*)> owner(result, freeaddrinfo);
    if (!result || !result->ai_canonname || !*result->ai_canonname) return std::nullopt;
    return std::string(result->ai_canonname);
}

}  // namespace orv::linuxhost
