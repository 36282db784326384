// The in-process client API over the core's services.
#include "orv/host/broker_core.hpp"

#include "args.hpp"
#include "core.hpp"
#include "string.hpp"

namespace orv::host {

using detail::Arena;
using detail::ArenaGuard;
using detail::Op;
using detail::Outcome;
using detail::Request;

struct Reply::State {
    Arena arena;  // owns everything below; declared first, freed last
    detail::ResultSink sink{arena};
    CMPIrc rc = CMPI_RC_OK;
    std::string message;
    CMPIString* msg = nullptr;
    CMPIArgs* out = nullptr;
    unsigned calls = 0;

    void finish(const Outcome& outcome) {
        rc = outcome.rc;
        message = outcome.message;
        calls = outcome.calls;
        if (!message.empty()) {
            ArenaGuard guard(arena);
            msg = detail::newString(message, detail::Owner::Arena);
        }
    }
};

Reply::Reply() : state_(std::make_unique<State>()) {}
Reply::Reply(std::unique_ptr<State> state) : state_(std::move(state)) {}
Reply::~Reply() = default;
Reply::Reply(Reply&&) noexcept = default;
Reply& Reply::operator=(Reply&&) noexcept = default;

CMPIrc Reply::rc() const noexcept { return state_->rc; }
const std::string& Reply::message() const noexcept { return state_->message; }
CMPIStatus Reply::status() const noexcept { return CMPIStatus{state_->rc, state_->msg}; }
const std::vector<ReturnedItem>& Reply::items() const noexcept { return state_->sink.items; }
unsigned Reply::doneCount() const noexcept { return state_->sink.done; }
unsigned Reply::providerCalls() const noexcept { return state_->calls; }
const CMPIArgs* Reply::outArgs() const noexcept { return state_->out; }

std::vector<const CMPIInstance*> Reply::instances() const {
    std::vector<const CMPIInstance*> out;
    for (const ReturnedItem& item : items()) {
        if (item.kind == ReturnedItem::Kind::Instance) {
            out.push_back(item.data.value.inst);
        }
    }
    return out;
}

std::vector<const CMPIObjectPath*> Reply::objectPaths() const {
    std::vector<const CMPIObjectPath*> out;
    for (const ReturnedItem& item : items()) {
        if (item.kind == ReturnedItem::Kind::ObjectPath) {
            out.push_back(item.data.value.ref);
        }
    }
    return out;
}

struct ObjectScope::State {
    Arena arena;
    ArenaGuard guard{arena};
};

ObjectScope::ObjectScope() : state_(std::make_unique<State>()) {}
ObjectScope::~ObjectScope() = default;
std::size_t ObjectScope::objectCount() const noexcept { return state_->arena.size(); }

struct BrokerCore::Impl {
    explicit Impl(const CoreConfig& config) : services(config) {}
    detail::CoreServices services;
};

namespace {

detail::Caller callerOf(const CallOptions& opts) {
    return detail::Caller{opts.principal, opts.role, opts.flags, opts.sessionId};
}

// A NULL-terminated char* list over the options' property list (or NULL).
class PropertyList {
public:
    explicit PropertyList(const CallOptions& opts) {
        if (opts.properties) {
            for (const std::string& name : *opts.properties) {
                pointers_.push_back(name.c_str());
            }
            pointers_.push_back(nullptr);
        }
    }
    const char** get() { return pointers_.empty() ? nullptr : pointers_.data(); }

private:
    std::vector<const char*> pointers_;
};

}  // namespace

BrokerCore::BrokerCore(const CoreConfig& config) : impl_(std::make_unique<Impl>(config)) {}
BrokerCore::~BrokerCore() { shutdown(); }

const CMPIBroker* BrokerCore::broker() const noexcept { return impl_->services.broker(); }

const orv::repository::ClassRepository& BrokerCore::classes() const noexcept { return impl_->services.classes(); }

std::vector<std::string> BrokerCore::preloadProviders() { return impl_->services.preloadProviders(); }

std::vector<std::string> BrokerCore::createAllProviders() { return impl_->services.createAllProviders(); }

namespace {

Reply send(detail::CoreServices& services, Request request, const CallOptions& opts) {
    auto state = std::make_unique<Reply::State>();
    PropertyList properties(opts);
    request.properties = properties.get();
    request.caller = callerOf(opts);
    if (opts.onItem) {
        state->sink.consumer = &opts.onItem;
    }
    if (request.op == Op::InvokeMethod) {
        ArenaGuard guard(state->arena);
        state->out = detail::newArgs(detail::Owner::Arena);
        request.out = state->out;
    }
    state->finish(services.dispatch(request, state->sink));
    return Reply(std::move(state));
}

Request request(Op op, const CMPIObjectPath* path) {
    Request r;
    r.op = op;
    r.path = path;
    return r;
}

Reply reply(const Outcome& outcome) {
    auto state = std::make_unique<Reply::State>();
    state->finish(outcome);
    return Reply(std::move(state));
}

}  // namespace

Reply BrokerCore::enumerateInstances(const CMPIObjectPath* classPath, const CallOptions& opts) {
    return send(impl_->services, request(Op::EnumerateInstances, classPath), opts);
}

Reply BrokerCore::enumerateInstanceNames(const CMPIObjectPath* classPath, const CallOptions& opts) {
    return send(impl_->services, request(Op::EnumerateInstanceNames, classPath), opts);
}

Reply BrokerCore::getInstance(const CMPIObjectPath* instancePath, const CallOptions& opts) {
    return send(impl_->services, request(Op::GetInstance, instancePath), opts);
}

Reply BrokerCore::createInstance(const CMPIObjectPath* classPath, const CMPIInstance* instance,
                                 const CallOptions& opts) {
    Request r = request(Op::CreateInstance, classPath);
    r.instance = instance;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::modifyInstance(const CMPIObjectPath* instancePath, const CMPIInstance* instance,
                                 const CallOptions& opts) {
    Request r = request(Op::ModifyInstance, instancePath);
    r.instance = instance;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::deleteInstance(const CMPIObjectPath* instancePath, const CallOptions& opts) {
    return send(impl_->services, request(Op::DeleteInstance, instancePath), opts);
}

Reply BrokerCore::execQuery(const CMPIObjectPath* nsPath, const char* query, const char* lang,
                            const CallOptions& opts) {
    Request r = request(Op::ExecQuery, nsPath);
    r.query = query;
    r.lang = lang;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::associators(const CMPIObjectPath* objectPath, const char* assocClass, const char* resultClass,
                              const char* role, const char* resultRole, const CallOptions& opts) {
    Request r = request(Op::Associators, objectPath);
    r.assocClass = assocClass;
    r.resultClass = resultClass;
    r.role = role;
    r.resultRole = resultRole;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::associatorNames(const CMPIObjectPath* objectPath, const char* assocClass, const char* resultClass,
                                  const char* role, const char* resultRole, const CallOptions& opts) {
    Request r = request(Op::AssociatorNames, objectPath);
    r.assocClass = assocClass;
    r.resultClass = resultClass;
    r.role = role;
    r.resultRole = resultRole;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::references(const CMPIObjectPath* objectPath, const char* resultClass, const char* role,
                             const CallOptions& opts) {
    Request r = request(Op::References, objectPath);
    r.resultClass = resultClass;
    r.role = role;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::referenceNames(const CMPIObjectPath* objectPath, const char* resultClass, const char* role,
                                 const CallOptions& opts) {
    Request r = request(Op::ReferenceNames, objectPath);
    r.resultClass = resultClass;
    r.role = role;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::invokeMethod(const CMPIObjectPath* objectPath, const char* method, const CMPIArgs* in,
                               const CallOptions& opts) {
    Request r = request(Op::InvokeMethod, objectPath);
    r.method = method;
    r.in = in;
    return send(impl_->services, r, opts);
}

Reply BrokerCore::activateFilter(std::string_view ns, std::string_view query, std::string_view lang,
                                 const CallOptions& opts) {
    return reply(impl_->services.filterControl(ns, query, lang, callerOf(opts), true));
}

Reply BrokerCore::deactivateFilter(std::string_view ns, std::string_view query, std::string_view lang,
                                   const CallOptions& opts) {
    return reply(impl_->services.filterControl(ns, query, lang, callerOf(opts), false));
}

Reply BrokerCore::enableIndications(std::string_view ns, std::string_view className) {
    return reply(impl_->services.indicationSwitch(ns, className, true));
}

Reply BrokerCore::disableIndications(std::string_view ns, std::string_view className) {
    return reply(impl_->services.indicationSwitch(ns, className, false));
}

void BrokerCore::addBuiltInProvider(const std::string& name, orv::repository::ProviderKind kind, void* mi,
                                    std::string_view ns, const std::vector<std::string>& classNames) {
    impl_->services.addBuiltIn(name, kind, mi, ns, classNames);
}

std::uint64_t BrokerCore::addIndicationSubscriber(IndicationSubscriber subscriber) {
    return impl_->services.addSubscriber(std::move(subscriber));
}

void BrokerCore::removeIndicationSubscriber(std::uint64_t id) { impl_->services.removeSubscriber(id); }

unsigned BrokerCore::unloadIdleProviders() { return impl_->services.loader().unloadIdle(); }

void BrokerCore::shutdown() { impl_->services.loader().shutdown(); }

std::vector<std::string> BrokerCore::loadedLibraries() const { return impl_->services.loader().loadedLibraries(); }

}  // namespace orv::host
