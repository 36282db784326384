// The pull operations of DSP0200 1.3: Open* start an enumeration whose producer
// thread streams the provider's objects, encoded, into the context's bounded
// queue (enumeration_context.hpp); Pull* take from it; CloseEnumeration and
// EnumerationCount act on an open one. FilterQuery takes WQL, evaluated by the
// host's query engine on each instance as it arrives.
#include <strings.h>

#include <charconv>

#include "cmpi_builder.hpp"
#include "enumeration_registry.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "orv/host/wql.hpp"
#include "pull_operations.hpp"
#include "result_writers.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

std::optional<std::uint32_t> uint32Param(const cimxml::CimRequest& request, const char* name) {
    const std::optional<std::string> text = cimxml::stringParam(request, name);
    if (!text) {
        return std::nullopt;
    }
    std::uint32_t value = 0;
    const char* end = text->data() + text->size();
    const auto [at, error] = std::from_chars(text->data(), end, value);
    if (error != std::errc() || at != end || text->empty()) {
        throw CimError(CimStatus::InvalidParameter, std::string(name) + " must be a uint32 value, not \"" + *text + "\"");
    }
    return value;
}

// The parameters every Open operation takes besides its own.
struct OpenParameters {
    std::chrono::seconds timeout;
    std::uint32_t maxObjectCount;
    std::optional<host::WqlQuery> filter;
};

std::chrono::seconds operationTimeout(const cimxml::CimRequest& request, const EnumerationLimits& limits) {
    const std::optional<std::uint32_t> seconds = uint32Param(request, "OperationTimeout");
    if (!seconds) {
        return limits.defaultTimeout;
    }
    if (*seconds == 0 || std::chrono::seconds(*seconds) > limits.maxTimeout) {
        throw CimError(CimStatus::InvalidOperationTimeout,
                       "OperationTimeout must be from 1 to " + std::to_string(limits.maxTimeout.count()) +
                           " seconds (0, no time-out, is not accepted)");
    }
    return std::chrono::seconds(*seconds);
}

std::optional<host::WqlQuery> filterQuery(const cimxml::CimRequest& request) {
    const std::optional<std::string> language = cimxml::stringParam(request, "FilterQueryLanguage");
    const std::optional<std::string> query = cimxml::stringParam(request, "FilterQuery");
    if (!language && !query) {
        return std::nullopt;
    }
    if (!language || !query) {
        throw CimError(CimStatus::InvalidParameter, "FilterQuery and FilterQueryLanguage go together");
    }
    if (strcasecmp(language->c_str(), "WQL") != 0) {
        throw CimError(CimStatus::QueryLanguageNotSupported, "query language " + *language + " is not supported (WQL is)");
    }
    try {
        return host::WqlQuery::parse(*query);
    } catch (const host::WqlError& error) {
        throw CimError(CimStatus::InvalidQuery, error.what());
    }
}

OpenParameters openParameters(const OperationContext& context) {
    const auto& request = context.request;
    if (cimxml::boolParam(request, "ContinueOnError", false)) {
        throw CimError(CimStatus::ContinuationOnErrorNotSupported,
                       "ContinueOnError is not supported: an error ends the enumeration");
    }
    const EnumerationLimits& limits = context.enumerations->limits();
    return OpenParameters{operationTimeout(request, limits), uint32Param(request, "MaxObjectCount").value_or(0),
                          filterQuery(request)};
}

void writeParam(cimxml::XmlWriter& out, const char* name, const std::string& value) {
    out.open("PARAMVALUE").attr("NAME", name);
    out.leaf("VALUE", value);
    out.close();
}

// An operation's use of an enumeration: released when the operation ends, however
// it ends, so that the context's timer runs again (or the context is freed).
class Use {
public:
    Use(EnumerationRegistry& registry, std::shared_ptr<EnumerationContext> enumeration)
        : registry_(registry), enumeration_(std::move(enumeration)) {}
    ~Use() { registry_.release(enumeration_, remove_); }
    Use(const Use&) = delete;
    Use& operator=(const Use&) = delete;

    EnumerationContext& operator*() const { return *enumeration_; }
    EnumerationContext* operator->() const { return enumeration_.get(); }
    // Frees the context when the operation ends.
    void removeAtEnd() { remove_ = true; }

private:
    EnumerationRegistry& registry_;
    std::shared_ptr<EnumerationContext> enumeration_;
    bool remove_ = false;
};

