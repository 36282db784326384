// The broker's request table (CMPIBrokerFT): thread attach/detach, indication
// delivery and the up-calls, routed exactly like client requests. What an
// up-call returns belongs to the calling invocation (or attached thread).
#include "broker_tables.hpp"
#include "context.hpp"
#include "core.hpp"
#include "enumeration.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

// The request's caller as the provider's context describes it.
Caller callerFrom(const CMPIContext* ctx) {
    Caller caller;
    ValueList* entries = contextImpl(ctx);
    if (entries == nullptr) {
        return caller;
    }
    if (const NamedValue* principal = entries->find(CMPIPrincipal); principal != nullptr) {
        const char* text = stringText(principal->data.value.string);
        caller.principal = principal->data.type == CMPI_string && text != nullptr ? text : "";
    }
    if (const NamedValue* role = entries->find(CMPIRole); role != nullptr && role->data.type == CMPI_string) {
        const char* text = stringText(role->data.value.string);
        caller.role = text != nullptr ? text : "";
    }
    if (const NamedValue* flags = entries->find(CMPIInvocationFlags); flags != nullptr && flags->data.type == CMPI_uint32) {
        caller.flags = flags->data.value.uint32;
    }
    if (const NamedValue* session = entries->find("CMPISessionId"); session != nullptr && session->data.type == CMPI_uint32) {
        caller.sessionId = session->data.value.uint32;
    }
    return caller;
}

// Runs an up-call; the sink's objects go to the caller's current arena.
Outcome run(const CMPIBroker* mb, const CMPIContext* ctx, Request request, ResultSink& sink) {
    CoreServices* core = coreOf(mb);
    if (core == nullptr) {
        return Outcome{CMPI_RC_ERR_INVALID_HANDLE, "not a broker of this host", 0};
    }
    request.caller = callerFrom(ctx);
    return core->dispatch(request, sink);
}

void report(CMPIStatus* rc, const Outcome& outcome) {
    setRc(rc, makeStatus(outcome.rc, outcome.message.empty() ? nullptr : outcome.message.c_str()));
}

// The sink's items moved into a new enumeration of the current arena.
CMPIEnumeration* toEnumeration(ResultSink& sink) {
    CMPIEnumeration* enumeration = newEnumeration(Owner::Arena);
    EnumerationImpl* e = enumerationImpl(enumeration);
    for (ReturnedItem& item : sink.items) {
        if (item.kind == ReturnedItem::Kind::Error) {
            continue;
        }
        bool owned = item.data.state == CMPI_goodValue && ownsMember(item.data.type);
        ObjectBase* member = owned ? baseOf(item.data.value.inst) : nullptr;
        if (member != nullptr && member->owner == Owner::Arena && member->arena != nullptr) {
            member->arena->unlink(member);
            member->owner = Owner::Parent;
        }
        e->items.push_back(item.data);
    }
    return enumeration;
}

CMPIEnumeration* enumerate(const CMPIBroker* mb, const CMPIContext* ctx, const Request& request, CMPIStatus* rc) {
    ResultSink sink(currentArena());
    Outcome outcome = run(mb, ctx, request, sink);
    report(rc, outcome);
    return outcome.rc == CMPI_RC_OK ? toEnumeration(sink) : nullptr;
}

// The first item of the given kind, left in the caller's arena.
const ReturnedItem* firstOf(const ResultSink& sink, ReturnedItem::Kind kind) {
    for (const ReturnedItem& item : sink.items) {
        if (item.kind == kind) {
            return &item;
        }
    }
    return nullptr;
}

CMPIContext* prepareAttachThread(const CMPIBroker* /*mb*/, const CMPIContext* ctx) { return copyContext(ctx); }

CMPIStatus attachThread(const CMPIBroker* /*mb*/, const CMPIContext* ctx) {
    return CMPIStatus{contextImpl(ctx) != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE, nullptr};
}

// Releases the prepared context and everything the thread's own arena holds.
CMPIStatus detachThread(const CMPIBroker* /*mb*/, const CMPIContext* ctx) {
    if (contextImpl(ctx) == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    disposeObject(ctx);
    threadArena().clear();
    return okStatus();
}

CMPIStatus deliverIndication(const CMPIBroker* mb, const CMPIContext* /*ctx*/, const char* ns, const CMPIInstance* ind) {
    CoreServices* core = coreOf(mb);
    return core != nullptr ? core->deliver(ns, ind) : CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
}

CMPIEnumeration* enumerateInstanceNames(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                                        CMPIStatus* rc) {
    Request r;
    r.op = Op::EnumerateInstanceNames;
    r.path = op;
    return enumerate(mb, ctx, r, rc);
}

CMPIEnumeration* enumerateInstances(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                                    const char** properties, CMPIStatus* rc) {
    Request r;
    r.op = Op::EnumerateInstances;
    r.path = op;
    r.properties = properties;
    return enumerate(mb, ctx, r, rc);
}

CMPIInstance* getInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                          const char** properties, CMPIStatus* rc) {
    Request r;
    r.op = Op::GetInstance;
    r.path = op;
    r.properties = properties;
    ResultSink sink(currentArena());
    Outcome outcome = run(mb, ctx, r, sink);
    const ReturnedItem* item = firstOf(sink, ReturnedItem::Kind::Instance);
    if (outcome.rc == CMPI_RC_OK && item == nullptr) {
        outcome = Outcome{CMPI_RC_ERR_NOT_FOUND, "the provider returned no instance", outcome.calls};
    }
    report(rc, outcome);
    return outcome.rc == CMPI_RC_OK ? item->data.value.inst : nullptr;
}

