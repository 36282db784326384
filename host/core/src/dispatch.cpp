// Sending a request to the providers it reaches, one MI call each, in order.
#include <string>

#include "args.hpp"
#include "context.hpp"
#include "core.hpp"
#include "mi_calls.hpp"
#include "object_path.hpp"
#include "query_fallback.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

// The context of one MI call, with the entries sfcb puts there.
CMPIContext* callContext(const Caller& caller, const std::string* parameters) {
    CMPIContext* ctx = newContext(Owner::Caller);
    ValueList* entries = contextImpl(ctx);
    entries->set(CMPIInvocationFlags, reinterpret_cast<const CMPIValue*>(&caller.flags), CMPI_uint32);
    entries->set(CMPIPrincipal, reinterpret_cast<const CMPIValue*>(caller.principal.c_str()), CMPI_chars);
    entries->set("CMPISessionId", reinterpret_cast<const CMPIValue*>(&caller.sessionId), CMPI_uint32);
    if (!caller.role.empty()) {
        entries->set(CMPIRole, reinterpret_cast<const CMPIValue*>(caller.role.c_str()), CMPI_chars);
    }
    if (parameters != nullptr && !parameters->empty()) {
        entries->set("sfcbProviderParameters", reinterpret_cast<const CMPIValue*>(parameters->c_str()), CMPI_chars);
    }
    return ctx;
}

// Calls `slot` of an MI of type MI after checking the table has it.
template <class MI, class FT, class Fn, class... Args>
CMPIStatus call(void* mi, Fn FT::*slot, const char* name, Args... args) {
    const FT* ft = tableOf<MI>(mi);
    if (ft == nullptr || ft->*slot == nullptr) {
        return missingSlot(name);
    }
    return (ft->*slot)(static_cast<MI*>(mi), args...);
}

CMPIStatus callInstanceMI(void* mi, const Request& r, const CMPIContext* ctx, const CMPIResult* rslt,
                          const CMPIObjectPath* path) {
    using MI = CMPIInstanceMI;
    using FT = CMPIInstanceMIFT;
    switch (r.op) {
    case Op::EnumerateInstances:
        return call<MI>(mi, &FT::enumerateInstances, "enumerateInstances", ctx, rslt, path, r.properties);
    case Op::EnumerateInstanceNames:
        return call<MI>(mi, &FT::enumerateInstanceNames, "enumerateInstanceNames", ctx, rslt, path);
    case Op::GetInstance:
        return call<MI>(mi, &FT::getInstance, "getInstance", ctx, rslt, path, r.properties);
    case Op::CreateInstance:
        return call<MI>(mi, &FT::createInstance, "createInstance", ctx, rslt, path, r.instance);
    case Op::ModifyInstance:
        return call<MI>(mi, &FT::modifyInstance, "modifyInstance", ctx, rslt, path, r.instance, r.properties);
    case Op::DeleteInstance:
        return call<MI>(mi, &FT::deleteInstance, "deleteInstance", ctx, rslt, path);
    case Op::ExecQuery:
        return call<MI>(mi, &FT::execQuery, "execQuery", ctx, rslt, path, r.query, r.lang);
    default:
        return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
    }
}

CMPIStatus callAssociationMI(void* mi, const Request& r, const CMPIContext* ctx, const CMPIResult* rslt,
                             const char* assocClass) {
    using MI = CMPIAssociationMI;
    using FT = CMPIAssociationMIFT;
    switch (r.op) {
    case Op::Associators:
        return call<MI>(mi, &FT::associators, "associators", ctx, rslt, r.path, assocClass, r.resultClass, r.role,
                        r.resultRole, r.properties);
    case Op::AssociatorNames:
        return call<MI>(mi, &FT::associatorNames, "associatorNames", ctx, rslt, r.path, assocClass, r.resultClass,
                        r.role, r.resultRole);
    case Op::References:
        return call<MI>(mi, &FT::references, "references", ctx, rslt, r.path, assocClass, r.role, r.properties);
    case Op::ReferenceNames:
        return call<MI>(mi, &FT::referenceNames, "referenceNames", ctx, rslt, r.path, assocClass, r.role);
    default:
        return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
    }
}

bool isAssociationOp(Op op) {
    return op == Op::Associators || op == Op::AssociatorNames || op == Op::References || op == Op::ReferenceNames;
}

bool isEnumeration(Op op) {
    return op == Op::EnumerateInstances || op == Op::EnumerateInstanceNames || op == Op::ExecQuery;
}

// The path the MI is called with: the request's, renamed to the target's class
// when the target serves a subclass.
const CMPIObjectPath* pathFor(const Request& r, const Target& target) {
    ObjectPathImpl* p = objectPathImpl(r.path);
    if (p == nullptr || p->className == target.className || isAssociationOp(r.op)) {
        return r.path;
    }
    CMPIObjectPath* renamed = cloneObjectPath(r.path, Owner::Arena);
    objectPathImpl(renamed)->className = target.className;
    return renamed;
}