// Writes up to `max` objects of the enumeration, then EndOfSequence and the
// EnumerationContext (empty at the end); an ended or failed enumeration is freed.
void answerBatch(OperationContext& context, Use& enumeration, std::uint32_t max) {
    const std::size_t count = std::min<std::uint32_t>(max, context.enumerations->limits().maxObjectCount);
    EnumerationContext::Batch batch = enumeration->take(count);
    if (enumeration->closed()) {
        enumeration.removeAtEnd();
        throw CimError(CimStatus::PullHasBeenAbandoned, "the enumeration was closed while this pull waited");
    }
    if (batch.errorCode != 0 || batch.end) {
        enumeration.removeAtEnd();
    }
    if (batch.errorCode != 0) {
        throw CimError(batch.errorCode, batch.errorMessage);
    }
    for (const std::string& fragment : batch.fragments) {
        context.out.raw(fragment);
    }
    context.out.close();  // IRETURNVALUE
    writeParam(context.out, "EndOfSequence", batch.end ? "TRUE" : "FALSE");
    writeParam(context.out, "EnumerationContext", batch.end ? std::string() : enumeration->id());
}

// Encodes one returned object as a pull of `kind` returns it ("" to skip it).
using Encoder = std::function<std::string(const host::ReturnedItem& item)>;

Encoder encoder(PullKind kind, cimxml::InstanceEncoding encoding, cimxml::PathDefaults defaults) {
    return [kind, encoding = std::move(encoding), defaults = std::move(defaults)](const host::ReturnedItem& item) {
        cimxml::XmlWriter out;
        const bool isInstance = item.kind == host::ReturnedItem::Kind::Instance;
        if (!isInstance && item.kind != host::ReturnedItem::Kind::ObjectPath) {
            return std::string();
        }
        const CMPIInstance* instance = isInstance ? item.data.value.inst : nullptr;
        switch (kind) {
        case PullKind::InstancesWithPath:
            if (instance == nullptr) {
                return std::string();
            }
            cimxml::writeInstanceWithPath(out, "VALUE.INSTANCEWITHPATH", instance, defaults, encoding);
            break;
        case PullKind::InstancePaths:
            cimxml::writeInstancePath(
                out, isInstance ? instance->ft->getObjectPath(instance, nullptr) : item.data.value.ref, defaults);
            break;
        case PullKind::Instances:
            if (instance == nullptr) {
                return std::string();
            }
            cimxml::writeInstance(out, instance, encoding);
            break;
        }
        return out.take();
    };
}

// The provider request of an enumeration, run on its producer thread: builds its
// own objects there and sends them through the core with `options`.
using ProviderCall = std::function<host::Reply(host::BrokerCore& core, const host::CallOptions& options)>;

EnumerationContext::Producer producer(host::BrokerCore& core, ProviderCall call, host::CallOptions options,
                                      Encoder encode, std::optional<host::WqlQuery> filter) {
    return [&core, call = std::move(call), options = std::move(options), encode = std::move(encode),
            filter = std::move(filter)](const EnumerationContext::Push& push) -> std::pair<int, std::string> {
        host::ObjectScope scope;
        bool stopped = false;
        host::CallOptions streaming = options;
        streaming.onItem = [&](const host::ReturnedItem& item) {
            if (filter && (item.kind != host::ReturnedItem::Kind::Instance || !filter->matches(item.data.value.inst))) {
                return true;
            }
            std::string fragment = encode(item);
            if (!fragment.empty() && !push(std::move(fragment))) {
                stopped = true;
                return false;
            }
            return true;
        };
        host::Reply reply = call(core, streaming);
        if (stopped) {
            return {0, std::string()};
        }
        return {static_cast<int>(reply.rc()), reply.message()};
    };
}

// Starts the enumeration and answers its first batch.
void open(OperationContext& context, PullKind kind, const OpenParameters& parameters, ProviderCall call,
          host::CallOptions options, const cimxml::InstanceEncoding& encoding) {
    Use enumeration(*context.enumerations, context.enumerations->open(context.principal, context.request.nameSpace,
                                                                      kind, parameters.timeout));
    enumeration->start(producer(context.core, std::move(call), std::move(options),
                                encoder(kind, encoding, context.defaults), parameters.filter));
    answerBatch(context, enumeration, parameters.maxObjectCount);
}

struct AssociationSource {
    cimxml::ObjectPathModel model;
    std::optional<std::string> assocClass, resultClass, role, resultRole;
};

AssociationSource associationSource(const OperationContext& context) {
    const auto& request = context.request;
    AssociationSource source{cimxml::instanceNameParam(request, "InstanceName"),
                             cimxml::classNameParam(request, "AssocClass"),
                             cimxml::classNameParam(request, "ResultClass"), cimxml::stringParam(request, "Role"),
                             cimxml::stringParam(request, "ResultRole")};
    source.model.className = requireClass(context, source.model.className).name;
    return source;
}

