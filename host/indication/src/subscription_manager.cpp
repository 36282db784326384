#include "orv/indication/subscription_manager.hpp"

#include <algorithm>
#include <ctime>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/host/wql.hpp"
#include "orv/repository/class_repository.hpp"
#include "names.hpp"

namespace orv::indication {

namespace {

using detail::lowerCase;
constexpr auto sameName = detail::equalsNoCase;

Status refused(CMPIrc rc, std::string message) { return Status{rc, std::move(message)}; }

// Now as a CIM date-time in UTC ("yyyymmddhhmmss.mmmmmm+000").
std::string cimNow() {
    std::time_t now = std::time(nullptr);
    std::tm utc{};
    gmtime_r(&now, &utc);
    char text[32];
    std::strftime(text, sizeof text, "%Y%m%d%H%M%S.000000+000", &utc);
    return text;
}

bool isHttpUrl(std::string_view url) {
    return url.rfind("http://", 0) == 0 || url.rfind("https://", 0) == 0;
}

}  // namespace

// One enabled subscription as deliveries see it.
struct SubscriptionManager::Active {
    Active(std::string subscriptionId, host::WqlQuery wql, std::string ns, std::string destinationUrl,
           exporter::DeliveryPolicy deliveryPolicy)
        : id(std::move(subscriptionId)), query(std::move(wql)), sourceNamespace(std::move(ns)),
          url(std::move(destinationUrl)), policy(deliveryPolicy) {}
    std::string id;
    host::WqlQuery query;
    std::string sourceNamespace;
    std::string url;
    exporter::DeliveryPolicy policy;
    std::atomic<std::uint64_t> matched{0};
};

struct SubscriptionManager::Snapshot {
    std::vector<std::shared_ptr<Active>> active;
};

SubscriptionManager::SubscriptionManager(host::BrokerCore& core, ManagerOptions options, DeliverySink sink)
    : core_(core), options_(std::move(options)), sink_(std::move(sink)), store_(options_.stateDir),
      snapshot_(std::make_shared<const Snapshot>()) {
    subscriberId_ = core_.addIndicationSubscriber(
        [this](std::string_view ns, const CMPIInstance* indication) { deliver(ns, indication); });
}

SubscriptionManager::~SubscriptionManager() {
    stopDelivery();
    core_.removeIndicationSubscriber(subscriberId_);
}

void SubscriptionManager::stopDelivery() { delivering_.store(false); }

void SubscriptionManager::log(Severity severity, const std::string& line) const {
    if (options_.log) {
        options_.log(severity, line);
    }
}

exporter::DeliveryPolicy SubscriptionManager::policyOf(const SubscriptionRecord& subscription) const {
    exporter::DeliveryPolicy policy;
    policy.retryAttempts = options_.deliveryRetryAttempts;
    policy.retryInterval = std::chrono::duration_cast<std::chrono::milliseconds>(options_.deliveryRetryInterval);
    switch (subscription.onFatalErrorPolicy) {
    case 3: policy.onFatal = exporter::OnFatalError::Disable; break;
    case 4: policy.onFatal = exporter::OnFatalError::Remove; break;
    default: policy.onFatal = exporter::OnFatalError::Ignore; break;
    }
    return policy;
}

// On the provider's thread: read the snapshot, match, encode, hand over. The sink
// only queues, so this costs the matching and the encoding; subscriptions with the
// same SELECT list share one encoding of the indication.
void SubscriptionManager::deliver(std::string_view ns, const CMPIInstance* indication) {
    if (!delivering_.load(std::memory_order_relaxed)) {
        return;
    }
    std::shared_ptr<const Snapshot> snapshot = std::atomic_load(&snapshot_);
    std::vector<std::pair<const std::vector<std::string>*, std::string>> encoded;
    for (const std::shared_ptr<Active>& active : snapshot->active) {
        if (!sameName(active->sourceNamespace, ns) || !active->query.matches(indication)) {
            continue;
        }
        active->matched.fetch_add(1, std::memory_order_relaxed);
        const std::vector<std::string>& selectList = active->query.selectList();
        auto done = std::find_if(encoded.begin(), encoded.end(),
                                 [&selectList](const auto& item) { return *item.first == selectList; });
        if (done == encoded.end()) {
            cimxml::InstanceEncoding encoding;
            if (!selectList.empty()) {
                encoding.propertyList = selectList;
            }
            cimxml::XmlWriter out;
            cimxml::writeInstance(out, indication, encoding);
            done = encoded.emplace(encoded.end(), &selectList, out.take());
        }
        sink_(active->id, active->url, done->second, active->policy);
    }
}

std::map<std::string, std::uint64_t> SubscriptionManager::matchCounts() const {
    std::shared_ptr<const Snapshot> snapshot = std::atomic_load(&snapshot_);
    std::map<std::string, std::uint64_t> counts;
    for (const auto& active : snapshot->active) {
        counts[active->id] = active->matched.load();
    }
    return counts;
}

// Under mutex_: rebuilds the deliveries' view from the enabled subscriptions,
// keeping the match counters of those that stay.
void SubscriptionManager::publishSnapshot() {
    std::shared_ptr<const Snapshot> old = std::atomic_load(&snapshot_);
    auto next = std::make_shared<Snapshot>();
    for (const auto& [key, subscription] : subscriptions_) {
        if (subscription.state != 2) {
            continue;
        }
        const std::string id = subscription.id();
        std::shared_ptr<Active> kept;
        for (const auto& active : old->active) {
            if (active->id == id) {
                kept = active;
            }
        }
        if (!kept) {
            const FilterRecord& filter = filters_.at(lowerCase(subscription.filterName));
            const DestinationRecord& destination = destinations_.at(lowerCase(subscription.handlerName));
            kept = std::make_shared<Active>(id, host::WqlQuery::parse(filter.query), filter.sourceNamespace,
                                            destination.destination, policyOf(subscription));
        }
        next->active.push_back(std::move(kept));
    }
    std::atomic_store(&snapshot_, std::shared_ptr<const Snapshot>(std::move(next)));
}

Status SubscriptionManager::persist(const std::string& id, const std::string& text) {
    try {
        store_.put(id, text);
    } catch (const std::exception& error) {
        log(Severity::Error, error.what());
        return refused(CMPI_RC_ERR_FAILED, std::string("cannot store: ") + error.what());
    }
    return {};
}

Status SubscriptionManager::unpersist(const std::string& id) {
    try {
        store_.remove(id);
    } catch (const std::exception& error) {
        log(Severity::Error, error.what());
        return refused(CMPI_RC_ERR_FAILED, std::string("cannot update the store: ") + error.what());
    }
    return {};
}

Status SubscriptionManager::checkFilter(const FilterRecord& filter) const {
    if (filter.name.empty()) {
        return refused(CMPI_RC_ERR_INVALID_PARAMETER, "the filter needs a Name");
    }
    if (filter.query.empty()) {
        return refused(CMPI_RC_ERR_INVALID_PARAMETER, "the filter needs a Query");
    }
    if (!sameName(filter.queryLanguage, "WQL") && !sameName(filter.queryLanguage, "CQL") &&
        !sameName(filter.queryLanguage, "DMTF:CQL")) {
        return refused(CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED,
                       "query language " + filter.queryLanguage + " is not supported (WQL is)");
    }
    std::string fromClass;
    try {
        fromClass = host::WqlQuery::parse(filter.query).fromClass();
    } catch (const host::WqlError& error) {
        return refused(CMPI_RC_ERR_INVALID_QUERY, std::string("query does not parse: ") + error.what());
    }
    const repository::ClassRepository& classes = core_.classes();
    if (!classes.hasNamespace(filter.sourceNamespace)) {
        return refused(CMPI_RC_ERR_INVALID_NAMESPACE, "source namespace " + filter.sourceNamespace + " does not exist");
    }
    if (classes.getClass(filter.sourceNamespace, fromClass) == nullptr) {
        return refused(CMPI_RC_ERR_INVALID_CLASS, "class " + fromClass + " does not exist in " + filter.sourceNamespace);
    }
    if (!classes.isIndication(filter.sourceNamespace, fromClass)) {
        return refused(CMPI_RC_ERR_INVALID_QUERY, "class " + fromClass + " is not an indication class");
    }
    return {};
}

Status SubscriptionManager::createFilter(FilterRecord filter, const std::string& /*principal*/) {
    filter.systemName = options_.systemName;
    filter.systemCreationClassName = options_.systemCreationClassName;
    if (filter.sourceNamespace.empty()) {
        filter.sourceNamespace = "root/cimv2";
    }
    if (filter.queryLanguage.empty()) {
        filter.queryLanguage = "WQL";
    }
    if (Status status = checkFilter(filter); !status.ok()) {
        return status;
    }
    std::lock_guard lock(mutex_);
    if (filters_.count(lowerCase(filter.name)) != 0) {
        return refused(CMPI_RC_ERR_ALREADY_EXISTS, "filter " + filter.name + " already exists");
    }
    if (Status status = persist(storeId(filter), storedText(filter)); !status.ok()) {
        return status;
    }
    log(Severity::Info, "filter " + filter.name + " created: " + filter.query);
    filters_.emplace(lowerCase(filter.name), std::move(filter));
    return {};
}

Status SubscriptionManager::createDestination(DestinationRecord destination) {
    destination.systemName = options_.systemName;
    destination.systemCreationClassName = options_.systemCreationClassName;
    if (destination.name.empty()) {
        return refused(CMPI_RC_ERR_INVALID_PARAMETER, "the destination needs a Name");
    }
    if (!isHttpUrl(destination.destination)) {
        return refused(CMPI_RC_ERR_INVALID_PARAMETER,
                       "Destination must be an http:// or https:// URL, not '" + destination.destination + "'");
    }
    if (destination.protocol != 2) {
        return refused(CMPI_RC_ERR_NOT_SUPPORTED, "only the CIM-XML protocol (2) is supported");
    }
    std::lock_guard lock(mutex_);
    if (destinations_.count(lowerCase(destination.name)) != 0) {
        return refused(CMPI_RC_ERR_ALREADY_EXISTS, "destination " + destination.name + " already exists");
    }
    if (Status status = persist(storeId(destination), storedText(destination)); !status.ok()) {
        return status;
    }
    log(Severity::Info, "destination " + destination.name + " created: " + destination.destination);
    destinations_.emplace(lowerCase(destination.name), std::move(destination));
    return {};
}

// Under mutex_: the first enabled subscription of a filter activates it at the providers.
Status SubscriptionManager::activate(const SubscriptionRecord& subscription, const std::string& principal) {
    const FilterRecord& filter = filters_.at(lowerCase(subscription.filterName));
    unsigned& users = filterUse_[lowerCase(filter.name)];
    if (users == 0) {
        host::CallOptions caller;
        caller.principal = principal;
        host::Reply reply = core_.activateFilter(filter.sourceNamespace, filter.query, filter.queryLanguage, caller);
        if (reply.rc() == CMPI_RC_ERR_NOT_SUPPORTED && reply.providerCalls() == 0) {
            // No provider can raise these indications yet; the subscription waits for none.
            log(Severity::Info, "filter " + filter.name + ": " + reply.message());
        } else if (reply.rc() != CMPI_RC_OK) {
            return refused(reply.rc(), reply.message());
        }
    }
    ++users;
    return {};
}

// Under mutex_: records the subscription and shows it to the deliveries before its
// filter is activated, so what a provider raises as soon as it is activated (the
// heartbeat's first indication comes at once, from its own thread) already finds it.
// A refused activation takes it out again.
Status SubscriptionManager::enroll(SubscriptionRecord subscription, const std::string& principal) {
    const std::string id = storeId(subscription);
    const SubscriptionRecord& kept = subscriptions_.emplace(id, std::move(subscription)).first->second;
    publishSnapshot();
    if (kept.state == 2) {
        if (Status status = activate(kept, principal); !status.ok()) {
            subscriptions_.erase(id);
            publishSnapshot();
            return status;
        }
    }
    return {};
}

void SubscriptionManager::deactivate(const SubscriptionRecord& subscription) {
    const std::string key = lowerCase(subscription.filterName);
    unsigned& users = filterUse_[key];
    if (users == 0 || --users > 0) {
        return;
    }
    const FilterRecord& filter = filters_.at(key);
    host::Reply reply = core_.deactivateFilter(filter.sourceNamespace, filter.query, filter.queryLanguage);
    if (reply.rc() != CMPI_RC_OK && reply.providerCalls() > 0) {
        log(Severity::Warning, "filter " + filter.name + ": deactivation answered " + std::to_string(reply.rc()) +
                                   " " + reply.message());
    }
}

Status SubscriptionManager::createSubscription(SubscriptionRecord subscription, const std::string& principal) {
    std::lock_guard lock(mutex_);
    auto filter = filters_.find(lowerCase(subscription.filterName));
    if (filter == filters_.end()) {
        return refused(CMPI_RC_ERR_NOT_FOUND, "Filter not found: " + subscription.filterName);
    }
    auto destination = destinations_.find(lowerCase(subscription.handlerName));
    if (destination == destinations_.end()) {
        return refused(CMPI_RC_ERR_NOT_FOUND, "Handler not found: " + subscription.handlerName);
    }
    subscription.filterName = filter->second.name;
    subscription.handlerName = destination->second.name;
    subscription.handlerClass = destination->second.creationClassName;
    if (subscription.state != 2 && subscription.state != 4) {
        return refused(CMPI_RC_ERR_NOT_SUPPORTED, "SubscriptionState must be 2 (Enabled) or 4 (Disabled)");
    }
    const std::string id = storeId(subscription);
    if (subscriptions_.count(id) != 0) {
        return refused(CMPI_RC_ERR_ALREADY_EXISTS, "subscription " + subscription.id() + " already exists");
    }
    subscription.startTime = cimNow();
    if (Status status = enroll(std::move(subscription), principal); !status.ok()) {
        return status;
    }
    const SubscriptionRecord& made = subscriptions_.at(id);
    if (Status status = persist(id, storedText(made)); !status.ok()) {
        if (made.state == 2) {
            deactivate(made);
        }
        subscriptions_.erase(id);
        publishSnapshot();
        return status;
    }
    log(Severity::Info, "subscription " + made.id() + " created");
    return {};
}

Status SubscriptionManager::deleteFilter(std::string_view name) {
    std::lock_guard lock(mutex_);
    auto found = filters_.find(lowerCase(name));
    if (found == filters_.end()) {
        return refused(CMPI_RC_ERR_NOT_FOUND, "Filter not found: " + std::string(name));
    }
    for (const auto& [id, subscription] : subscriptions_) {
        if (sameName(subscription.filterName, name)) {
            return refused(CMPI_RC_ERR_FAILED, "Filter in use");
        }
    }
    if (Status status = unpersist(storeId(found->second)); !status.ok()) {
        return status;
    }
    log(Severity::Info, "filter " + found->second.name + " deleted");
    filterUse_.erase(found->first);
    filters_.erase(found);
    return {};
}

Status SubscriptionManager::deleteDestination(std::string_view name) {
    std::lock_guard lock(mutex_);
    auto found = destinations_.find(lowerCase(name));
    if (found == destinations_.end()) {
        return refused(CMPI_RC_ERR_NOT_FOUND, "Handler not found: " + std::string(name));
    }
    for (const auto& [id, subscription] : subscriptions_) {
        if (sameName(subscription.handlerName, name)) {
            return refused(CMPI_RC_ERR_FAILED, "Handler in use");
        }
    }
    if (Status status = unpersist(storeId(found->second)); !status.ok()) {
        return status;
    }
    log(Severity::Info, "destination " + found->second.name + " deleted");
    destinations_.erase(found);
    return {};
}

Status SubscriptionManager::deleteSubscription(std::string_view filterName, std::string_view handlerName) {
    std::lock_guard lock(mutex_);
    SubscriptionRecord probe;
    probe.filterName = std::string(filterName);
    probe.handlerName = std::string(handlerName);
    auto found = subscriptions_.find(storeId(probe));
    if (found == subscriptions_.end()) {
        return refused(CMPI_RC_ERR_NOT_FOUND, "Subscription not found: " + probe.id());
    }
    if (Status status = unpersist(found->first); !status.ok()) {
        return status;
    }
    if (found->second.state == 2) {
        deactivate(found->second);
    }
    log(Severity::Info, "subscription " + found->second.id() + " deleted");
    subscriptions_.erase(found);
    publishSnapshot();
    return {};
}

void SubscriptionManager::onFatalError(const std::string& subscriptionId, exporter::OnFatalError policy) {
    if (policy == exporter::OnFatalError::Ignore) {
        return;
    }
    std::optional<SubscriptionRecord> target;
    {
        std::lock_guard lock(mutex_);
        for (auto& [id, subscription] : subscriptions_) {
            if (subscription.id() != subscriptionId || subscription.state != 2) {
                continue;
            }
            if (policy == exporter::OnFatalError::Remove) {
                target = subscription;
                break;
            }
            deactivate(subscription);
            subscription.state = 4;
            persist(id, storedText(subscription));
            log(Severity::Warning, "subscription " + subscriptionId + " disabled after a failed delivery");
            publishSnapshot();
        }
    }
    if (target) {
        log(Severity::Warning, "subscription " + subscriptionId + " removed after a failed delivery");
        deleteSubscription(target->filterName, target->handlerName);
    }
}

std::vector<std::string> SubscriptionManager::restore() {
    std::vector<std::string> problems;
    std::vector<SubscriptionRecord> pending;
    std::lock_guard lock(mutex_);
    for (const StateStore::Object& object : store_.loadAll()) {
        std::string error;
        ParsedRecord parsed = parseStored(object.content, &error);
        if (parsed.filter) {
            if (Status status = checkFilter(*parsed.filter); !status.ok()) {
                problems.push_back("stored filter " + parsed.filter->name + ": " + status.message);
                continue;
            }
            filters_.emplace(lowerCase(parsed.filter->name), std::move(*parsed.filter));
        } else if (parsed.destination) {
            destinations_.emplace(lowerCase(parsed.destination->name), std::move(*parsed.destination));
        } else if (parsed.subscription) {
            pending.push_back(std::move(*parsed.subscription));
        } else {
            problems.push_back(store_.fileOf(object.id).string() + ": " + error);
        }
    }
    for (SubscriptionRecord& subscription : pending) {
        if (filters_.count(lowerCase(subscription.filterName)) == 0 ||
            destinations_.count(lowerCase(subscription.handlerName)) == 0) {
            problems.push_back("stored subscription " + subscription.id() + ": its filter or destination is missing");
            continue;
        }
        const std::string id = subscription.id();
        if (Status status = enroll(std::move(subscription), {}); !status.ok()) {
            problems.push_back("stored subscription " + id + ": " + status.message);
            continue;
        }
        log(Severity::Info, "subscription " + id + " restored");
    }
    return problems;
}

namespace {

template <class Record>
std::vector<Record> valuesOf(const std::map<std::string, Record>& records) {
    std::vector<Record> out;
    for (const auto& [key, record] : records) {
        out.push_back(record);
    }
    return out;
}

template <class Record>
std::optional<Record> findIn(const std::map<std::string, Record>& records, const std::string& key) {
    auto found = records.find(key);
    return found != records.end() ? std::optional(found->second) : std::nullopt;
}

}  // namespace

std::vector<FilterRecord> SubscriptionManager::filters() const {
    std::lock_guard lock(mutex_);
    return valuesOf(filters_);
}

std::vector<DestinationRecord> SubscriptionManager::destinations() const {
    std::lock_guard lock(mutex_);
    return valuesOf(destinations_);
}

std::vector<SubscriptionRecord> SubscriptionManager::subscriptions() const {
    std::lock_guard lock(mutex_);
    return valuesOf(subscriptions_);
}

std::optional<FilterRecord> SubscriptionManager::filter(std::string_view name) const {
    std::lock_guard lock(mutex_);
    return findIn(filters_, lowerCase(name));
}

std::optional<DestinationRecord> SubscriptionManager::destination(std::string_view name) const {
    std::lock_guard lock(mutex_);
    return findIn(destinations_, lowerCase(name));
}

std::optional<SubscriptionRecord> SubscriptionManager::subscription(std::string_view filterName,
                                                                    std::string_view handlerName) const {
    SubscriptionRecord probe;
    probe.filterName = std::string(filterName);
    probe.handlerName = std::string(handlerName);
    std::lock_guard lock(mutex_);
    return findIn(subscriptions_, storeId(probe));
}

}  // namespace orv::indication