CMPIObjectPath* createInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                               const CMPIInstance* inst, CMPIStatus* rc) {
    Request r;
    r.op = Op::CreateInstance;
    r.path = op;
    r.instance = inst;
    ResultSink sink(currentArena());
    Outcome outcome = run(mb, ctx, r, sink);
    report(rc, outcome);
    const ReturnedItem* item = firstOf(sink, ReturnedItem::Kind::ObjectPath);
    return outcome.rc == CMPI_RC_OK && item != nullptr ? item->data.value.ref : nullptr;
}

CMPIStatus statusOf(const CMPIBroker* mb, const CMPIContext* ctx, const Request& r) {
    ResultSink sink(currentArena());
    CMPIStatus status{CMPI_RC_OK, nullptr};
    report(&status, run(mb, ctx, r, sink));
    return status;
}

CMPIStatus modifyInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                          const CMPIInstance* inst, const char** properties) {
    Request r;
    r.op = Op::ModifyInstance;
    r.path = op;
    r.instance = inst;
    r.properties = properties;
    return statusOf(mb, ctx, r);
}

CMPIStatus deleteInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op) {
    Request r;
    r.op = Op::DeleteInstance;
    r.path = op;
    return statusOf(mb, ctx, r);
}

CMPIEnumeration* execQuery(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                           const char* query, const char* lang, CMPIStatus* rc) {
    Request r;
    r.op = Op::ExecQuery;
    r.path = op;
    r.query = query;
    r.lang = lang;
    return enumerate(mb, ctx, r, rc);
}

CMPIEnumeration* associators(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                             const char* assocClass, const char* resultClass, const char* role,
                             const char* resultRole, const char** properties, CMPIStatus* rc) {
    Request r;
    r.op = Op::Associators;
    r.path = op;
    r.assocClass = assocClass;
    r.resultClass = resultClass;
    r.role = role;
    r.resultRole = resultRole;
    r.properties = properties;
    return enumerate(mb, ctx, r, rc);
}

CMPIEnumeration* associatorNames(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                                 const char* assocClass, const char* resultClass, const char* role,
                                 const char* resultRole, CMPIStatus* rc) {
    Request r;
    r.op = Op::AssociatorNames;
    r.path = op;
    r.assocClass = assocClass;
    r.resultClass = resultClass;
    r.role = role;
    r.resultRole = resultRole;
    return enumerate(mb, ctx, r, rc);
}

CMPIEnumeration* references(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                            const char* resultClass, const char* role, const char** properties, CMPIStatus* rc) {
    Request r;
    r.op = Op::References;
    r.path = op;
    r.resultClass = resultClass;
    r.role = role;
    r.properties = properties;
    return enumerate(mb, ctx, r, rc);
}

CMPIEnumeration* referenceNames(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                                const char* resultClass, const char* role, CMPIStatus* rc) {
    Request r;
    r.op = Op::ReferenceNames;
    r.path = op;
    r.resultClass = resultClass;
    r.role = role;
    return enumerate(mb, ctx, r, rc);
}

CMPIData invokeMethod(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op, const char* method,
                      const CMPIArgs* in, CMPIArgs* out, CMPIStatus* rc) {
    Request r;
    r.op = Op::InvokeMethod;
    r.path = op;
    r.method = method;
    r.in = in;
    r.out = out;
    ResultSink sink(currentArena());
    Outcome outcome = run(mb, ctx, r, sink);
    report(rc, outcome);
    const ReturnedItem* item = firstOf(sink, ReturnedItem::Kind::Data);
    return outcome.rc == CMPI_RC_OK && item != nullptr ? item->data : nullData();
}

// Property operations are not offered to providers (as in sfcb).
CMPIStatus setProperty(const CMPIBroker* /*mb*/, const CMPIContext* /*ctx*/, const CMPIObjectPath* /*op*/,
                       const char* /*name*/, const CMPIValue* /*value*/, CMPIType /*type*/) {
    return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIData getProperty(const CMPIBroker* /*mb*/, const CMPIContext* /*ctx*/, const CMPIObjectPath* /*op*/,
                     const char* /*name*/, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullData();
}

}  // namespace

const CMPIBrokerFT kBrokerFT = {
    kBrokerCapabilities,
    kBrokerVersion,
    kBrokerName,
    prepareAttachThread,
    attachThread,
    detachThread,
    deliverIndication,
    enumerateInstanceNames,
    getInstance,
    createInstance,
    modifyInstance,
    deleteInstance,
    execQuery,
    enumerateInstances,
    associators,
    associatorNames,
    references,
    referenceNames,
    invokeMethod,
    setProperty,
    getProperty,
};

CMPIBroker makeBroker(CoreServices* core) noexcept {
    CMPIBroker broker{};
    broker.hdl = core;
    broker.bft = const_cast<CMPIBrokerFT*>(&kBrokerFT);
    broker.eft = const_cast<CMPIBrokerEncFT*>(&kBrokerEncFT);
    broker.xft = const_cast<CMPIBrokerExtFT*>(&kBrokerExtFT);
    broker.mft = const_cast<CMPIBrokerMemFT*>(&kBrokerMemFT);
    return broker;
}

CoreServices* coreOf(const CMPIBroker* broker) noexcept {
    return broker != nullptr && broker->bft == &kBrokerFT ? static_cast<CoreServices*>(broker->hdl) : nullptr;
}

}  // namespace orv::host::detail
