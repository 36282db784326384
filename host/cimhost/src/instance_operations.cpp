// Instance operations, sent through the broker core to the providers.
#include <strings.h>

#include "cmpi_builder.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "orv/host/wql.hpp"
#include "result_writers.hpp"
#include "streamed_response.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

CMPIObjectPath* instancePath(const OperationContext& context, const cimxml::ObjectPathModel& model) {
    requireClass(context, model.className);
    return buildObjectPath(context.core.broker(), context.classes, context.request.nameSpace, model);
}

// The properties an ExecQuery answer carries: those of the SELECT list alone (the
// keys are in the instance path); every property for "SELECT *".
std::optional<std::vector<std::string>> selectList(const std::string& query) {
    try {
        const host::WqlQuery parsed = host::WqlQuery::parse(query);
        if (parsed.selectList().empty()) {
            return std::nullopt;
        }
        return parsed.selectList();
    } catch (const host::WqlError&) {
        return std::nullopt;  // the broker core has answered it already
    }
}

std::string requiredString(const cimxml::CimRequest& request, const char* name) {
    std::optional<std::string> value = cimxml::stringParam(request, name);
    if (!value) {
        throw CimError(CimStatus::InvalidParameter, std::string("missing parameter ") + name);
    }
    return *value;
}

// Each instance is written as the provider returns it and the document sent on in pieces;
// the instance's own broker objects (property names read by the encoder) go with it.
host::ItemConsumer streamInstances(OperationContext& context, const cimxml::InstanceEncoding& encoding,
                                   std::exception_ptr& failure) {
    return [&context, &encoding, &failure](const host::ReturnedItem& item) {
        try {
            host::ObjectScope scope;
            writeNamedInstance(context, item.data.value.inst, encoding);
            return context.streamed->sendIfLarge(context.out);
        } catch (...) {
            failure = std::current_exception();
            return false;
        }
    };
}

}  // namespace

void getInstance(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"InstanceName", "LocalOnly", "IncludeQualifiers", "IncludeClassOrigin",
                                          "PropertyList"});
    const ReadFlags flags = readFlags(request);
    const cimxml::ObjectPathModel& name = cimxml::instanceNameParam(request, "InstanceName");
    CMPIObjectPath* path = instancePath(context, name);
    const cimxml::InstanceEncoding encoding =
        instanceEncoding(context, flags.includeClassOrigin, flags.propertyList, name.className);
    host::CallOptions options =
        callOptions(context, false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList);
    // The first instance the provider returns is the answer: encoded into the response as
    // it arrives (no copy kept). Should the provider fail after all, the error document
    // takes the place of the whole response, this text included.
    bool answered = false;
    std::exception_ptr failure;
    options.onItem = [&context, &answered, &encoding, &failure](const host::ReturnedItem& item) {
        if (answered) {
            return true;
        }
        try {
            host::ObjectScope scope;
            cimxml::writeInstance(context.out, item.data.value.inst, encoding);
            answered = true;
            return true;
        } catch (...) {
            failure = std::current_exception();
            return false;
        }
    };
    host::Reply reply = context.core.getInstance(path, options);
    if (failure) {
        std::rethrow_exception(failure);
    }
    throwIfFailed(reply);
    if (!answered) {
        throw CimError(CimStatus::NotFound, "no such instance");
    }
}

void enumerateInstances(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ClassName", "LocalOnly", "DeepInheritance", "IncludeQualifiers",
                                          "IncludeClassOrigin", "PropertyList"});
    const ReadFlags flags = readFlags(request);
    const bool deep = cimxml::boolParam(request, "DeepInheritance", true);
    const std::string className = cimxml::classNameParam(request, "ClassName").value_or("");
    const repository::ClassDecl& cls = requireClass(context, className);
    auto kept = deep ? flags.propertyList : shallowPropertyList(cls, flags.propertyList);
    const cimxml::InstanceEncoding encoding =
        instanceEncoding(context, flags.includeClassOrigin, std::move(kept), cls.name);
    host::CallOptions options =
        callOptions(context, deep, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList);
    std::exception_ptr failure;
    if (context.streamed != nullptr) {
        options.onItem = streamInstances(context, encoding, failure);
    }
    host::Reply reply = context.core.enumerateInstances(classPath(context, cls.name), options);
    if (failure) {
        std::rethrow_exception(failure);
    }
    throwIfFailed(reply);
    writeNamedInstances(context, reply, encoding);
}

void enumerateInstanceNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ClassName"});
    const std::string className = cimxml::classNameParam(request, "ClassName").value_or("");
    const repository::ClassDecl& cls = requireClass(context, className);
    host::Reply reply = context.core.enumerateInstanceNames(classPath(context, cls.name),
                                                            callOptions(context, true, false, false, {}));
    throwIfFailed(reply);
    writeInstanceNames(context, reply);
}

void createInstance(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"NewInstance"});
    const cimxml::InstanceModel& model = cimxml::instanceParam(request, "NewInstance");
    requireClass(context, model.className);
    CMPIObjectPath* path = classPath(context, model.className);
    CMPIInstance* instance =
        buildInstance(context.core.broker(), context.classes, request.nameSpace, model, path);
    host::Reply reply = context.core.createInstance(path, instance, callOptions(context, false, false, false, {}));
    throwIfFailed(reply);
    writeInstanceNames(context, reply);
}

void modifyInstance(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ModifiedInstance", "IncludeQualifiers", "PropertyList"});
    const cimxml::NamedInstanceModel& model = cimxml::namedInstanceParam(request, "ModifiedInstance");
    const bool includeQualifiers = cimxml::boolParam(request, "IncludeQualifiers", true);
    CMPIObjectPath* path = instancePath(context, model.path);
    CMPIInstance* instance =
        buildInstance(context.core.broker(), context.classes, request.nameSpace, model.instance, path);
    host::Reply reply = context.core.modifyInstance(
        path, instance,
        callOptions(context, false, includeQualifiers, false,
                    cimxml::propertyListParam(request, "PropertyList")));
    throwIfFailed(reply);
}

void deleteInstance(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"InstanceName"});
    CMPIObjectPath* path = instancePath(context, cimxml::instanceNameParam(request, "InstanceName"));
    host::Reply reply = context.core.deleteInstance(path, callOptions(context, false, false, false, {}));
    throwIfFailed(reply);
}

void execQuery(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"QueryLanguage", "Query"});
    const std::string language = requiredString(request, "QueryLanguage");
    const std::string query = requiredString(request, "Query");
    CMPIObjectPath* nsPath = classPath(context, "");
    host::Reply reply = context.core.execQuery(nsPath, query.c_str(), language.c_str(),
                                               callOptions(context, true, false, false, {}));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, false, selectList(query)));
}

}  // namespace orv::cimhost::detail
