// Associators, AssociatorNames, References and ReferenceNames of an instance, sent
// through the broker core to the association providers.
#include "cmpi_builder.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "result_writers.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

// The source object of an association request: an instance of a known class.
CMPIObjectPath* sourcePath(const OperationContext& context) {
    const cimxml::ObjectPathModel model = cimxml::objectNameParam(context.request, "ObjectName");
    requireClass(context, model.className);
    if (model.keys.empty()) {
        throw CimError(CimStatus::NotSupported, "association requests on classes are not supported");
    }
    return buildObjectPath(context.core.broker(), context.classes, context.request.nameSpace, model);
}

// Role filters and class filters as the core takes them: NULL for "any".
struct Filters {
    std::optional<std::string> assocClass;
    std::optional<std::string> resultClass;
    std::optional<std::string> role;
    std::optional<std::string> resultRole;
};

const char* cstr(const std::optional<std::string>& value) {
    return value ? value->c_str() : nullptr;
}

Filters readFilters(const cimxml::CimRequest& request) {
    return Filters{cimxml::classNameParam(request, "AssocClass"), cimxml::classNameParam(request, "ResultClass"),
                   cimxml::stringParam(request, "Role"), cimxml::stringParam(request, "ResultRole")};
}

struct ObjectFlags {
    bool includeQualifiers;
    bool includeClassOrigin;
    std::optional<std::vector<std::string>> propertyList;
};

ObjectFlags objectFlags(const cimxml::CimRequest& request) {
    return ObjectFlags{cimxml::boolParam(request, "IncludeQualifiers", false),
                       cimxml::boolParam(request, "IncludeClassOrigin", false),
                       cimxml::propertyListParam(request, "PropertyList")};
}

host::CallOptions objectOptions(const OperationContext& context, const ObjectFlags& flags) {
    return callOptions(context, false, false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList);
}

}  // namespace

void associators(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole",
                                          "IncludeQualifiers", "IncludeClassOrigin", "PropertyList"});
    const Filters filters = readFilters(request);
    const ObjectFlags flags = objectFlags(request);
    host::Reply reply = context.core.associators(sourcePath(context), cstr(filters.assocClass),
                                                 cstr(filters.resultClass), cstr(filters.role),
                                                 cstr(filters.resultRole), objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void associatorNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole"});
    const Filters filters = readFilters(request);
    host::Reply reply = context.core.associatorNames(sourcePath(context), cstr(filters.assocClass),
                                                     cstr(filters.resultClass), cstr(filters.role),
                                                     cstr(filters.resultRole),
                                                     callOptions(context, false, false, false, false, {}));
    throwIfFailed(reply);
    writeObjectPaths(context, reply);
}

void references(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "ResultClass", "Role", "IncludeQualifiers",
                                          "IncludeClassOrigin", "PropertyList"});
    const Filters filters = readFilters(request);
    const ObjectFlags flags = objectFlags(request);
    host::Reply reply = context.core.references(sourcePath(context), cstr(filters.resultClass), cstr(filters.role),
                                                objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void referenceNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "ResultClass", "Role"});
    const Filters filters = readFilters(request);
    host::Reply reply = context.core.referenceNames(sourcePath(context), cstr(filters.resultClass),
                                                    cstr(filters.role),
                                                    callOptions(context, false, false, false, false, {}));
    throwIfFailed(reply);
    writeObjectPaths(context, reply);
}

}  // namespace orv::cimhost::detail
