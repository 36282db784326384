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
    return callOptions(context, false, flags.includeQualifiers, flags.includeClassOrigin, flags.propertyList);
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

// The source and filters of a request.
struct Source {
    cimxml::ObjectPathModel model;
    AssociationFilters filters;
};

Source readSource(const OperationContext& context) {
    return Source{sourceModel(context), readFilters(context.request)};
}

using ClassFinder = std::vector<std::string> (*)(const repository::ClassRepository&, const std::string&,
                                                 const std::string&, const AssociationFilters&);

// When the source is a class, writes the classes `find` names (paths alone, or with
// their classes when `flags` is given) and returns true.
// An INSTANCENAME names an instance even without keys (a keyless instance name of
// a class with keys is refused when its path is built).
bool answeredForClass(OperationContext& context, const Source& source, ClassFinder find, const ObjectFlags* flags) {
    if (source.model.instance || !source.model.keys.empty()) {
        return false;
    }
    const auto names = find(context.classes, context.request.nameSpace, source.model.className, source.filters);
    if (flags != nullptr) {
        writeClassesWithPath(context, names, *flags);
    } else {
        writeClassPaths(context, names);
    }
    return true;
}

}  // namespace

void associators(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole",
                                          "IncludeQualifiers", "IncludeClassOrigin", "PropertyList"});
    const ObjectFlags flags = objectFlags(request);
    const Source source = readSource(context);
    if (answeredForClass(context, source, associatedClasses, &flags)) {
        return;
    }
    const AssociationFilters& filters = source.filters;
    host::Reply reply = context.core.associators(sourcePath(context, source.model), cstr(filters.assocClass),
                                                 cstr(filters.resultClass), cstr(filters.role),
                                                 cstr(filters.resultRole), objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void associatorNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole"});
    const Source source = readSource(context);
    if (answeredForClass(context, source, associatedClasses, nullptr)) {
        return;
    }
    const AssociationFilters& filters = source.filters;
    host::Reply reply = context.core.associatorNames(sourcePath(context, source.model), cstr(filters.assocClass),
                                                     cstr(filters.resultClass), cstr(filters.role),
                                                     cstr(filters.resultRole),
                                                     callOptions(context, false, false, false, {}));
    throwIfFailed(reply);
    writeObjectPaths(context, reply);
}

void references(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "ResultClass", "Role", "IncludeQualifiers",
                                          "IncludeClassOrigin", "PropertyList"});
    const ObjectFlags flags = objectFlags(request);
    const Source source = readSource(context);
    if (answeredForClass(context, source, referencingClasses, &flags)) {
        return;
    }
    const AssociationFilters& filters = source.filters;
    host::Reply reply = context.core.references(sourcePath(context, source.model), cstr(filters.resultClass), cstr(filters.role),
                                                objectOptions(context, flags));
    throwIfFailed(reply);
    writeObjectsWithPath(context, reply, instanceEncoding(context, flags.includeClassOrigin, flags.propertyList));
}

void referenceNames(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ObjectName", "ResultClass", "Role"});
    const Source source = readSource(context);
    if (answeredForClass(context, source, referencingClasses, nullptr)) {
        return;
    }
    const AssociationFilters& filters = source.filters;
    host::Reply reply = context.core.referenceNames(sourcePath(context, source.model), cstr(filters.resultClass),
                                                    cstr(filters.role),
                                                    callOptions(context, false, false, false, {}));
    throwIfFailed(reply);
    writeObjectPaths(context, reply);
}

}  // namespace orv::cimhost::detail
