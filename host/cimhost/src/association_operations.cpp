// Associators, AssociatorNames, References and ReferenceNames. Of an instance: sent
// through the broker core to the association providers. Of a class: answered from
// the class repository with class paths (and classes).
#include "class_associations.hpp"
#include "cmpi_builder.hpp"
#include "orv/cimxml/class_encoder.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "result_writers.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

// The source object of an association request: an instance or a class, of a known class.
cimxml::ObjectPathModel sourceModel(const OperationContext& context) {
    cimxml::ObjectPathModel model = cimxml::objectNameParam(context.request, "ObjectName");
    model.className = requireClass(context, model.className).name;
    return model;
}

CMPIObjectPath* sourcePath(const OperationContext& context, const cimxml::ObjectPathModel& model) {
    return buildObjectPath(context.core.broker(), context.classes, context.request.nameSpace, model);
}

const char* cstr(const std::optional<std::string>& value) {
    return value ? value->c_str() : nullptr;
}

AssociationFilters readFilters(const cimxml::CimRequest& request) {
    return AssociationFilters{cimxml::classNameParam(request, "AssocClass"),
                              cimxml::classNameParam(request, "ResultClass"), cimxml::stringParam(request, "Role"),
                              cimxml::stringParam(request, "ResultRole")};
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

// OBJECTPATH (CLASSPATH) per class.
void writeClassPaths(OperationContext& context, const std::vector<std::string>& names) {
    for (const std::string& name : names) {
        context.out.open("OBJECTPATH");
        cimxml::writeClassPath(context.out, context.defaults.host, context.request.nameSpace, name);
        context.out.close();
    }
}

// VALUE.OBJECTWITHPATH (CLASSPATH + CLASS) per class, each with every feature it has.
void writeClassesWithPath(OperationContext& context, const std::vector<std::string>& names,
                          const ObjectFlags& flags) {
    const cimxml::ClassEncoding encoding{false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList};
    for (const std::string& name : names) {
        context.out.open("VALUE.OBJECTWITHPATH");
        cimxml::writeClassPath(context.out, context.defaults.host, context.request.nameSpace, name);
        cimxml::writeClass(context.out, requireClass(context, name), encoding);
        context.out.close();
    }
}

}  // namespace

void associators(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole",
                                          "IncludeQualifiers", "IncludeClassOrigin", "PropertyList"});
    const AssociationFilters filters = readFilters(request);
    const ObjectFlags flags = objectFlags(request);
    const cimxml::ObjectPathModel source = sourceModel(context);
    if (source.keys.empty()) {
        writeClassesWithPath(context, associatedClasses(context.classes, request.nameSpace, source.className, filters),
                             flags);
        return;
    }
    host::Reply reply = context.core.associators(sourcePath(context, source), cstr(filters.assocClass),
                                                 cstr(filters.resultClass), cstr(filters.role),
                                                 cstr(filters.resultRole), objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void associatorNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole"});
    const AssociationFilters filters = readFilters(request);
    const cimxml::ObjectPathModel source = sourceModel(context);
    if (source.keys.empty()) {
        writeClassPaths(context, associatedClasses(context.classes, request.nameSpace, source.className, filters));
        return;
    }
    host::Reply reply = context.core.associatorNames(sourcePath(context, source), cstr(filters.assocClass),
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
    const AssociationFilters filters = readFilters(request);
    const ObjectFlags flags = objectFlags(request);
    const cimxml::ObjectPathModel source = sourceModel(context);
    if (source.keys.empty()) {
        writeClassesWithPath(context, referencingClasses(context.classes, request.nameSpace, source.className, filters),
                             flags);
        return;
    }
    host::Reply reply = context.core.references(sourcePath(context, source), cstr(filters.resultClass), cstr(filters.role),
                                                objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void referenceNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "ResultClass", "Role"});
    const AssociationFilters filters = readFilters(request);
    const cimxml::ObjectPathModel source = sourceModel(context);
    if (source.keys.empty()) {
        writeClassPaths(context, referencingClasses(context.classes, request.nameSpace, source.className, filters));
        return;
    }
    host::Reply reply = context.core.referenceNames(sourcePath(context, source), cstr(filters.resultClass),
                                                    cstr(filters.role),
                                                    callOptions(context, false, false, false, false, {}));
    throwIfFailed(reply);
    writeObjectPaths(context, reply);
}

}  // namespace orv::cimhost::detail
