// Helpers shared by the operation handlers.
#include <strings.h>

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "operation_context.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

const repository::ClassDecl& requireClass(const OperationContext& context, const std::string& className) {
    const repository::ClassDecl* cls = context.classes.getClass(context.request.nameSpace, className);
    if (cls == nullptr) {
        throw CimError(CimStatus::InvalidClass, "class " + className + " does not exist");
    }
    return *cls;
}

void throwIfFailed(const host::Reply& reply) {
    if (reply.rc() != CMPI_RC_OK) {
        throw CimError(static_cast<int>(reply.rc()), reply.message());
    }
}

host::CallOptions callOptions(const OperationContext& context, bool deepInheritance,
                              bool includeQualifiers, bool includeClassOrigin,
                              const std::optional<std::vector<std::string>>& propertyList) {
    host::CallOptions options;
    options.principal = context.principal;
    options.flags = (deepInheritance ? CMPI_FLAG_DeepInheritance : 0U) |
                    (includeQualifiers ? CMPI_FLAG_IncludeQualifiers : 0U) |
                    (includeClassOrigin ? CMPI_FLAG_IncludeClassOrigin : 0U);
    options.properties = propertyList;
    return options;
}

namespace {

bool contains(const std::vector<std::string>& names, const std::string& name) {
    for (const auto& candidate : names) {
        if (strcasecmp(candidate.c_str(), name.c_str()) == 0) {
            return true;
        }
    }
    return false;
}

}  // namespace

ReadFlags readFlags(const cimxml::CimRequest& request) {
    static_cast<void>(cimxml::boolParam(request, "LocalOnly", false));
    return ReadFlags{cimxml::boolParam(request, "IncludeQualifiers", false),
                     cimxml::boolParam(request, "IncludeClassOrigin", false),
                     cimxml::propertyListParam(request, "PropertyList")};
}

std::optional<std::vector<std::string>> shallowPropertyList(const repository::ClassDecl& cls,
                                                            const std::optional<std::vector<std::string>>& requested) {
    std::vector<std::string> names;
    for (const auto& property : cls.properties) {
        if (!requested || contains(*requested, property.name)) {
            names.push_back(property.name);
        }
    }
    return names;
}

cimxml::InstanceEncoding instanceEncoding(const OperationContext& context, bool includeClassOrigin,
                                          std::optional<std::vector<std::string>> propertyList,
                                          std::string_view expectedClass) {
    cimxml::InstanceEncoding encoding;
    encoding.includeClassOrigin = includeClassOrigin;
    encoding.arrayNullElements = context.arrayNulls;
    encoding.propertyList = std::move(propertyList);
    encoding.declarations = cimxml::ClassDeclarations(context.classes, context.request.nameSpace, expectedClass);
    return encoding;
}

}  // namespace orv::cimhost::detail