// ExecQuery of a provider that refused it: its enumeration of the class, of which
// the sink keeps what the query selects (query_fallback.hpp).
CMPIStatus queryByEnumeration(void* mi, const Request& r, const CMPIContext* ctx, const CMPIResult* rslt,
                              const CMPIObjectPath* path, ResultSink& sink) {
    const ParsedQuery parsed = parseExecQuery(r.query, r.lang);
    if (!parsed.query) {
        return makeStatus(parsed.rc, parsed.message.c_str());
    }
    Request enumeration = r;
    enumeration.op = Op::EnumerateInstances;
    enumeration.properties = nullptr;  // the WHERE clause may test any property
    sink.pathsAsInstances = true;
    sink.query = &*parsed.query;
    CMPIStatus status = callInstanceMI(mi, enumeration, ctx, rslt, path);
    sink.query = nullptr;
    sink.pathsAsInstances = false;
    return status;
}

std::string statusMessage(const CMPIStatus& status) {
    const char* text = stringText(status.msg);
    return text != nullptr ? text : "";
}

}  // namespace

Outcome CoreServices::callTargets(const std::vector<Target>& targets, ProviderKind kind, const Request& request,
                                  ResultSink& sink) {
    Outcome outcome;
    for (const Target& target : targets) {
        std::string error;
        void* mi = loader_->mi(*target.reg, kind, &error);
        ++outcome.calls;
        if (mi == nullptr) {
            return Outcome{CMPI_RC_ERR_FAILED, error, outcome.calls};
        }
        const std::string* parameters = request.op == Op::InvokeMethod ? &target.reg->parameters : nullptr;
        CallFrame frame(callContext(request.caller, parameters));
        CMPIResult* rslt = newResult(sink);
        CMPIStatus status{CMPI_RC_OK, nullptr};
        if (kind == ProviderKind::Instance) {
            sink.pathsAsInstances = request.op == Op::EnumerateInstances || request.op == Op::GetInstance;
            const unsigned turnedBefore = sink.pathsTurnedIntoInstances;
            status = callInstanceMI(mi, request, frame.ctx(), rslt, pathFor(request, target));
            if (request.op == Op::ExecQuery && status.rc == CMPI_RC_ERR_NOT_SUPPORTED) {
                status = queryByEnumeration(mi, request, frame.ctx(), rslt, pathFor(request, target), sink);
            }
            if (sink.pathsTurnedIntoInstances != turnedBefore) {
                warnPathsAsInstances(target, request);
            }
        } else if (kind == ProviderKind::Association) {
            // The association class handed on is the target's: the registered
            // class, or the requested one when a superclass's provider serves it.
            status = callAssociationMI(mi, request, frame.ctx(), rslt, target.className.c_str());
        } else {
            // Providers always get argument objects, empty when the caller gave none.
            const CMPIArgs* in = request.in != nullptr ? request.in : newArgs(Owner::Arena);
            CMPIArgs* out = request.out != nullptr ? request.out : newArgs(Owner::Arena);
            status = call<CMPIMethodMI>(mi, &CMPIMethodMIFT::invokeMethod, "invokeMethod", frame.ctx(),
                                        static_cast<const CMPIResult*>(rslt), pathFor(request, target),
                                        request.method, in, out);
        }
        disposeObject(rslt);
        if (status.rc != CMPI_RC_OK) {
            return Outcome{status.rc, statusMessage(status), outcome.calls};
        }
    }
    return outcome;
}

Outcome CoreServices::dispatch(const Request& request, ResultSink& sink) {
    ObjectPathImpl* path = objectPathImpl(request.path);
    if (path == nullptr) {
        return Outcome{CMPI_RC_ERR_INVALID_PARAMETER, "the request needs a live object path", 0};
    }
    std::string className = path->className;
    if (request.op == Op::ExecQuery) {
        ParsedQuery parsed = parseExecQuery(request.query, request.lang);
        if (!parsed.query) {
            return Outcome{parsed.rc, parsed.message, 0};
        }
        if (Outcome refused = checkQueryClass(path->nameSpace, *parsed.query); refused.rc != CMPI_RC_OK) {
            return refused;
        }
        className = parsed.query->fromClass;
    }
    std::vector<Target> found;
    ProviderKind kind = ProviderKind::Instance;
    if (isAssociationOp(request.op)) {
        kind = ProviderKind::Association;
        bool refs = request.op == Op::References || request.op == Op::ReferenceNames;
        found = associationTargets(path->nameSpace, refs ? request.resultClass : request.assocClass);
    } else {
        kind = request.op == Op::InvokeMethod ? ProviderKind::Method : ProviderKind::Instance;
        found = targets(path->nameSpace, className, kind, isEnumeration(request.op));
    }
    if (found.empty()) {
        if (isAssociationOp(request.op) || (isEnumeration(request.op) && repository_.getClass(path->nameSpace, className) != nullptr)) {
            return Outcome{};
        }
        // No provider can have the instance: not found, as sfcb answers. Callers
        // that skip missing instances (association far ends) go on.
        if (request.op == Op::GetInstance && repository_.getClass(path->nameSpace, className) != nullptr) {
            return Outcome{CMPI_RC_ERR_NOT_FOUND,
                           "no provider registered for class " + className + ": no such instance", 0};
        }
        return noTarget(path->nameSpace, className);
    }
    return callTargets(found, kind, request, sink);
}

}  // namespace orv::host::detail