const char* cstr(const std::optional<std::string>& value) { return value ? value->c_str() : nullptr; }

// The path of the request's target, built on the producer thread.
CMPIObjectPath* targetPath(host::BrokerCore& core, const repository::ClassRepository& classes,
                           const std::string& nameSpace, const cimxml::ObjectPathModel& model) {
    return buildObjectPath(core.broker(), classes, nameSpace, model);
}

void openAssociators(OperationContext& context, bool paths) {
    const auto& request = context.request;
    if (paths) {
        cimxml::checkParameterNames(request, {"InstanceName", "AssocClass", "ResultClass", "Role", "ResultRole",
                                              "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    } else {
        cimxml::checkParameterNames(request, {"InstanceName", "AssocClass", "ResultClass", "Role", "ResultRole",
                                              "IncludeClassOrigin", "PropertyList", "IncludeQualifiers", "LocalOnly",
                                              "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    }
    const ReadFlags flags = paths ? ReadFlags{false, false, std::nullopt} : readFlags(request);
    const AssociationSource source = associationSource(context);
    const OpenParameters parameters = openParameters(context);
    const bool asInstances = !paths || parameters.filter;  // a filter looks at the instances
    const repository::ClassRepository& classes = context.classes;
    ProviderCall call = [source, asInstances, &classes, ns = request.nameSpace](host::BrokerCore& core,
                                                                               const host::CallOptions& options) {
        CMPIObjectPath* path = targetPath(core, classes, ns, source.model);
        return asInstances ? core.associators(path, cstr(source.assocClass), cstr(source.resultClass),
                                              cstr(source.role), cstr(source.resultRole), options)
                           : core.associatorNames(path, cstr(source.assocClass), cstr(source.resultClass),
                                                  cstr(source.role), cstr(source.resultRole), options);
    };
    open(context, paths ? PullKind::InstancePaths : PullKind::InstancesWithPath, parameters, std::move(call),
         callOptions(context, false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList),
         instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void openReferences(OperationContext& context, bool paths) {
    const auto& request = context.request;
    if (paths) {
        cimxml::checkParameterNames(request, {"InstanceName", "ResultClass", "Role", "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    } else {
        cimxml::checkParameterNames(request, {"InstanceName", "ResultClass", "Role", "IncludeClassOrigin",
                                              "PropertyList", "IncludeQualifiers", "LocalOnly", "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    }
    const ReadFlags flags = paths ? ReadFlags{false, false, std::nullopt} : readFlags(request);
    const AssociationSource source = associationSource(context);
    const OpenParameters parameters = openParameters(context);
    const bool asInstances = !paths || parameters.filter;
    const repository::ClassRepository& classes = context.classes;
    ProviderCall call = [source, asInstances, &classes, ns = request.nameSpace](host::BrokerCore& core,
                                                                               const host::CallOptions& options) {
        CMPIObjectPath* path = targetPath(core, classes, ns, source.model);
        return asInstances
                   ? core.references(path, cstr(source.resultClass), cstr(source.role), options)
                   : core.referenceNames(path, cstr(source.resultClass), cstr(source.role), options);
    };
    open(context, paths ? PullKind::InstancePaths : PullKind::InstancesWithPath, parameters, std::move(call),
         callOptions(context, false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList),
         instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

// Enumerations of a class: its instances (deep or not), or their paths.
void openClassEnumeration(OperationContext& context, PullKind kind, const std::string& className, bool deep,
                          const ReadFlags& flags, OpenParameters parameters,
                          std::optional<std::vector<std::string>> kept) {
    const repository::ClassDecl& cls = requireClass(context, className);
    const bool asInstances = kind != PullKind::InstancePaths || parameters.filter;
    const repository::ClassRepository& classes = context.classes;
    cimxml::ObjectPathModel model;
    model.className = cls.name;
    ProviderCall call = [model, asInstances, &classes, ns = context.request.nameSpace](
                            host::BrokerCore& core, const host::CallOptions& options) {
        CMPIObjectPath* path = targetPath(core, classes, ns, model);
        return asInstances ? core.enumerateInstances(path, options) : core.enumerateInstanceNames(path, options);
    };
    if (!deep) {
        kept = shallowPropertyList(cls, kept);
    }
    open(context, kind, parameters, std::move(call),
         callOptions(context, deep, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList),
         instanceEncoding(context, flags.includeClassOrigin, std::move(kept), cls.name));
}

void pull(OperationContext& context, PullKind kind) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"EnumerationContext", "MaxObjectCount"});
    const std::optional<std::string> id = cimxml::stringParam(request, "EnumerationContext");
    const std::optional<std::uint32_t> max = uint32Param(request, "MaxObjectCount");
    if (!id || !max) {
        throw CimError(CimStatus::InvalidParameter, "EnumerationContext and MaxObjectCount are required");
    }
    Use enumeration(*context.enumerations, context.enumerations->acquire(*id, context.principal, request.nameSpace));
    if (enumeration->kind() != kind) {
        throw CimError(CimStatus::InvalidEnumerationContext,
                       "this enumeration was opened for another pull operation (" + request.methodName +
                           " does not fit it)");
    }
    answerBatch(context, enumeration, *max);
}

std::string requiredContext(const cimxml::CimRequest& request) {
    cimxml::checkParameterNames(request, {"EnumerationContext"});
    std::optional<std::string> id = cimxml::stringParam(request, "EnumerationContext");
    if (!id) {
        throw CimError(CimStatus::InvalidParameter, "EnumerationContext is required");
    }
    return *id;
}

}  // namespace

void openEnumerateInstances(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ClassName", "DeepInheritance", "IncludeClassOrigin", "PropertyList",
                                          "IncludeQualifiers", "LocalOnly", "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    const ReadFlags flags = readFlags(request);
    const bool deep = cimxml::boolParam(request, "DeepInheritance", true);
    const std::string className = cimxml::classNameParam(request, "ClassName").value_or("");
    requireClass(context, className);
    openClassEnumeration(context, PullKind::InstancesWithPath, className, deep, flags, openParameters(context),
                         flags.propertyList);
}

void openEnumerateInstancePaths(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ClassName", "FilterQueryLanguage", "FilterQuery", "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    const std::string className = cimxml::classNameParam(request, "ClassName").value_or("");
    requireClass(context, className);
    openClassEnumeration(context, PullKind::InstancePaths, className, true, ReadFlags{false, false, std::nullopt},
                         openParameters(context), std::nullopt);
}

void openAssociatorInstances(OperationContext& context) { openAssociators(context, false); }
void openAssociatorInstancePaths(OperationContext& context) { openAssociators(context, true); }
void openReferenceInstances(OperationContext& context) { openReferences(context, false); }
void openReferenceInstancePaths(OperationContext& context) { openReferences(context, true); }

// OpenQueryInstances: the query's FROM class enumerated (with its subclasses) and
// filtered by the host's WQL engine, the SELECT list applied; the instances come
// without paths (PullInstances).
void openQueryInstances(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"FilterQueryLanguage", "FilterQuery", "ReturnQueryResultClass",
                                          "OperationTimeout", "ContinueOnError", "MaxObjectCount"});
    if (cimxml::boolParam(request, "ReturnQueryResultClass", false)) {
        throw CimError(CimStatus::NotSupported, "ReturnQueryResultClass is not supported");
    }
    OpenParameters parameters = openParameters(context);
    if (!parameters.filter) {
        throw CimError(CimStatus::InvalidParameter, "FilterQuery and FilterQueryLanguage are required");
    }
    const host::WqlQuery& query = *parameters.filter;
    if (context.classes.getClass(request.nameSpace, query.fromClass()) == nullptr) {
        throw CimError(CimStatus::InvalidQuery, "class " + query.fromClass() + " of the query does not exist");
    }
    std::optional<std::vector<std::string>> selected;
    if (!query.selectList().empty()) {
        selected = query.selectList();
    }
    const std::string fromClass = query.fromClass();
    openClassEnumeration(context, PullKind::Instances, fromClass, true, ReadFlags{false, false, std::nullopt},
                         std::move(parameters), std::move(selected));
}

void pullInstancesWithPath(OperationContext& context) { pull(context, PullKind::InstancesWithPath); }
void pullInstancePaths(OperationContext& context) { pull(context, PullKind::InstancePaths); }
void pullInstances(OperationContext& context) { pull(context, PullKind::Instances); }

void closeEnumeration(OperationContext& context) {
    context.enumerations->close(requiredContext(context.request), context.principal, context.request.nameSpace);
}

// The number of objects left when the producer has ended; NULL (an empty
// IRETURNVALUE) while it still runs, since the count is not known before.
void enumerationCount(OperationContext& context) {
    const Use enumeration(*context.enumerations, context.enumerations->acquire(requiredContext(context.request),
                                                                               context.principal,
                                                                               context.request.nameSpace));
    if (const std::optional<std::size_t> remaining = enumeration->remaining()) {
        context.out.leaf("VALUE", std::to_string(*remaining));
    }
}

}  // namespace orv::cimhost::detail
