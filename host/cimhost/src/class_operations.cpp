// GetClass, EnumerateClasses and EnumerateClassNames, answered from the class repository.
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/class_encoder.hpp"
#include "orv/cimxml/request_params.hpp"
#include "operation_context.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

cimxml::ClassEncoding classEncoding(const cimxml::CimRequest& request, bool withPropertyList) {
    cimxml::ClassEncoding encoding;
    encoding.localOnly = cimxml::boolParam(request, "LocalOnly", true);
    encoding.includeQualifiers = cimxml::boolParam(request, "IncludeQualifiers", true);
    encoding.includeClassOrigin = cimxml::boolParam(request, "IncludeClassOrigin", false);
    if (withPropertyList) {
        encoding.propertyList = cimxml::propertyListParam(request, "PropertyList");
    }
    return encoding;
}

// The class names an enumeration covers; throws CIM_ERR_INVALID_CLASS for an unknown start class.
std::vector<std::string> enumeratedNames(const OperationContext& context) {
    const auto& request = context.request;
    const std::optional<std::string> className = cimxml::classNameParam(request, "ClassName");
    const bool deep = cimxml::boolParam(request, "DeepInheritance", false);
    if (className) {
        requireClass(context, *className);
    }
    return context.classes.classNames(request.nameSpace, className.value_or(""), deep);
}

}  // namespace

void getClass(OperationContext& context) {
    const auto& request = context.request;
    cimxml::checkParameterNames(request, {"ClassName", "LocalOnly", "IncludeQualifiers", "IncludeClassOrigin",
                                          "PropertyList"});
    const std::optional<std::string> className = cimxml::classNameParam(request, "ClassName");
    if (!className) {
        throw CimError(CimStatus::InvalidParameter, "missing parameter ClassName");
    }
    const repository::ClassDecl* cls = context.classes.getClass(request.nameSpace, *className);
    if (cls == nullptr) {
        throw CimError(CimStatus::NotFound, "class " + *className + " does not exist");
    }
    cimxml::writeClass(context.out, *cls, classEncoding(request, true));
}

void enumerateClasses(OperationContext& context) {
    cimxml::checkParameterNames(context.request, {"ClassName", "DeepInheritance", "LocalOnly",
                                                  "IncludeQualifiers", "IncludeClassOrigin"});
    const cimxml::ClassEncoding encoding = classEncoding(context.request, false);
    for (const auto& name : enumeratedNames(context)) {
        cimxml::writeClass(context.out, requireClass(context, name), encoding);
    }
}

void enumerateClassNames(OperationContext& context) {
    cimxml::checkParameterNames(context.request, {"ClassName", "DeepInheritance"});
    for (const auto& name : enumeratedNames(context)) {
        context.out.open("CLASSNAME").attr("NAME", name).close();
    }
}

}  // namespace orv::cimhost::detail
